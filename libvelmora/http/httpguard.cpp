#include "libvelmora/http/httpguard.h"

#include <velmora/error.h>

#include <algorithm>
#include <arpa/inet.h>
#include <array>
#include <cctype>
#include <sys/random.h>

namespace velmora {

namespace {

bool isPortNumber(std::string_view text)
{
    return !text.empty() && text.size() <= 5 && text.find_first_not_of("0123456789") == std::string_view::npos;
}

std::string inLowerCase(std::string_view text)
{
    std::string result(text);
    std::ranges::transform(result, result.begin(), [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return result;
}

} // namespace

std::optional<std::string> hostNameIn(std::string_view field)
{
    std::size_t end = 0;
    std::string_view name;
    if (field.starts_with('[')) {
        end = field.find(']');
        if (end == std::string_view::npos) {
            return std::nullopt;
        }
        name = field.substr(1, end - 1);
        ++end;
    } else {
        end = std::min(field.find(':'), field.size());
        name = field.substr(0, end);
    }
    bool const portFits = end == field.size() || (field[end] == ':' && isPortNumber(field.substr(end + 1)));
    bool const nameFits = !name.empty() && name.size() <= 253 && std::ranges::all_of(name, [](unsigned char c) {
        return std::isalnum(c) != 0 || c == '.' || c == '-' || c == '_' || c == ':';
    });
    return portFits && nameFits ? std::optional(inLowerCase(name)) : std::nullopt;
}

bool isAddress(std::string const& name)
{
    std::array<unsigned char, sizeof(in6_addr)> bytes{};
    return ::inet_pton(AF_INET, name.c_str(), bytes.data()) == 1 ||
           ::inet_pton(AF_INET6, name.c_str(), bytes.data()) == 1;
}

bool isLoopback(std::string const& name)
{
    return name == "localhost" || name == "::1" || (isAddress(name) && name.starts_with("127."));
}

std::optional<std::string> cookieIn(HttpRequest const& request, std::string_view name)
{
    for (auto const& [key, value] : request.headers) {
        std::string_view rest = key == "cookie" ? std::string_view(value) : std::string_view();
        while (!rest.empty()) {
            std::string_view part = rest.substr(0, rest.find(';'));
            rest.remove_prefix(std::min(part.size() + 1, rest.size()));
            part.remove_prefix(std::min(part.find_first_not_of(' '), part.size()));
            if (part.starts_with(name) && part.substr(name.size()).starts_with('=')) {
                return std::string(part.substr(name.size() + 1));
            }
        }
    }
    return std::nullopt;
}

bool sameSecret(std::string_view given, std::string_view secret)
{
    std::size_t difference = given.size() ^ secret.size();
    for (std::size_t i = 0; i < secret.size(); ++i) {
        char const each = i < given.size() ? given[i] : '\0';
        difference |= static_cast<unsigned char>(each ^ secret[i]);
    }
    return difference == 0 && !secret.empty();
}

std::string makeToken()
{
    static constexpr char digits[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_";
    std::array<unsigned char, 17> bytes{}; // one more, for the last digit
    if (::getrandom(bytes.data(), bytes.size(), 0) != static_cast<ssize_t>(bytes.size())) {
        throw Error(ErrorKind::Failed, "The system gives no random numbers");
    }
    std::string token;
    unsigned int held = 0;
    unsigned int bits = 0;
    for (unsigned char const byte : bytes) {
        held = (held << 8 | byte) & 0xFFFF;
        bits += 8;
        for (; bits >= 6 && token.size() < 22; bits -= 6) {
            token += digits[held >> (bits - 6) & 0x3F];
        }
    }
    return token;
}

std::optional<HttpResponse> refuseForeign(HttpRequest const& request, std::set<std::string> const& names)
{
    std::optional<std::string> const host = hostNameIn(request.header("host"));
    if (request.count("host") != 1 || !host) {
        return plainResponse(400, "A request names one host");
    }
    if (*host != "localhost" && !isAddress(*host) && !names.contains(*host)) {
        return plainResponse(421, "This name is not served here");
    }
    bool const changes = request.method != "GET" && request.method != "HEAD";
    std::size_t const origins = request.count("origin");
    bool const own =
        origins == 1 && inLowerCase(request.header("origin")) == "http://" + inLowerCase(request.header("host"));
    if (origins > 0 ? !own : changes) {
        return plainResponse(403, "Another page may not ask this");
    }
    return std::nullopt;
}

} // namespace velmora
