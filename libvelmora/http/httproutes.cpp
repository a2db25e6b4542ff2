#include "libvelmora/http/httproutes.h"

#include <algorithm>
#include <string_view>

namespace velmora {

namespace {

// Whether the route's path ends with a star, and stands for the path as well.
bool fitsOpenly(HttpRoutes::Route const& route, std::string const& path)
{
    std::string_view const own = route.path;
    return own.ends_with('*') && path.starts_with(own.substr(0, own.size() - 1));
}

HttpResponse wrongMethod(HttpRoutes::Route const& route)
{
    HttpResponse response = plainResponse(405, "This method does not work here");
    std::string allowed = route.greeting ? "GET" : "";
    for (auto const& [method, handler] : route.handlers) {
        allowed += (allowed.empty() ? "" : ", ") + method;
    }
    response.headers.emplace_back("Allow", allowed);
    return response;
}

} // namespace

HttpRoutes::Route& HttpRoutes::at(std::string const& path)
{
    auto found = std::ranges::find(m_routes, path, &Route::path);
    if (found == m_routes.end()) {
        found = m_routes.insert(found, Route{path, {}, {}, {}});
    }
    return *found;
}

void HttpRoutes::add(std::string const& method, std::string const& path, HttpHandler handler)
{
    at(path).handlers[method] = std::move(handler);
}

void HttpRoutes::addStream(std::string const& path, HttpEvents greeting, HttpEvents catchUp)
{
    Route& route = at(path);
    route.greeting = std::move(greeting);
    route.catchUp = std::move(catchUp);
}

HttpRoutes::Route const* HttpRoutes::find(std::string const& path) const
{
    Route const* best = nullptr;
    for (Route const& each : m_routes) {
        if (each.path == path) {
            return &each;
        }
        if (fitsOpenly(each, path) && (best == nullptr || each.path.size() > best->path.size())) {
            best = &each;
        }
    }
    return best;
}

std::optional<HttpResponse> HttpRoutes::refusal(HttpRequest const& request) const
{
    return m_gate ? m_gate(request) : std::nullopt;
}

HttpRoutes::Route const* HttpRoutes::stream(HttpRequest const& request) const
{
    Route const* const route = find(request.path);
    bool const wanted = route != nullptr && route->greeting && request.method == "GET";
    return wanted && !refusal(request) ? route : nullptr;
}

HttpResponse HttpRoutes::answer(HttpRequest const& request) const
{
    try {
        if (auto const refused = refusal(request)) {
            return *refused;
        }
        Route const* const route = find(request.path);
        if (route == nullptr) {
            return plainResponse(404, "There is nothing here");
        }
        auto found = route->handlers.find(request.method);
        if (found == route->handlers.end() && request.method == "HEAD") {
            found = route->handlers.find("GET");
        }
        return found == route->handlers.end() ? wrongMethod(*route) : found->second(request);
    } catch (std::exception const& error) {
        return plainResponse(500, error.what());
    }
}

} // namespace velmora
