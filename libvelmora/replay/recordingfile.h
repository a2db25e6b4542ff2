#pragma once

#include "libvelmora/replay/recording.h"

#include <istream>

namespace velmora {

// As readRecording, of a text with a row of names in front, and of one with an object a line.
Recording readCsv(std::istream& in);
Recording readNdjson(std::istream& in);

} // namespace velmora
