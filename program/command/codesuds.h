#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <string>

namespace velmora::cli {

// `codes --uds`: what the modules tell by service 19, or 18 where they do not know it, those that `modules` has found
// too. maker as the user named it.
ExitCode udsCodes(std::string const& maker, GlobalOptions const& options);

} // namespace velmora::cli
