#pragma once

#include "libobd/value/linearscaling.h"

#include <obd/measurementunit.h>
#include <obd/unitsystem.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

// One test result of an on-board monitor: a value with its limits, as texts in one unit. Immutable.
class IMonitorTestItem
{
public:
    enum Status : int
    {
        Passed = 0,
        Failed = 1,
        NoResult = 2, // the test has not run since the codes were cleared
    };

    virtual ~IMonitorTestItem() = default;

    virtual unsigned char testId() const = 0;
    virtual std::string description() const = 0;
    virtual std::string value() const = 0;
    virtual std::string minimum() const = 0; // empty if there is no lower limit
    virtual std::string maximum() const = 0; // empty if there is no upper limit
    virtual Status status() const = 0;
    virtual MeasurementUnit unit() const = 0;
};

// A test result on the legacy buses, which has one limit.
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

// An on-board monitor with its test results. These are made for both unit systems when the reply is read, so that a
// change of the setting shows at the next look.
struct ObdMonitorTestItem
{
    using Items = std::vector<std::shared_ptr<IMonitorTestItem>>;

    unsigned int id{0}; // monitor identifier on CAN, component number on the legacy buses
    std::string description;
    Items metricItems;
    Items imperialItems;

    Items const& items(UnitSystem system) const { return system == UnitSystem::Imperial ? imperialItems : metricItems; }
};

// Makes a test result of one record of a service 06 reply.
class IMonitorTestItemParser
{
public:
    virtual ~IMonitorTestItemParser() = default;

    // Null, with a log line, for a record whose scaling is not known. Throws std::out_of_range for a record that is
    // cut.
    virtual std::shared_ptr<IMonitorTestItem> parse(UnitSystem system) const = 0;
};

// 8 bytes: test, unit and scaling identifier, then value, lower and upper limit as words.
class MonitorTestItemParserCan : public IMonitorTestItemParser
{
public:
    explicit MonitorTestItemParserCan(std::vector<unsigned char> record);
    std::shared_ptr<IMonitorTestItem> parse(UnitSystem system) const override;

private:
    std::vector<unsigned char> m_record;
};

// 6 bytes: test, component and kind of limit, then value and limit as words. Texts are always metric.
class MonitorTestItemParserNonCan : public IMonitorTestItemParser
{
public:
    explicit MonitorTestItemParserNonCan(std::vector<unsigned char> record);
    std::shared_ptr<IMonitorTestItem> parse(UnitSystem system) const override;

private:
    std::vector<unsigned char> m_record;
};

} // namespace obd
