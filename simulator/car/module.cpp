#include "simulator/car/module.h"

#include "simulator/car/services.h"

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

Module::Module(ModuleData data, EngineData const& engine, DataLayout layout)
    : m_data(std::move(data)), m_drive(engine), m_layout(layout)
{
    if (engine.compression && m_data.monitors) {
        m_data.monitors->sinceCleared.continuous |= compressionBit;
        m_data.monitors->thisCycle.continuous |= compressionBit;
    }
}

Answer Module::answer(Bytes const& request, Time now)
{
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
    if (m_data.monitors && (pid == monitorsSinceCleared || pid == monitorsThisCycle)) {
        return monitorWord(pid == monitorsThisCycle);
    }
    if (auto const fixed = m_data.fixed.find(pid); fixed != m_data.fixed.end()) {
        return fixed->second;
    }
    for (auto const live : m_data.live) {
        if (live == pid) {
            const DriveState drive = m_drive.at(now);
            return livePid(pid, drive, sinceCleared(drive));
        }
    }
    return std::nullopt;
}

std::vector<std::uint8_t> Module::currentPids() const
{
    std::vector<std::uint8_t> pids = m_data.live;
    for (auto const& [pid, data] : m_data.fixed) {
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
    m_clearedAt = now;
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
    result.seconds = drive.seconds;
    result.kilometres = drive.kilometres + m_data.kilometresSinceCleared;
    result.warmUps = m_data.warmUps;
    if (m_clearedAt) {
        const DriveState then = m_drive.at(*m_clearedAt);
        result = {drive.seconds - then.seconds, drive.kilometres - then.kilometres, 0, 0, 0};
    }
    if (m_data.lamp) {
        result.lampSeconds = drive.seconds;
        result.lampKilometres = drive.kilometres;
    }
    return result;
}

} // namespace obdsim
