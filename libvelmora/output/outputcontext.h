#pragma once

#include "libvelmora/output/clockjudge.h"
#include "libvelmora/output/health.h"
#include "libvelmora/output/outputworker.h"

#include <filesystem>
#include <string>

namespace velmora {

// What outputs know of the one that feeds them.
struct OutputContext
{
    HealthSource health = [] { return Health(); };
    std::string vehicle = "car";       // its name in topics
    std::filesystem::path stateFolder; // for what an output has to keep, if it is not told where
    ClockSource clocks = lookAtClocks;
    OutputWorker::Tell tell = [](std::string const& /*text*/) {};
};

} // namespace velmora
