#include "libvelmora/dash/dashpage.h"

#include "libvelmora/dash/dashassets.h"

#include <fmt/format.h>

#include <span>

namespace velmora {

namespace {

std::string typeOf(std::string const& name)
{
    static std::vector<std::pair<std::string, std::string>> const types = {
        {".html", "text/html"}, {".css", "text/css"}, {".js", "text/javascript"}, {".svg", "image/svg+xml"}};
    for (auto const& [ending, type] : types) {
        if (name.ends_with(ending)) {
            return type + "; charset=utf-8";
        }
    }
    return "text/plain; charset=utf-8";
}

// Changes with the bytes, so that a browser keeps what has not changed.
std::string tagOf(DashAsset const& asset)
{
    std::uint64_t hash = 0xCBF29CE484222325;
    for (unsigned char const byte : std::span(asset.packed, asset.packedSize)) {
        hash = (hash ^ byte) * 0x100000001B3;
    }
    return fmt::format("\"{:016x}\"", hash);
}

HttpResponse serve(DashAsset const& asset, std::string const& tag, HttpRequest const& request)
{
    HttpResponse response;
    response.contentType = typeOf(asset.name);
    response.headers = dashHeaders();
    response.headers.emplace_back("Cache-Control", "no-cache");
    response.headers.emplace_back("ETag", tag);
    response.headers.emplace_back("Vary", "Accept-Encoding");
    if (request.header("if-none-match") == tag) {
        response.status = 304;
    } else if (request.header("accept-encoding").find("gzip") != std::string::npos) {
        response.headers.emplace_back("Content-Encoding", "gzip");
        response.body.assign(reinterpret_cast<char const*>(asset.packed), asset.packedSize);
    } else {
        response.body.assign(reinterpret_cast<char const*>(asset.plain), asset.plainSize);
    }
    return response;
}

} // namespace

std::vector<std::pair<std::string, std::string>> dashHeaders()
{
    return {{"Content-Security-Policy",
             "default-src 'none'; script-src 'self'; style-src 'self'; img-src 'self' data:; connect-src 'self'; "
             "base-uri 'none'; form-action 'none'; frame-ancestors 'none'"},
            {"Referrer-Policy", "no-referrer"},
            {"Cross-Origin-Resource-Policy", "same-origin"}};
}

void addDashPage(HttpServer& server)
{
    for (DashAsset const& asset : dashAssets()) {
        std::string const name = asset.name;
        std::string const path = name == "index.html" ? "/" : name == "notices.txt" ? "/notices.txt" : "/page/" + name;
        server.addRoute("GET", path, [&asset, tag = tagOf(asset)](HttpRequest const& request) {
            return serve(asset, tag, request);
        });
    }
}

} // namespace velmora
