#include "simulator/car/services.h"

#include <algorithm>
#include <cmath>

namespace obdsim {

namespace {

constexpr std::uint8_t obdIdentifiers = 0xF4; // ISO 14229-1: F4xx is PID xx of service 01
constexpr std::uint8_t formatJ2012 = 0x00;
constexpr std::uint8_t availableStatus = 0xFF;

/// Writes a number of the drive into the data; what does not fit is cut to the range, below zero it is a two's
/// complement.
void put(Bytes& data, SignalField const& field, double value)
{
    double const range = std::ldexp(1.0, static_cast<int>(field.bytes * 8));
    auto raw = static_cast<std::int64_t>(std::llround(std::clamp(value, -range / 2, range - 1)));
    for (std::size_t i = field.bytes; i-- > 0; raw >>= 8) {
        data[field.at + i] = static_cast<std::uint8_t>(raw & 0xFF);
    }
}

Bytes dataOf(ServiceCall const& call, SignalData const& signal)
{
    Bytes data = signal.data;
    DriveState const drive = call.module.drive(call.now);
    for (auto const& field : signal.fields) {
        put(data, field, *Drive::value(drive, field.value) * field.scale + field.offset);
    }
    return data;
}

/// The data of one identifier of service 22.
std::optional<Bytes> identified(ServiceCall const& call, std::uint8_t high, std::uint8_t low)
{
    auto const& signals = call.module.data().signals;
    if (auto const found = signals.find({0x22, high, low}); found != signals.end()) {
        return dataOf(call, found->second);
    }
    return high == obdIdentifiers ? call.module.currentData(low, call.now) : std::nullopt;
}

bool matches(UdsCode const& code, std::uint8_t mask)
{
    return (code.status & mask) != 0;
}

} // namespace

/// Several identifiers in one request: those that the module has, or a refusal if it has none.
Answer identifiedData(ServiceCall const& call)
{
    constexpr std::uint8_t wrongLength = 0x13;
    if (call.request.size() < 3 || call.request.size() % 2 == 0) {
        return {wrongLength, {}};
    }
    Bytes message = {call.positiveService()};
    for (std::size_t i = 1; i + 1 < call.request.size(); i += 2) {
        if (auto const data = identified(call, call.request[i], call.request[i + 1])) {
            message.insert(message.end(), {call.request[i], call.request[i + 1]});
            message.insert(message.end(), data->begin(), data->end());
        }
    }
    return message.size() > 1 ? Answer{0, {message}} : Answer{refusal::outOfRange, {}};
}

Answer localData(ServiceCall const& call)
{
    auto const& signals = call.module.data().signals;
    auto const found = signals.find(call.request);
    if (found == signals.end()) {
        return {refusal::subfunctionNotSupported, {}};
    }
    Bytes message = {call.positiveService(), call.request[1]};
    Bytes const data = dataOf(call, found->second);
    message.insert(message.end(), data.begin(), data.end());
    return {0, {message}};
}

Answer testerPresent(ServiceCall const& call)
{
    constexpr std::uint8_t noAnswer = 0x80;
    if (call.at(1) == noAnswer) {
        return {};
    }
    return call.at(1) == std::uint8_t{0} ? Answer{0, {{call.positiveService(), 0}}}
                                         : Answer{refusal::subfunctionNotSupported, {}};
}

/// Service 18: the stored codes of all groups, in one of the two forms that testers ask for.
Answer kwpCodes(ServiceCall const& call)
{
    constexpr std::size_t length = 4;
    bool const stored = call.at(1) == std::uint8_t{0x00} || call.at(1) == std::uint8_t{0x02};
    if (call.request.size() != length || !stored) {
        return {refusal::subfunctionNotSupported, {}};
    }
    auto const& codes = call.module.data().kwpCodes;
    Bytes message = {call.positiveService(), static_cast<std::uint8_t>(codes.size())};
    for (auto const& code : codes) {
        appendWord(message, code.code);
        message.push_back(code.status);
    }
    return {0, {message}};
}

/// Service 19: 01 counts, 02 lists the codes whose status has a bit of the mask, 0A all.
Answer udsCodes(ServiceCall const& call)
{
    auto const sub = call.at(1).value_or(0);
    auto const& codes = call.module.data().udsCodes;
    auto const mask = sub == 0x0A ? std::uint8_t{0xFF} : call.at(2).value_or(0);
    Bytes message = {call.positiveService(), sub, availableStatus};
    if (sub == 0x01) {
        auto const count =
            std::count_if(codes.begin(), codes.end(), [mask](UdsCode const& c) { return matches(c, mask); });
        message.push_back(formatJ2012);
        appendWord(message, static_cast<std::uint16_t>(count));
        return {0, {message}};
    }
    if (sub != 0x02 && sub != 0x0A) {
        return {refusal::subfunctionNotSupported, {}};
    }
    for (auto const& code : codes) {
        if (sub == 0x0A || matches(code, mask)) {
            appendWord(message, code.code);
            message.insert(message.end(), {code.failureType, code.status});
        }
    }
    return {0, {message}};
}

} // namespace obdsim
