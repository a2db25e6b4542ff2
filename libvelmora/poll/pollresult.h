#pragma once

#include <obd/parameteridentifier.h>
#include <obd/sensordatamodels.h>
#include <velmora/reading.h>

#include <memory>
#include <vector>

namespace velmora {

// What one parameter of one control module told in one turn.
struct PollResult
{
    unsigned int module = 0;
    obd::ParameterIdentifier::Id id{};
    std::vector<Reading> readings; // one for each sensor that was told
    // The same with the statistics since the poller began, as texts.
    std::vector<std::shared_ptr<obd::SensorValueDataModel>> values;
};

} // namespace velmora
