#include "program/live/playeddialogue.h"

#include "program/command/commandcar.h"
#include "program/terminal/output.h"

namespace velmora::cli {

std::optional<Recording> playedDialogue(GlobalOptions const& global, std::string const& file)
{
    GlobalOptions replayed = global;
    replayed.quiet = true; // there is no vehicle whose connection would be worth telling
    InterruptStop const stop;
    std::optional<Recording> recording = readDialogueRecording(file, carOptions(replayed, stop.token()));
    if (!recording && !global.quiet) {
        tell("The dialogue has no times: it is read as a vehicle, without pause and bar\n");
    }
    return recording;
}

} // namespace velmora::cli
