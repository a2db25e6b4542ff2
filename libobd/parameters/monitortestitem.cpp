#include "libobd/parameters/monitortestitem.h"

#include "libobd/parameters/monitortesttexts.h"

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

} // namespace obd
