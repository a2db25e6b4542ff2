#pragma once

#include "libvelmora/report/limittest.h"
#include "libvelmora/report/moduletopic.h"

#include <obd/oxygensensorlocation.h>

#include <optional>
#include <string>
#include <vector>

namespace velmora {

struct OxygenSensor
{
    obd::OxygenSensorLocation location;
    std::vector<LimitTest> tests;
};

struct OxygenReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::optional<bool> complete; // whether the monitor has run since the codes were cleared
    bool onCan = false;           // where the tests are among those of the monitors
    std::vector<OxygenSensor> sensors;
};

// "Bank 1 sensor 2"
std::string locationName(obd::OxygenSensorLocation location);

// "tests" is null on CAN.
Json toJsonValue(OxygenReport const& report);

} // namespace velmora
