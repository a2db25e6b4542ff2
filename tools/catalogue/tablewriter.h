#pragma once

#include "tools/catalogue/source.h"

#include <ostream>
#include <vector>

namespace catalogue {

// Writes the C++ source with the constant table: blocks of texts, each text once, and the packed rows that point into
// them. The declarations it fills stand in libobd/catalogue/packeddtcrow.h.
void writeTable(std::ostream& output, std::vector<Row> const& table);

} // namespace catalogue
