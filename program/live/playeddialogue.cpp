#include "program/live/playeddialogue.h"

#include "libvelmora/replay/readdialogue.h"
#include "program/command/commandsession.h"
#include "program/terminal/output.h"

#include <memory>

namespace velmora::cli {

std::optional<Recording> playedDialogue(GlobalOptions const& global, std::string const& file)
{
    GlobalOptions replayed = global;
    replayed.port = "replay:" + file + "?instant";
    replayed.quiet = true; // there is no vehicle whose connection would be worth telling
    std::optional<Recording> recording =
        readDialogue(file, [&replayed] { return std::make_shared<CommandSession>(replayed); });
    if (!recording && !global.quiet) {
        tell("The dialogue has no times: it is read as a vehicle, without pause and bar\n");
    }
    return recording;
}

} // namespace velmora::cli
