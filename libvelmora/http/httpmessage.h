#pragma once

#include <chrono>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

struct HttpRequest
{
    std::string method;                                       // "GET"
    std::string path;                                         // "/metrics", as sent, without what stands behind ?
    std::string query;                                        // behind ?, as sent
    std::vector<std::pair<std::string, std::string>> headers; // names in lower case
    std::string body;

    // Empty for a header that was not sent; the first of several.
    std::string header(std::string const& name) const;
    std::size_t count(std::string const& name) const;
};

struct HttpResponse
{
    unsigned int status = 200;
    std::string contentType = "text/plain; charset=utf-8";
    std::string body;
    std::vector<std::pair<std::string, std::string>> headers; // further ones; a name that the server sets, too, wins
    std::chrono::milliseconds delay{0};                       // before it is sent; holds nobody else up
};

// A line of text.
HttpResponse plainResponse(unsigned int status, std::string const& text);

} // namespace velmora
