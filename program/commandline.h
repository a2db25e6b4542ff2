#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <CLI/App.hpp>

#include <functional>

namespace velmora::cli {

// The command line: global options, and the commands, each of which says what to run.
class CommandLine
{
public:
    using Action = std::function<ExitCode(GlobalOptions const&)>;

    CommandLine();
    CommandLine(CommandLine const&) = delete;
    CommandLine& operator=(CommandLine const&) = delete;

    // Adds a command; its options are added to the result by the caller, and must outlive the run.
    CLI::App* addCommand(std::string const& name, std::string const& help, Action action);

    // Parses and runs. Problems go to standard error, with what to try.
    ExitCode run(int argc, char const* const* argv);

private:
    void addGlobalOptions();
    ExitCode runAction();

    CLI::App m_app;
    GlobalOptions m_options;
    Action m_action;
};

} // namespace velmora::cli
