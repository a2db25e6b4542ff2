#pragma once

#include "libvelmora/output/outputrunner.h"

#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace velmora {

// How the one that feeds the outputs is.
struct Health
{
    bool linkUp = false;        // adapter and vehicle answer
    std::string state;          // "running", "parked", "connecting", ...
    std::string trouble;        // why there is no link or no vehicle; empty while both are there
    std::uint64_t requests = 0; // to control modules
    std::uint64_t errors = 0;   // requests without an answer
    std::uint64_t linkLosses = 0;
    std::uint64_t wakeRequests = 0; // made to a parked car, because the settings ask for it
    std::vector<std::pair<std::string, OutputCounts>> outputs;
};

// Any thread.
using HealthSource = std::function<Health()>;

} // namespace velmora
