#pragma once

#include "simulator/control/controlerror.h"
#include "simulator/peer.h"

#include <vector>

namespace obdsim {

/// A control line with its time.
struct ScenarioLine
{
    Time time{}; ///< since the simulation began
    std::string command;
    std::string place = {}; ///< "FILE:LINE", for messages
};

/// Lines of a scenario file: seconds, a blank, a control line; # begins a comment. The times must not fall.
/// Throws ControlError, whose text begins with "ORIGIN:LINE: ".
std::vector<ScenarioLine> parseScenario(std::string const& text, std::string const& origin);

/// The same from a file.
std::vector<ScenarioLine> loadScenario(std::string const& path);

/// The text that parseScenario() reads, with all six decimals of each time.
std::string formatScenario(std::vector<ScenarioLine> const& lines);

} // namespace obdsim
