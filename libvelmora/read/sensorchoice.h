#pragma once

#include <obd/isensorservice.h>
#include <obd/parameteridentifier.h>

#include <string>
#include <vector>

namespace velmora {

// A parameter that the vehicle offers.
struct OfferedSensor
{
    obd::ParameterIdentifier::Id id;
    std::string title;
};

// What the current control module offers.
std::vector<OfferedSensor> offeredSensors(obd::ISensorService& service);

using SensorIds = std::vector<obd::ParameterIdentifier::Id>;

// What a user means: each word is a PID (0C, 010C, 0x0C, $0C), a name (RPM, COOLANT_TEMP), some words of a title
// ("air temperature"), or "all". None at all means speed, engine speed, coolant, load and throttle, as far as the
// vehicle offers them. In the order of the words, none twice. Throws Error, with what is there instead, for what is
// not known, not clear, or not offered.
SensorIds chooseSensors(std::vector<std::string> const& words, std::vector<OfferedSensor> const& offered);

} // namespace velmora
