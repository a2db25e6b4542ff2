#pragma once

#include "libvelmora/replay/recording.h"

#include <filesystem>
#include <istream>

namespace velmora {

enum class RecordingForm
{
    Database, // as the output sqlite writes it
    Csv,      // one column a sensor, or one line a reading
    Ndjson,   // of the output ndjson, or of live --json
    Dialogue, // with an adapter: see readDialogue
};

// By what the file begins with. Throws Error if it can't be read.
RecordingForm formOf(std::filesystem::path const& file);

// All readings of a file that is no dialogue. Throws Error that names the line which can't be read; a last line that is
// torn is left out.
Recording readRecording(std::filesystem::path const& file);

Recording readCsv(std::istream& in);
Recording readNdjson(std::istream& in);

} // namespace velmora
