#include "libvelmora/http/httpserver.h"

#include <velmora/error.h>

#include <algorithm>
#include <charconv>

namespace velmora {

namespace {

[[noreturn]] void rejectPlace(std::string const& text)
{
    throw Error(
        ErrorKind::WrongUse, "\"" + text + "\" is no place to listen on",
        {"give an address and a port: 127.0.0.1:9100, or [::1]:9100", "0.0.0.0:9100 listens for the whole network"});
}

} // namespace

HttpPlace parseHttpPlace(std::string const& text)
{
    std::size_t const colon = text.rfind(':');
    if (colon == std::string::npos || colon == 0) {
        rejectPlace(text);
    }
    HttpPlace place;
    place.host = text.substr(0, colon);
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(text.data() + colon + 1, end, place.port);
    if (error != std::errc() || stop != end) {
        rejectPlace(text);
    }
    bool const bracketed = place.host.size() > 2 && place.host.front() == '[' && place.host.back() == ']';
    if (bracketed) {
        place.host = place.host.substr(1, place.host.size() - 2);
    } else if (place.host.find_first_of(":[]/ ") != std::string::npos) {
        rejectPlace(text);
    }
    return place;
}

std::string HttpRequest::header(std::string const& name) const
{
    for (auto const& [key, value] : headers) {
        if (key == name) {
            return value;
        }
    }
    return {};
}

std::size_t HttpRequest::count(std::string const& name) const
{
    return static_cast<std::size_t>(std::ranges::count(headers, name, [](auto const& each) { return each.first; }));
}

HttpResponse plainResponse(unsigned int status, std::string const& text)
{
    HttpResponse response;
    response.status = status;
    response.body = text + "\n";
    return response;
}

std::string HttpServer::event(std::string const& name, std::string const& data, std::string const& id)
{
    std::string text = name.empty() ? "" : "event: " + name + "\n";
    std::size_t begin = 0;
    while (begin <= data.size()) {
        std::size_t const end = std::min(data.find('\n', begin), data.size());
        text += "data: " + data.substr(begin, end - begin) + "\n";
        begin = end + 1;
    }
    return text + (id.empty() ? "\n" : "id: " + id + "\n\n");
}

} // namespace velmora
