#pragma once

#include <CLI/App.hpp>

#include <string>
#include <vector>

namespace velmora::manual {

// An option or an argument of a command, as its help tells it.
struct OptionRow
{
    std::vector<std::string> names; // "-p", "--port"; an argument's one name
    std::string value;              // what it takes: "PORT"; empty for a flag
    std::vector<std::string> words; // the only values that it takes; empty for any
    std::string help;
    std::string variable; // environment variable that stands in for it
    bool argument = false;
    bool many = false; // takes more than one value
};

// A program, or one of its commands.
struct CommandRow
{
    std::string name;
    std::string help;
    std::string footer;
    std::vector<OptionRow> options;
    std::vector<CommandRow> commands;
};

// What the command line says of itself, without what it hides.
CommandRow describe(CLI::App const& app);

// The option of that name, or null.
OptionRow const* findOption(CommandRow const& command, std::string const& name);
// The command of that name, or null.
CommandRow const* findCommand(CommandRow const& command, std::string const& name);

} // namespace velmora::manual
