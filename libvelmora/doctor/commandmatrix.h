#pragma once

#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A command with the version of the ELM327 that brought it in.
struct CommandRow
{
    char const* version;
    char const* command;
    bool answersOk; // by OK; else by a text
    bool onStn;     // STN chips know it too
};

// Only commands that change nothing.
std::vector<CommandRow> const& commandRows();

// Which of the commands an adapter knows, against the version that it claims.
struct CommandMatrix
{
    std::string claimed;              // "1.5" of "ELM327 v1.5"; empty if it names none
    bool agreesToAll = false;         // it said OK to a command that can't exist, so nothing of this tells anything
    std::string level;                // the highest version of which it knows all
    std::vector<std::string> missing; // of the claimed version
    bool claimIsMadeUp = false;       // a version that its maker never made
};

// The reply to a command; nothing for none.
using AskAdapter = std::function<std::optional<std::string>(std::string const& command)>;

// Asks for each row, the command that can't exist first. identity is the adapter's answer to ATI. An STN is held to the
// commands of its kind.
CommandMatrix probeCommands(AskAdapter const& ask, std::string const& identity, bool isStn);

} // namespace velmora
