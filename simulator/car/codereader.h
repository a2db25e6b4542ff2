#pragma once

#include "simulator/car/tablereader.h"

namespace obdsim {

/// The number of the trouble code `text`, which stands at `key`. Throws VehicleFileError if it is none.
std::uint16_t readCode(TableReader& table, std::string_view key, std::string const& text);

/// The numbers of the trouble codes in the array at `key`.
std::vector<std::uint16_t> readCodes(TableReader& table, std::string_view key);

} // namespace obdsim
