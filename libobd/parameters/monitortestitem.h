#pragma once

#include "libobd/parameters/imonitortestitem.h"
#include "libobd/value/iunitscaling.h"

#include <memory>

namespace obd {

// A test result on the buses before CAN, which has one limit.
class MonitorTestItem : public IMonitorTestItem
{
public:
    // component: bit 7 says that the limit is a lower one. The numbers are scaled already; scaling must not be null.
    MonitorTestItem(std::shared_ptr<IUnitScaling> scaling, unsigned char testId, unsigned char component, double value,
                    double limit);

    unsigned char testId() const override { return m_testId; }
    std::string description() const override;
    std::string value() const override { return m_scaling->toString(m_value); }
    std::string minimum() const override;
    std::string maximum() const override;
    Status status() const override;
    MeasurementUnit unit() const override { return m_scaling->unit(); }

private:
    bool isLowerLimit() const { return (m_component & 0x80U) != 0; }

    std::shared_ptr<IUnitScaling> m_scaling;
    unsigned char m_testId;
    unsigned char m_component;
    double m_value;
    double m_limit;
};

} // namespace obd
