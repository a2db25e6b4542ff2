#pragma once

#include "libobd/parameters/imonitortestitem.h"
#include "libobd/value/iunitscaling.h"

#include <memory>

namespace obd {

// A test result on CAN, which has both limits.
class CanMonitorTestItem : public IMonitorTestItem
{
public:
    // The numbers are scaled already; scaling must not be null.
    CanMonitorTestItem(std::shared_ptr<IUnitScaling> scaling, unsigned char testId, double value, double minimum,
                       double maximum);

    unsigned char testId() const override { return m_testId; }
    std::string description() const override;
    std::string value() const override { return m_scaling->toString(m_value); }
    std::string minimum() const override { return m_scaling->toString(m_minimum); }
    std::string maximum() const override { return m_scaling->toString(m_maximum); }
    Status status() const override;
    MeasurementUnit unit() const override { return m_scaling->unit(); }

private:
    std::shared_ptr<IUnitScaling> m_scaling;
    unsigned char m_testId;
    double m_value;
    double m_minimum;
    double m_maximum;
};

} // namespace obd
