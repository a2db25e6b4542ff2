#pragma once

#include "libobd/parameters/imonitortestitem.h"

#include <obd/unitsystem.h>

#include <memory>
#include <vector>

namespace obd {

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
