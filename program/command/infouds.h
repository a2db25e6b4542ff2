#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

namespace velmora::cli {

// `info --uds`: what the modules report, with the identifiers F180 to F19F of ISO 14229, or 1A80, 1A90 and 1A9B of ISO
// 14230 where a module does not know those.
ExitCode udsInfo(GlobalOptions const& options);

} // namespace velmora::cli
