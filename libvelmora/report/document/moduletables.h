#pragma once

#include "libvelmora/report/document/document.h"
#include "libvelmora/report/vehiclereport.h"

#include <string>
#include <vector>

// The tables of one control module's report, as document blocks.

namespace velmora {

// Code, maker and meaning; kind may be empty.
std::vector<DocumentCell> codeRow(char const* kind, TroubleCode const& code, DocumentMark mark);

// A monitor's or sensor's tests with their limits and bars; name is its head.
DocumentTable testTable(std::string const& name, std::vector<LimitTest> const& tests);

// How often each monitor ran of the times that it could, and the counters that stand alone.
std::vector<DocumentBlock> counterTables(CountersReport const& report);

DocumentTable valueTable(std::vector<LiveValue> const& values);

// Of how many a part is there, "0.78"; "-" of none.
std::string ratioText(unsigned int part, unsigned int whole);

} // namespace velmora
