#include "libobd/powertrain/monitorstatus.h"

#include "libobd/bytes/bytes.h"

#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

namespace obd {
namespace {

constexpr std::size_t wordLength = 4;

bool isSet(unsigned int word, unsigned int bit)
{
    return (word >> bit & 1U) != 0;
}

MonitorTestInfo const* findTest(ReadinessMonitorTest test)
{
    for (MonitorTestInfo const& info : MonitorStatusWord::TEST_INFO_ARRAY) {
        if (info.test == test) {
            return &info;
        }
    }
    return nullptr;
}

} // namespace

MonitorStatusWord::MonitorStatusWord(unsigned char pid, std::string const& description)
    : PowertrainParameter(ObdMode::CurrentData, 0),
      m_info(std::make_shared<SensorInfo>(Pid2Uid(pid), description, false))
{}

unsigned int MonitorStatusWord::timeout() const
{
    return 2500;
}

void MonitorStatusWord::clear()
{
    std::lock_guard const lock(m_mutex);
    m_words.clear();
}

ParameterIdentifier::Id MonitorStatusWord::pid() const
{
    return m_info->pid();
}

std::string MonitorStatusWord::description(IEcu const& /*ecu*/)
{
    return m_info->description();
}

std::vector<std::shared_ptr<SensorInfo const>> MonitorStatusWord::sensorInfo(IEcu const& /*ecu*/)
{
    return {m_info};
}

std::vector<std::shared_ptr<SensorValue>> MonitorStatusWord::values(IEcu const& /*ecu*/, UnitSystem /*system*/)
{
    return {};
}

bool MonitorStatusWord::fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload)
{
    if (payload.size() < wordLength) {
        return false;
    }
    std::lock_guard const lock(m_mutex);
    m_words[ecu->id()] = readUint32(payload, 0);
    return true;
}

unsigned int MonitorStatusWord::word(IEcu const& ecu) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_words.find(ecu.id());
    return found != m_words.end() ? found->second : 0;
}

bool MonitorStatusWord::isAvailableBitSet(IEcu const& ecu, ReadinessMonitorTest test) const
{
    MonitorTestInfo const* const info = findTest(test);
    return info != nullptr && isSet(word(ecu), info->availableBit);
}

bool MonitorStatusWord::isAvailableAndComplete(IEcu const& ecu, ReadinessMonitorTest test) const
{
    MonitorTestInfo const* const info = findTest(test);
    if (info == nullptr) {
        return false;
    }
    unsigned int const bits = word(ecu); // read once, so that both bits are of the same reply
    return isSet(bits, info->availableBit) && !isSet(bits, info->completeBit);
}

MonitorStatus::MonitorStatus() : MonitorStatusWord(0x01, "Monitor status since DTCs cleared") {}

unsigned int MonitorStatus::getNumberOfErrors(IEcu const& ecu) const
{
    return word(ecu) >> 24U & 0x7FU;
}

bool MonitorStatus::isMalfunctionIndicatorLightOn(IEcu const& ecu) const
{
    return isSet(word(ecu), 31);
}

IgnitionType MonitorStatus::getIgnitionType(IEcu const& ecu) const
{
    return isAvailableBitSet(ecu, ReadinessIgnitionBit) ? IgnitionType::Compression : IgnitionType::Spark;
}

bool MonitorStatus::isTestAvailable(IEcu const& ecu, ReadinessMonitorTest test) const
{
    return isAvailableBitSet(ecu, test);
}

bool MonitorStatus::isTestComplete(IEcu const& ecu, ReadinessMonitorTest test) const
{
    return isAvailableAndComplete(ecu, test);
}

MonitorStatusThisCycle::MonitorStatusThisCycle() : MonitorStatusWord(0x41, "Monitor status this driving cycle") {}

bool MonitorStatusThisCycle::isTestEnabled(IEcu const& ecu, ReadinessMonitorTest test) const
{
    return isAvailableBitSet(ecu, test);
}

bool MonitorStatusThisCycle::isTestComplete(IEcu const& ecu, ReadinessMonitorTest test) const
{
    return isAvailableAndComplete(ecu, test);
}

} // namespace obd
