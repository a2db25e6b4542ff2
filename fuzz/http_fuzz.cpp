// The page's server must take any Host, Origin, cookie and address to listen on.
#include "libvelmora/http/httpguard.h"
#include "libvelmora/http/httpserver.h"

#include <velmora/error.h>

#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    std::string const text(reinterpret_cast<char const*>(data), size);
    std::size_t const split = text.find('\n');
    std::string const first = text.substr(0, split);
    std::string const second = split == std::string::npos ? "" : text.substr(split + 1);

    auto const host = velmora::hostNameIn(first);
    if (host && (host->empty() || host->find_first_of("/@ \r\n[]") != std::string::npos)) {
        std::abort();
    }
    velmora::HttpRequest request;
    request.method = "POST";
    request.headers = {{"host", first}, {"origin", second}, {"cookie", second}};
    auto const refused = velmora::refuseForeign(request, {});
    if (!refused && second.size() != first.size() + 7) { // "http://" and the host
        std::abort();
    }
    auto const cookie = velmora::cookieIn(request, "velmora_8722");
    if (cookie && second.find("velmora_8722=" + *cookie) == std::string::npos) {
        std::abort();
    }
    if (velmora::sameSecret(first, second) != (first == second && !second.empty())) {
        std::abort();
    }
    try {
        velmora::HttpPlace const place = velmora::parseHttpPlace(first);
        if (place.host.empty()) {
            std::abort();
        }
    } catch (velmora::Error const& /*refused*/) {
    }
    return 0;
}
