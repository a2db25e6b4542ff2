#include "libvelmora/signal/signal.h"

#include "libvelmora/signal/signalhex.h"

#include <algorithm>

namespace velmora {

namespace {

struct ServiceRow
{
    unsigned char service;
    std::size_t requestLength;
    std::size_t echoLength;
};

// SAE J1979, ISO 14229-1 and ISO 14230-3: services that only read, with the bytes of one identifier.
constexpr ServiceRow services[] = {
    {0x01, 2, 2}, {0x02, 3, 3}, {0x05, 3, 3}, {0x06, 2, 2}, {0x09, 2, 2}, {0x1A, 2, 2}, {0x21, 2, 2}, {0x22, 3, 3},
};

ServiceRow const* rowOf(std::vector<unsigned char> const& request)
{
    if (request.empty()) {
        return nullptr;
    }
    auto const found = std::find_if(std::begin(services), std::end(services),
                                    [&](ServiceRow const& row) { return row.service == request.front(); });
    return found == std::end(services) ? nullptr : &*found;
}

// Why services that people put into such files anyhow are kept out.
char const* dangerOf(unsigned char service)
{
    switch (service) {
    case 0x03:
    case 0x07:
    case 0x0A:
    case 0x12:
    case 0x13:
    case 0x17:
    case 0x18:
    case 0x19:
        return "reads trouble codes, which `velmora codes` does";
    case 0x10:
        return "changes the session: a module may stop its normal work";
    case 0x23:
        return "reads memory by address, which can hang a module";
    case 0x2A:
    case 0x86:
    case 0xAA:
        return "makes a module send on by itself";
    case 0x3E:
        return "keeps a session open, which only the program itself does";
    default:
        return "is none of those that only read (01, 02, 05, 06, 09, 1A, 21, 22)";
    }
}

} // namespace

std::size_t echoLength(std::vector<unsigned char> const& request)
{
    ServiceRow const* const row = rowOf(request);
    return row != nullptr ? row->echoLength : request.size();
}

std::optional<std::string> refusalOf(std::vector<unsigned char> const& request)
{
    if (request.empty()) {
        return "the request is empty";
    }
    ServiceRow const* const row = rowOf(request);
    if (row == nullptr) {
        return "service " + hexText({request.front()}) + " " + dangerOf(request.front());
    }
    if (request.size() != row->requestLength) {
        return "service " + hexText({request.front()}) + " wants " + std::to_string(row->requestLength) +
               " bytes, here are " + std::to_string(request.size());
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

std::string toText(SignalMistake const& mistake, std::string const& path)
{
    std::string text = path;
    if (mistake.line != 0) {
        text += ":" + std::to_string(mistake.line);
    }
    return text + ": " + (mistake.key.empty() ? "" : mistake.key + ": ") + mistake.what;
}

} // namespace velmora
