#pragma once

#include "tools/catalogue/source.h"

#include <ostream>
#include <vector>

namespace catalogue {

// One line a row: maker, code and text with tabs between.
void writeDump(std::ostream& output, std::vector<Row> const& table);

// The number of rows a maker, then those of the generic group and of all makers by the first two characters of the
// code, then the totals. The first words of a line are those of the counts manifest in the tests.
void writeCounts(std::ostream& output, std::vector<Row> const& table);

} // namespace catalogue
