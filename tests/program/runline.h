#pragma once

#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/interrupt.h"
#include "tests/program/terminal/terminalinput.h"

#include <fcntl.h>
#include <iterator>
#include <sstream>
#include <vector>

// What came of a command line.
struct Ended
{
    velmora::cli::ExitCode code;
    std::string out;
    std::string err;
};

inline std::vector<std::string> wordsOf(std::string const& text)
{
    std::istringstream in(text);
    return {std::istream_iterator<std::string>(in), {}};
}

// Runs the program's main, but for its locale.
inline velmora::cli::ExitCode runMainAsItIs(std::vector<std::string> const& words)
{
    std::vector<char const*> arguments = {"velmora"};
    for (std::string const& word : words) {
        arguments.push_back(word.c_str());
    }
    SignalsAsBefore const signals;
    velmora::cli::Interrupt const interrupt;
    velmora::cli::CommandLine commandLine;
    velmora::cli::addCommands(commandLine);
    return commandLine.run(static_cast<int>(arguments.size()), arguments.data());
}

// The same with nobody at the keyboard.
inline velmora::cli::ExitCode runMain(std::vector<std::string> const& words)
{
    int const nobody = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    Replaced const input(STDIN_FILENO, nobody);
    ::close(nobody);
    return runMainAsItIs(words);
}

inline Ended runLine(std::vector<std::string> const& words)
{
    testing::internal::CaptureStdout();
    testing::internal::CaptureStderr();
    velmora::cli::ExitCode const code = runMain(words);
    std::string out = testing::internal::GetCapturedStdout();
    return {code, std::move(out), testing::internal::GetCapturedStderr()};
}
