#pragma once

#include "libvelmora/http/httpcore.h"

#include <boost/asio/steady_timer.hpp>

#include <array>
#include <chrono>
#include <string>

namespace velmora {

// A reader of server-sent events, for as long as it stays. It lives as long as it stands in the core, which must
// outlive it, as the route must. The server's thread.
class HttpStream : public std::enable_shared_from_this<HttpStream>
{
public:
    HttpStream(HttpCore& core, boost::asio::ip::tcp::socket socket, HttpRoutes::Route const& route,
               HttpRequest const& request);

    // Greets the reader, who stands in the core from then on.
    void begin();
    // Once more does nothing.
    void close();
    bool reads(std::string const& path) const { return m_route.path == path; }
    void publish(std::string const& event);
    void publishLatest(std::string const& event);

private:
    void writePending();
    void catchUp();
    void schedulePing();
    bool isStuck() const;
    void watchForEnd();

    HttpCore& m_core;
    boost::asio::ip::tcp::socket m_socket;
    HttpRoutes::Route const& m_route;
    HttpRequest const m_request;
    std::string m_pending; // events that wait
    std::string m_writing; // events under way
    std::chrono::steady_clock::time_point m_writingSince;
    bool m_behind = false;            // has missed some of publishLatest
    boost::asio::steady_timer m_ping; // until the next one
    std::array<char, 64> m_ignored{};
};

} // namespace velmora
