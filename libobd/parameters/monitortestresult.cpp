#include "libobd/parameters/monitortestresult.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/monitortestitem.h"
#include "libobd/parameters/monitortesttexts.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>
#include <obd/protocolfamily.h>

#include <utility>

namespace obd {
namespace {

constexpr std::size_t canRecordLength = 9; // with the monitor identifier in front
constexpr std::size_t saeRecordLength = 6; // without the service byte in front
constexpr unsigned char componentMask = 0x7F;

// False for a record whose scaling is not known, which is then told once.
bool addItem(ObdMonitorTestItem& monitor, IMonitorTestItemParser const& parser)
{
    std::shared_ptr<IMonitorTestItem> metric = parser.parse(UnitSystem::Metric);
    if (metric == nullptr) {
        return false;
    }
    monitor.metricItems.push_back(std::move(metric));
    monitor.imperialItems.push_back(parser.parse(UnitSystem::Imperial));
    return true;
}

} // namespace

MonitorTestResult::MonitorTestResult(unsigned char id) : FixedRequestParameter({0x06, id}), m_id(id) {}

void MonitorTestResult::clear()
{
    m_monitors.clear();
}

std::vector<std::shared_ptr<ObdMonitorTestItem>> MonitorTestResult::getItems(IEcu const& ecu) const
{
    auto const* const monitors = findOrLog(m_monitors, ecu);
    return monitors != nullptr ? *monitors : std::vector<std::shared_ptr<ObdMonitorTestItem>>();
}

bool MonitorTestResult::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    return isCan(ecu->protocol()) ? parseFromCanBus(ecu->id(), data) : parseFromNonCanBus(ecu->id(), data);
}

bool MonitorTestResult::parseFromCanBus(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.empty() || (data.size() - 1) % canRecordLength != 0) {
        return refuseLength(data);
    }
    auto const monitor = std::make_shared<ObdMonitorTestItem>();
    monitor->id = m_id;
    monitor->description = descriptionCan();
    bool usable = true;
    for (std::size_t record = 1; record < data.size() && usable; record += canRecordLength) {
        if (data[record] != m_id) {
            TERVEX_LOG(Error) << "Invalid MID: " << static_cast<unsigned int>(data[record]) << " vs "
                              << static_cast<unsigned int>(m_id);
            usable = false;
        } else {
            addItem(*monitor, MonitorTestItemParserCan(toVector(slice(data, record + 1, canRecordLength - 1))));
        }
    }
    m_monitors[ecuId].push_back(monitor); // with what came before a foreign record
    return usable;
}

bool MonitorTestResult::parseFromNonCanBus(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    std::optional<SaeLines> const lines = saeLines(data);
    if (!lines) {
        return false;
    }
    for (std::size_t line = 0; line < lines->count(); ++line) {
        auto const monitor = std::make_shared<ObdMonitorTestItem>();
        auto const component = static_cast<unsigned char>(lines->byte(line, 2) & componentMask);
        monitor->id = component;
        monitor->description = descriptionSae(component);
        if (addItem(*monitor, MonitorTestItemParserNonCan(lines->bytes(line, 1, saeRecordLength)))) {
            m_monitors[ecuId].push_back(monitor);
        }
    }
    return true;
}

std::string MonitorTestResult::descriptionCan() const
{
    return canMonitorDescription(m_id);
}

std::string MonitorTestResult::descriptionSae(unsigned char component)
{
    return saeMonitorDescription(component);
}

} // namespace obd
