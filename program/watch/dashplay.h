#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <velmora/recording.h>

#include <string>

namespace velmora::cli {

// Shows a recording on the page in the place of a vehicle, until the user ends it. Throws Error.
ExitCode playOnPage(GlobalOptions const& global, std::string const& address, Recording const& recording, double speed);

} // namespace velmora::cli
