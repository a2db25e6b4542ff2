#include "simulator/car/module.h"

#include "simulator/car/services.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr std::uint8_t monitorsSinceCleared = 0x01;
constexpr std::uint8_t monitorsThisCycle = 0x41;
constexpr std::uint8_t compressionBit = 0x08; // of byte B

void setAllIncomplete(MonitorBits& bits)
{
    bits.continuousIncomplete = bits.continuous;
    bits.onceIncomplete = bits.once;
}

} // namespace

Module::Module(ModuleData data, bool compression, Drive const& drive, DataLayout layout)
    : m_data(std::move(data)), m_drive(drive), m_layout(layout)
{
    if (compression && m_data.monitors) {
        m_data.monitors->sinceCleared.continuous |= compressionBit;
        m_data.monitors->thisCycle.continuous |= compressionBit;
    }
}

Answer Module::answer(Bytes const& request, Time now)
{
    if (auto const refused = m_data.refusals.find(request); refused != m_data.refusals.end()) {
        return {refused->second, {}};
    }
    if (auto const recorded = m_data.raw.find(request); recorded != m_data.raw.end()) {
        return {0, recorded->second};
    }
    Answer result = fromServices(request, now);
    if (result.isSilent()) {
        result = recordedRange({*this, request, now});
    }
    if (result.isSilent() && m_data.refuses) {
        result.refusal =
            hasService(*this, request[0]) ? refusal::subfunctionNotSupported : refusal::serviceNotSupported;
    }
    return result;
}

Answer Module::fromServices(Bytes const& request, Time now)
{
    Service const* service = findService(request[0]);
    bool const has = service != nullptr && service->present(m_data);
    return has ? service->answer({*this, request, now}) : Answer{};
}

ModuleData const& Module::data() const
{
    return m_data;
}

DataLayout Module::layout() const
{
    return m_layout;
}

std::optional<Bytes> Module::currentData(std::uint8_t pid, Time now) const
{
    if (auto const changed = m_values.find(pid); changed != m_values.end()) {
        return changed->second;
    }
    return data(pid, m_drive.at(now));
}

DriveState Module::drive(Time now) const
{
    return m_drive.at(now);
}

std::optional<Bytes> Module::keptData(std::uint8_t pid, Time then) const
{
    return data(pid, m_drive.planned(then));
}

std::optional<Bytes> Module::data(std::uint8_t pid, DriveState const& drive) const
{
    if (m_data.monitors && (pid == monitorsSinceCleared || pid == monitorsThisCycle)) {
        return monitorWord(pid == monitorsThisCycle);
    }
    if (auto const fixed = m_data.fixed.find(pid); fixed != m_data.fixed.end()) {
        return fixed->second;
    }
    bool const live = std::find(m_data.live.begin(), m_data.live.end(), pid) != m_data.live.end();
    return live ? livePid(pid, drive, sinceCleared(drive)) : std::nullopt;
}

void Module::addCode(CodeKind kind, std::uint16_t code)
{
    bool& has = kind == CodeKind::Stored    ? m_data.hasStored
                : kind == CodeKind::Pending ? m_data.hasPending
                                            : m_data.hasPermanent;
    auto& codes = kind == CodeKind::Stored    ? m_data.stored
                  : kind == CodeKind::Pending ? m_data.pending
                                              : m_data.permanent;
    has = true;
    if (std::find(codes.begin(), codes.end(), code) == codes.end()) {
        codes.push_back(code);
    }
    m_data.lamp = m_data.lamp || kind == CodeKind::Stored;
}

void Module::setValue(std::uint8_t pid, std::optional<Bytes> const& data)
{
    if (data) {
        m_values[pid] = *data;
    } else {
        m_values.erase(pid);
    }
}

void Module::setSilent(bool silent)
{
    m_silent = silent;
}

bool Module::isSilent() const
{
    return m_silent;
}

std::vector<std::uint8_t> Module::currentPids() const
{
    std::vector<std::uint8_t> pids = m_data.live;
    for (auto const& [pid, data] : m_data.fixed) {
        pids.push_back(pid);
    }
    for (auto const& [pid, data] : m_values) {
        pids.push_back(pid);
    }
    if (m_data.monitors) {
        pids.push_back(monitorsSinceCleared);
        pids.push_back(monitorsThisCycle);
    }
    return pids;
}

bool Module::engineRuns(Time now) const
{
    return m_drive.at(now).rpm > 0;
}

void Module::clear(Time now)
{
    m_data.stored.clear();
    m_data.pending.clear();
    m_data.udsCodes.clear();
    m_data.kwpCodes.clear();
    for (auto& frame : m_data.frames) {
        frame.code = 0;
    }
    m_data.lamp = false;
    for (auto& test : m_data.monitorTests) {
        test.words.assign(test.words.size(), 0);
    }
    if (m_data.monitors) {
        setAllIncomplete(m_data.monitors->sinceCleared);
        setAllIncomplete(m_data.monitors->thisCycle);
        m_data.monitors->sinceCleared.continuousIncomplete &= static_cast<std::uint8_t>(~compressionBit);
        m_data.monitors->thisCycle.continuousIncomplete &= static_cast<std::uint8_t>(~compressionBit);
    }
    m_cleared = m_drive.at(now);
}

Bytes Module::monitorWord(bool thisCycle) const
{
    MonitorBits const& bits = thisCycle ? m_data.monitors->thisCycle : m_data.monitors->sinceCleared;
    // Byte A of the driving cycle's word is reserved.
    auto const lampAndCount = static_cast<std::uint8_t>((m_data.lamp ? 0x80U : 0U) | (m_data.stored.size() & 0x7FU));
    return {thisCycle ? std::uint8_t{0} : lampAndCount,
            static_cast<std::uint8_t>(bits.continuous | bits.continuousIncomplete << 4), bits.once,
            bits.onceIncomplete};
}

SinceCleared Module::sinceCleared(DriveState const& drive) const
{
    SinceCleared result;
    result.seconds = drive.totalSeconds;
    result.kilometres = drive.kilometres + m_data.kilometresSinceCleared;
    result.warmUps = m_data.warmUps;
    if (m_cleared) {
        result = {drive.totalSeconds - m_cleared->totalSeconds, drive.kilometres - m_cleared->kilometres, 0, 0, 0};
    }
    if (m_data.lamp) {
        result.lampSeconds = drive.totalSeconds;
        result.lampKilometres = drive.kilometres;
    }
    return result;
}

} // namespace obdsim
