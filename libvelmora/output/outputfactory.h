#pragma once

#include "libvelmora/output/clockjudge.h"
#include "libvelmora/output/health.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"

#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace velmora {

// What outputs know of the one that feeds them.
struct OutputContext
{
    HealthSource health = [] { return Health(); };
    std::string vehicle = "car";       // its name in topics
    std::filesystem::path stateFolder; // for what an output has to keep, if it is not told where
    ClockSource clocks = lookAtClocks;
    OutputRunner::Tell tell = [](std::string const& /*text*/) {};
};

// The kinds that this build has, as they are written in an address.
std::vector<std::string> builtInOutputs();

// Throws Error if the address makes no sense, or names a kind that was left out of this build.
std::unique_ptr<IOutput> makeOutput(OutputAddress const& address, OutputContext const& context);

} // namespace velmora
