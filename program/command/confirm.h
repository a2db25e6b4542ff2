#pragma once

#include "program/command/commandcar.h"

#include <string>

// How a command asks before it acts on the vehicle.

namespace velmora::cli {

// Throws Error if the user must be asked and standard input is no terminal. action as in "Clearing", yes as in
// "clears without asking".
void requireConsent(GlobalOptions const& options, std::string const& action, std::string const& yes);

// Asks, unless the options say yes already. The question is on standard error, behind the warning.
bool confirmed(CommandCar& car, std::string const& warning, std::string const& question);

// The same without a vehicle.
bool confirmed(GlobalOptions const& options, std::string const& warning, std::string const& question);

} // namespace velmora::cli
