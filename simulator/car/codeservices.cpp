#include "simulator/car/services.h"

namespace obdsim {

namespace {

constexpr std::size_t codesPerLine = 3;

Bytes countedCodes(std::uint8_t service, std::vector<std::uint16_t> const& codes)
{
    Bytes message = {service, static_cast<std::uint8_t>(codes.size())};
    for (auto const code : codes) {
        appendWord(message, code);
    }
    return message;
}

/// Three codes a line, filled with zeros; one empty line if there are none.
std::vector<Bytes> codeLines(std::uint8_t service, std::vector<std::uint16_t> const& codes)
{
    std::vector<Bytes> lines;
    for (std::size_t at = 0; at == 0 || at < codes.size(); at += codesPerLine) {
        Bytes line = {service};
        for (std::size_t i = at; i < at + codesPerLine; ++i) {
            appendWord(line, i < codes.size() ? codes[i] : std::uint16_t{0});
        }
        lines.push_back(line);
    }
    return lines;
}

Answer tellCodes(ServiceCall const& call, std::vector<std::uint16_t> const& codes)
{
    auto const service = call.positiveService();
    return call.onCan() ? Answer{0, {countedCodes(service, codes)}} : Answer{0, codeLines(service, codes)};
}

} // namespace

Answer storedCodes(ServiceCall const& call)
{
    return tellCodes(call, call.module.data().stored);
}

Answer pendingCodes(ServiceCall const& call)
{
    return tellCodes(call, call.module.data().pending);
}

Answer permanentCodes(ServiceCall const& call)
{
    return tellCodes(call, call.module.data().permanent);
}

Answer clearCodes(ServiceCall const& call)
{
    if (!call.module.data().clearsWhileRunning && call.module.engineRuns(call.now)) {
        return {refusal::conditionsNotCorrect, {}};
    }
    call.module.clear(call.now);
    return {0, {{call.positiveService()}}};
}

} // namespace obdsim
