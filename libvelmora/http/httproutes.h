#pragma once

#include "libvelmora/http/httpmessage.h"

#include <functional>
#include <map>
#include <optional>

namespace velmora {

// Runs on the server's thread, which it holds up; what it throws becomes a reply of 500.
using HttpHandler = std::function<HttpResponse(HttpRequest const&)>;
// A reply in the place of what the request asks for; nothing to let it pass.
using HttpGate = std::function<std::optional<HttpResponse>(HttpRequest const&)>;
// Events for a reader of a stream, made by HttpServer::event.
using HttpEvents = std::function<std::string(HttpRequest const&)>;

// What a server answers where. Set before it starts.
class HttpRoutes
{
public:
    struct Route
    {
        std::string path;
        std::map<std::string, HttpHandler> handlers; // by method
        HttpEvents greeting;                         // of a stream
        HttpEvents catchUp;                          // of a stream, may be empty
    };

    void add(std::string const& method, std::string const& path, HttpHandler handler);
    void addStream(std::string const& path, HttpEvents greeting, HttpEvents catchUp);
    void setGate(HttpGate gate) { m_gate = std::move(gate); }

    // The stream that the request is let in to, or null.
    Route const* stream(HttpRequest const& request) const;
    HttpResponse answer(HttpRequest const& request) const;

private:
    Route& at(std::string const& path);
    Route const* find(std::string const& path) const;
    std::optional<HttpResponse> refusal(HttpRequest const& request) const;

    std::vector<Route> m_routes;
    HttpGate m_gate;
};

} // namespace velmora
