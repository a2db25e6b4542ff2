#pragma once

#include "libvelmora/http/httproutes.h"

#include <chrono>
#include <memory>
#include <string>

namespace velmora {

// What a client may cost.
struct HttpLimits
{
    std::size_t header = 8 * 1024;                // bytes
    std::size_t body = 64 * 1024;                 // bytes
    std::size_t connections = 16;                 // further ones are closed at once
    std::chrono::milliseconds time{10000};        // for one request to come, one reply to go, and between requests
    std::size_t streamBacklog = 256 * 1024;       // bytes that wait for a slow reader of a stream, who is cut off then
    std::chrono::milliseconds streamStall{20000}; // a reader who takes nothing for that long is cut off, too
    std::chrono::milliseconds streamPing{15000};  // a silent stream is kept alive that often
};

// Where a server listens: "127.0.0.1:9100", "[::1]:9100". Port 0 takes any that is free. Throws Error for other texts.
struct HttpPlace
{
    std::string host;
    unsigned short port = 0;
};
HttpPlace parseHttpPlace(std::string const& text);

// A small HTTP/1.1 server with one thread. Routes and streams are set before start.
class HttpServer
{
public:
    using Handler = HttpHandler;

    explicit HttpServer(HttpLimits const& limits = {});
    // Stops.
    ~HttpServer();
    HttpServer(HttpServer const&) = delete;
    HttpServer& operator=(HttpServer const&) = delete;

    // A path that ends with '*' stands for all that begin alike; the longest that fits is taken. A route of GET serves
    // HEAD as well.
    void addRoute(std::string const& method, std::string const& path, Handler handler);
    // A path whose readers get what is published there, as server-sent events, for as long as they stay.
    // greeting: what a new reader gets first. catchUp: what one gets who was too slow for publishLatest.
    void addStream(std::string const& path, HttpEvents greeting, HttpEvents catchUp = nullptr);
    // Asked before everything else.
    void setGate(HttpGate gate);

    // Throws Error if the place can't be had.
    void start(HttpPlace const& place);
    // The port that it listens on.
    unsigned short port() const;
    // Sends an event to the readers of a stream; never waits. Any thread, after start.
    void publish(std::string const& path, std::string const& event);
    // The same for what is soon out of date: a reader who has not taken the last events yet gets no more of them, and
    // the stream's catchUp when he has.
    void publishLatest(std::string const& path, std::string const& event);
    // How many read streams now. Any thread.
    std::size_t readers() const;
    void stop();

    // A server-sent event of that name, empty for none, with data of any number of lines; with an id, browsers tell it
    // when they connect again.
    static std::string event(std::string const& name, std::string const& data, std::string const& id = {});

private:
    struct Core;
    std::unique_ptr<Core> m_core;
};

} // namespace velmora
