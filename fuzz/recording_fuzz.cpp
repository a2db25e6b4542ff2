// Recordings, as CSV or NDJSON by the first byte of the input. What was read can be played from end to end, in the
// order of time.

#include "libvelmora/replay/recordingfile.h"

#include <velmora/error.h>

#include <cstdint>
#include <cstdlib>
#include <sstream>
#include <string>

namespace {

using namespace velmora;

void play(Recording const& recording)
{
    std::size_t all = 0;
    for (RecordedSensor const& each : recording.sensors) {
        all += each.values.size();
    }
    RecordingPlayer player(recording);
    std::size_t told = 0;
    std::int64_t last = recording.begin;
    player.seek(recording.end, [&](std::size_t /*sensor*/, RecordedValue const& value) {
        if (value.time < last) {
            std::abort();
        }
        last = value.time;
        ++told;
    });
    if (told != all || !player.atEnd()) {
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    std::istringstream in(std::string(data + 1, data + size));
    try {
        play(*data % 2 == 0 ? readCsv(in) : readNdjson(in));
    } catch (Error const&) {
        // Refusing is right.
    }
    return 0;
}
