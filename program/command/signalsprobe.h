#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <CLI/App.hpp>

#include <memory>
#include <string>

namespace velmora::cli {

// What `signals probe` is told.
struct ProbeOptions
{
    std::string module = "7E0";
    std::string reply;
    std::string extended;
    std::string service = "22";
    std::string from = "F100";
    std::string to = "F1FF";
    std::string output;
    bool fresh = false;
    bool force = false;
};

// Adds the subcommand with its options, which fill the result.
CLI::App* addProbe(CLI::App& signals, ProbeOptions& options);

ExitCode probe(ProbeOptions const& given, GlobalOptions const& options);

} // namespace velmora::cli
