#pragma once

#include "simulator/adapter/buslink.h"

namespace obdsim {

/// What an adapter does beside answering.
enum class After : int
{
    Nothing,
    Reset,    ///< banner instead of a plain reply
    BaudRate, ///< the confirmation dialogue of ATBRD
    Sleep,    ///< low power until a character wakes it
    Monitor   ///< listens until a character stops it
};

/// Answer of a command: lines without their CR.
struct CommandReply
{
    std::vector<std::string> lines;
    After after = After::Nothing;
    Time delay{}; ///< before the answer
};

/// What a command may read and change.
struct CommandContext
{
    AdapterProfile const& profile;
    Settings& settings;
    BusLink& bus;
    Time now;
};

using CommandHandler = CommandReply (*)(CommandContext& context, std::string const& argument);

/// One AT command.
///
/// `shape` tells what may follow the name, alternatives divided by "|": h stands
/// for a hexadecimal digit, x for one or X, f for 0 or 1, t for 0 to 2, * for any hexadecimal
/// digits, any other character for itself.
struct Command
{
    char const* name;
    char const* shape;
    int level; ///< since this version of the ELM327, times a hundred; 131 is v1.3a, 142 v1.4b
    unsigned int families;
    CommandHandler handler;
};

/// A command with what stands behind its name.
struct CommandCall
{
    Command const* command;
    std::string argument;
};

/// The settings after power-up.
Settings factorySettings(AdapterProfile const& profile);

/// Finds the AT command in `text` (normalised, without "AT") for an adapter.
std::optional<CommandCall> findCommand(AdapterProfile const& profile, std::string const& text);

CommandReply ok();
/// OK of a command that writes to the EEPROM first: some 30 ms (ELM327 data sheet v1.4b, page 24).
CommandReply stored();
CommandReply refused();
CommandReply line(std::string text);

} // namespace obdsim
