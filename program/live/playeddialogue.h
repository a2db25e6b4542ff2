#pragma once

#include "program/globaloptions.h"

#include <velmora/recording.h>

#include <optional>
#include <string>

namespace velmora::cli {

// The recording that a dialogue makes; nothing, and a word about it, for one without times, which can only be read as a
// vehicle. Throws Error.
std::optional<Recording> playedDialogue(GlobalOptions const& global, std::string const& file);

} // namespace velmora::cli
