#include "program/command/confirm.h"

#include "program/terminal/linereader.h"
#include "program/terminal/output.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

void requireConsent(GlobalOptions const& options, std::string const& action, std::string const& yes)
{
    if (!options.yes && ::isatty(STDIN_FILENO) == 0) {
        throw Error(ErrorKind::WrongUse, action + " must be confirmed, and there is no terminal to ask",
                    {"--yes " + yes});
    }
}

bool confirmed(CommandSession const& session, std::string const& warning, std::string const& question)
{
    if (session.options().yes) {
        return true;
    }
    dropTypedAhead();
    tell(fmt::format("{}{} [y/N] ", warning, question));
    std::string answer;
    return LineReader(session).read(answer) && (answer == "y" || answer == "Y" || answer == "yes");
}

} // namespace velmora::cli
