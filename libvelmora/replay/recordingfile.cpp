#include "libvelmora/replay/recordingfile.h"

#include "libvelmora/record/checkedfile.h"
#include "libvelmora/replay/readdatabase.h"

#include <velmora/error.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>

namespace velmora {

namespace {

std::ifstream opened(std::filesystem::path const& file)
{
    requirePlainFile(file);
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        throw Error(ErrorKind::Failed, "Could not read " + file.string() + ": " + std::strerror(errno),
                    {"is the name right, and may you read it?"});
    }
    return in;
}

} // namespace

RecordingForm formOf(std::string const& file)
{
    std::ifstream in = opened(file);
    std::string start(16, '\0');
    in.read(start.data(), static_cast<std::streamsize>(start.size()));
    start.resize(static_cast<std::size_t>(in.gcount()));
    if (start == std::string("SQLite format 3\0", 16)) {
        return RecordingForm::Database;
    }
    return start.starts_with("time,") ? RecordingForm::Csv
           : start.starts_with("{")   ? RecordingForm::Ndjson
                                      : RecordingForm::Dialogue;
}

Recording readRecording(std::string const& file)
{
    RecordingForm const form = formOf(file);
    std::ifstream in = opened(file);
    Recording recording = form == RecordingForm::Database ? readDatabase(file)
                          : form == RecordingForm::Csv    ? readCsv(in)
                                                          : readNdjson(in);
    if (recording.sensors.empty()) {
        throw Error(ErrorKind::Failed, file + " holds no readings");
    }
    return recording;
}

} // namespace velmora
