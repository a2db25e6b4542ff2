#pragma once

#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/read/sensorchoice.h"

#include <obd/iecu.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A control module and what it offers.
struct ModuleOffer
{
    std::shared_ptr<obd::IEcu> ecu;
    std::vector<OfferedSensor> sensors;
    bool meant = false; // by words that name no module
};

// A parameter of a control module that is to be polled.
struct PollChoice
{
    std::shared_ptr<obd::IEcu> ecu;
    obd::ParameterIdentifier::Id id;
    std::optional<double> hertz;
};

// What a user means by words such as "RPM", "RPM@10hz" and "7E9:05"; see chooseSensors and parseSensorWish. A word
// without a module means all modules that are meant, as far as they offer the sensor. hertz is for words without a
// rate. In the order of the words, none twice: of two rates the later one counts. Throws Error.
std::vector<PollChoice> choosePolled(std::vector<std::string> const& words, std::vector<ModuleOffer> const& offers,
                                     std::optional<double> hertz);

} // namespace velmora
