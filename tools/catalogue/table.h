#pragma once

#include "tools/catalogue/source.h"

#include <vector>

namespace catalogue {

// The rows of the whole catalogue: makers in rising order, their rows by code, repeats in the order of the sources.
// Rows that cannot stand (a code given twice without "repeat", an unknown twin) add a problem to `source`.
std::vector<Row> buildTable(Source& source);

} // namespace catalogue
