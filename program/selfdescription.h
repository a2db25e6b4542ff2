#pragma once

#include "program/exitcode.h"

#include <CLI/App.hpp>

#include <optional>

namespace velmora::cli {

// What the program tells packages and shells of its own command line, from the same source as --help:
// "__manual FOLDER" writes the manual pages, "__complete WORD..." prints what may stand in place of the last word.
// Nothing if the arguments ask for neither.
std::optional<ExitCode> describeItself(CLI::App const& app, int argc, char const* const* argv);

} // namespace velmora::cli
