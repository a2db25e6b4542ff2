#pragma once

#include "libvelmora/replay/recording.h"

#include <istream>

namespace velmora {

// As readRecording, of a text with a row of names in front, and of one with an object a line. Behind the last value
// that fits nothing is read.
Recording readCsv(std::istream& in, std::size_t mostValues = RecordingMaker::mostValues);
Recording readNdjson(std::istream& in, std::size_t mostValues = RecordingMaker::mostValues);

} // namespace velmora
