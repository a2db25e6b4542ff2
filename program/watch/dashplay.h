#pragma once

#include "libvelmora/output/outputaddress.h"
#include "libvelmora/replay/recording.h"
#include "program/exitcode.h"
#include "program/globaloptions.h"

namespace velmora::cli {

// Shows a recording on the page in the place of a vehicle, until the user ends it. Throws Error.
ExitCode playOnPage(GlobalOptions const& global, OutputAddress const& address, Recording const& recording,
                    double speed);

} // namespace velmora::cli
