#include "simulator/car/services.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr std::uint8_t freezeFrameCode = 0x02;

std::set<std::uint8_t> currentIds(Module const& module)
{
    auto const pids = module.currentPids();
    return {pids.begin(), pids.end()};
}

std::optional<Bytes> currentItem(ServiceCall const& call, std::uint8_t pid)
{
    return isRangeRequest(pid) ? supportedMask(currentIds(call.module), pid) : call.module.currentData(pid, call.now);
}

FreezeFrame const* findFrame(ModuleData const& data, std::uint8_t number)
{
    auto const frame = std::find_if(data.frames.begin(), data.frames.end(),
                                    [number](FreezeFrame const& f) { return f.number == number; });
    return frame == data.frames.end() ? nullptr : &*frame;
}

std::set<std::uint8_t> frameIds(FreezeFrame const& frame)
{
    std::set<std::uint8_t> ids(frame.pids.begin(), frame.pids.end());
    ids.insert(freezeFrameCode);
    for (auto const& [pid, data] : frame.values) {
        ids.insert(pid);
    }
    return ids;
}

std::optional<Bytes> frameItem(Module const& module, FreezeFrame const& frame, std::uint8_t pid)
{
    if (isRangeRequest(pid)) {
        return supportedMask(frameIds(frame), pid);
    }
    if (pid == freezeFrameCode) {
        return Bytes{static_cast<std::uint8_t>(frame.code >> 8), static_cast<std::uint8_t>(frame.code & 0xFF)};
    }
    if (frame.code == 0) {
        return std::nullopt;
    }
    if (auto const value = frame.values.find(pid); value != frame.values.end()) {
        return value->second;
    }
    bool const kept = std::find(frame.pids.begin(), frame.pids.end(), pid) != frame.pids.end();
    return kept ? module.keptData(pid, frame.takenAt) : std::nullopt;
}

/// A module without a frame still tells that there is no code behind it (0000 in SAE J1979), and, of the one frame that
/// every module may have, that there is nothing but this to ask for.
std::optional<Bytes> missingFrameItem(std::uint8_t number, std::uint8_t pid)
{
    if (pid == freezeFrameCode) {
        return Bytes{0, 0};
    }
    return number == 0 && isRangeRequest(pid) ? supportedMask({freezeFrameCode}, pid) : std::nullopt;
}

} // namespace

Answer currentData(ServiceCall const& call)
{
    auto const count = static_cast<std::size_t>(call.module.data().mostPids);
    if (call.request.size() - 1 > count && call.module.data().morePids != MorePids::First) {
        bool const refuses = call.module.data().morePids == MorePids::Refuse;
        return Answer{refuses ? refusal::subfunctionNotSupported : std::uint8_t{0}, {}};
    }
    Bytes message = {call.positiveService()};
    for (std::size_t i = 1; i <= count && i < call.request.size(); ++i) {
        std::uint8_t const pid = call.request[i];
        if (auto const data = currentItem(call, pid)) {
            message.push_back(pid);
            message.insert(message.end(), data->begin(), data->end());
        }
    }
    return message.size() > 1 ? Answer{0, {message}} : Answer{};
}

Answer freezeFrame(ServiceCall const& call)
{
    auto const pid = call.at(1);
    auto const number = call.at(2);
    if (!pid || !number) {
        return {};
    }
    FreezeFrame const* frame = findFrame(call.module.data(), *number);
    auto const data = frame == nullptr ? missingFrameItem(*number, *pid) : frameItem(call.module, *frame, *pid);
    if (!data) {
        return {};
    }
    Bytes message = {call.positiveService(), *pid, *number};
    message.insert(message.end(), data->begin(), data->end());
    return {0, {message}};
}

} // namespace obdsim
