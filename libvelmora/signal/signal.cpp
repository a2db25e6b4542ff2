#include "libvelmora/signal/signal.h"

#include "libvelmora/signal/readingonly.h"
#include "libvelmora/signal/signalhex.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace velmora {

namespace {

struct ServiceRow
{
    unsigned char service;
    std::size_t length; // of a request for one identifier, which the reply repeats
};

// SAE J1979, ISO 14229-1 and ISO 14230-3: services that only read, with the bytes of one identifier.
constexpr ServiceRow services[] = {
    {0x01, 2}, {0x02, 3}, {0x05, 3}, {0x06, 2}, {0x09, 2}, {0x1A, 2}, {0x21, 2}, {0x22, 3},
};

} // namespace

std::size_t echoLength(std::vector<unsigned char> const& request)
{
    auto const* const row = std::ranges::find_if(
        services, [&](ServiceRow const& each) { return !request.empty() && each.service == request.front(); });
    return row != std::end(services) ? row->length : request.size();
}

// A signal has one identifier: several are put together by who asks.
std::optional<std::string> refusalOf(std::vector<unsigned char> const& request)
{
    if (std::optional<std::string> const refusal = refusalFor(request, RequestPurpose::Signal)) {
        return refusal;
    }
    std::size_t const wanted = echoLength(request);
    if (request.size() != wanted) {
        return "service " + hexText({request.front()}) + " wants " + std::to_string(wanted) + " bytes, here are " +
               std::to_string(request.size());
    }
    return std::nullopt;
}

std::optional<std::string> standardReply(std::string const& header)
{
    if (header.size() == 3 && header.starts_with("7E") && header[2] >= '0' && header[2] <= '7') {
        char const low = header[2];
        return std::string("7E") + (low == '0' ? '8' : low == '1' ? '9' : static_cast<char>('A' + low - '2'));
    }
    std::string const full = header.size() == 6 ? "18" + header : header;
    if (full.size() == 8 && full.starts_with("18DA") && full.ends_with("F1")) {
        return "18DAF1" + full.substr(4, 2);
    }
    return std::nullopt;
}

std::optional<std::string> swappedReply(std::string const& header)
{
    bool const legacy = header.size() == 6 && header.ends_with("F1") && !header.starts_with("DA");
    return legacy ? std::optional(header.substr(0, 2) + "F1" + header.substr(2, 2)) : std::nullopt;
}

// Of ISO 14230-4 the low bits of the first byte are a length.
bool isFunctionalHeader(std::string const& header)
{
    constexpr std::string_view headers[] = {"7DF", "18DB33F1", "DB33F1", "686AF1", "616AF1"};
    bool const kwp = header.size() == 6 && header.front() == 'C' && header.ends_with("33F1");
    return kwp || std::find(std::begin(headers), std::end(headers), header) != std::end(headers);
}

std::string toText(SignalMistake const& mistake, std::string const& path)
{
    std::string text = path;
    if (mistake.line != 0) {
        text += ":" + std::to_string(mistake.line);
    }
    return text + ": " + (mistake.key.empty() ? "" : mistake.key + ": ") + mistake.what;
}

} // namespace velmora
