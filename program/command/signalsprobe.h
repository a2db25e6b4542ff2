#pragma once

#include "program/exitcode.h"
#include "program/globaloptions.h"

#include <velmora/probe.h>

#include <CLI/App.hpp>

#include <memory>
#include <string>

namespace velmora::cli {

// What `signals probe` is told.
struct ProbeOptions
{
    ProbeRequest request;
    std::string output;
    bool force = false;
};

// Adds the subcommand with its options, which fill the result.
CLI::App* addProbe(CLI::App& signals, ProbeOptions& options);

ExitCode probe(ProbeOptions const& given, GlobalOptions const& options);

} // namespace velmora::cli
