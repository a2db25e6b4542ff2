#include "libobd/parameters/monitortestitem.h"

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/monitortesttexts.h"
#include "libobd/value/unitscalingfactory.h"

#include <common/logrecord.h>

#include <utility>

namespace obd {

MonitorTestItem::MonitorTestItem(std::shared_ptr<IUnitScaling> scaling, unsigned char testId, unsigned char component,
                                 double value, double limit)
    : m_scaling(std::move(scaling)), m_testId(testId), m_component(component), m_value(value), m_limit(limit)
{}

std::string MonitorTestItem::description() const
{
    return saeTestDescription(m_testId);
}

std::string MonitorTestItem::minimum() const
{
    return isLowerLimit() ? m_scaling->toString(m_limit) : std::string();
}

std::string MonitorTestItem::maximum() const
{
    return isLowerLimit() ? std::string() : m_scaling->toString(m_limit);
}

IMonitorTestItem::Status MonitorTestItem::status() const
{
    bool const outside = isLowerLimit() ? m_limit > m_value : m_value > m_limit;
    return outside ? Failed : Passed;
}

CanMonitorTestItem::CanMonitorTestItem(std::shared_ptr<IUnitScaling> scaling, unsigned char testId, double value,
                                       double minimum, double maximum)
    : m_scaling(std::move(scaling)), m_testId(testId), m_value(value), m_minimum(minimum), m_maximum(maximum)
{}

std::string CanMonitorTestItem::description() const
{
    return canTestDescription(m_testId);
}

IMonitorTestItem::Status CanMonitorTestItem::status() const
{
    // After a clearing of the codes modules answer with value and limits of 0 until the test has run.
    if (m_value == 0.0 && m_minimum == 0.0 && m_maximum == 0.0) {
        return NoResult;
    }
    return m_minimum > m_value || m_value > m_maximum ? Failed : Passed;
}

MonitorTestItemParserCan::MonitorTestItemParserCan(std::vector<unsigned char> record) : m_record(std::move(record)) {}

std::shared_ptr<IMonitorTestItem> MonitorTestItemParserCan::parse(UnitSystem system) const
{
    unsigned char const scalingId = m_record.at(1);
    std::shared_ptr<IUnitScaling> const scaling = UnitScalingFactory::createForCan(scalingId, system);
    if (scaling == nullptr) {
        TERVEX_LOG(Error) << "Failed to create unit scaler for scale ID: " << static_cast<unsigned int>(scalingId);
        return nullptr;
    }
    return std::make_shared<CanMonitorTestItem>(scaling, m_record.at(0), scaling->value(readUint16(m_record, 2)),
                                                scaling->value(readUint16(m_record, 4)),
                                                scaling->value(readUint16(m_record, 6)));
}

MonitorTestItemParserNonCan::MonitorTestItemParserNonCan(std::vector<unsigned char> record)
    : m_record(std::move(record))
{}

std::shared_ptr<IMonitorTestItem> MonitorTestItemParserNonCan::parse(UnitSystem /*system*/) const
{
    unsigned char const testId = m_record.at(0);
    std::shared_ptr<IUnitScaling> const scaling = UnitScalingFactory::createForTest(testId);
    if (scaling == nullptr) {
        TERVEX_LOG(Error) << "Failed to create unit scaler for TID: " << static_cast<unsigned int>(testId);
        return nullptr;
    }
    return std::make_shared<MonitorTestItem>(scaling, testId, m_record.at(1), scaling->value(readUint16(m_record, 2)),
                                             scaling->value(readUint16(m_record, 4)));
}

} // namespace obd
