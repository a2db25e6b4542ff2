#pragma once

#include "libobd/parameters/imonitortestitem.h"

#include <obd/unitsystem.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

// An on-board monitor with its test results. These are made for both unit systems when the reply is read, so that a
// change of the setting shows at the next look.
struct ObdMonitorTestItem
{
    using Items = std::vector<std::shared_ptr<IMonitorTestItem>>;

    unsigned int id{0}; // monitor identifier on CAN, component number on the older buses
    std::string description;
    Items metricItems;
    Items imperialItems;

    Items const& items(UnitSystem system) const { return system == UnitSystem::Imperial ? imperialItems : metricItems; }
};

} // namespace obd
