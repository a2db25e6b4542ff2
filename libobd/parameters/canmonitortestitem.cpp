#include "libobd/parameters/canmonitortestitem.h"

#include "libobd/parameters/monitortesttexts.h"

#include <utility>

namespace obd {

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

} // namespace obd
