#pragma once

#include "tools/manual/commandmodel.h"

#include <filesystem>
#include <string>

namespace velmora::manual {

// What the pages of a program say beside its options.
struct ManualFacts
{
    std::string version;
    std::string date;    // "2026-01-31"
    std::string seeAlso; // roff, such as ".BR obdsim (1)"; may be empty
};

// The date of the pages: that of SOURCE_DATE_EPOCH, so that the same sources give the same pages; else of today.
std::string manualDate();

// Writes a page for the program and one for each of its commands: velmora.1, velmora-scan.1. Throws
// std::runtime_error if one can't be written.
void writeManual(std::filesystem::path const& folder, CommandRow const& program, ManualFacts const& facts);

} // namespace velmora::manual
