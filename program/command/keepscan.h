#pragma once

#include "program/globaloptions.h"

#include <velmora/report.h>

#include <CLI/App.hpp>

#include <string>

// Whether and how scan keeps what it read in the history.

namespace velmora::cli {

// What the settings file keeps of it.
inline constexpr char const* historyKeepKey = "history/keep";
inline constexpr char const* historyNameKey = "history/vehicle";

struct KeepWish
{
    bool keep = false;
    bool drop = false;
    std::string vehicle; // name of a vehicle that tells no identification number
};

void addKeepOptions(CLI::App& command, KeepWish& wish);

// Whether the scan is to be kept. Asks once, on a terminal, and remembers the answer in the settings; without a
// terminal or with --json nothing is asked, and nothing kept unless the wish says so. Fills in the name from the
// settings. Throws Error on Ctrl-C.
bool decidesToKeep(KeepWish& wish, GlobalOptions const& options);

// Keeps the report and tells its number. A failure is told, and ends the program with exit code 1 where the user asked
// for the keeping; the report itself has been shown by then.
void keepScan(VehicleReport const& report, KeepWish const& wish, GlobalOptions const& options);

} // namespace velmora::cli
