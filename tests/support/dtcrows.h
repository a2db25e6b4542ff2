#pragma once

#include "libobd/catalogue/dtcreader.h"

#include <cstddef>
#include <initializer_list>
#include <vector>

namespace support {

inline bool loadRows(std::initializer_list<obd::DtcRow> rows)
{
    std::vector<obd::DtcRow> const table(rows);
    return obd::DtcReader::load(table.size(), [&table](std::size_t index) { return table[index]; });
}

// Fills the trouble code catalogue for its lifetime: with the rows of a test, or with the library's own. The catalogue
// is one a process, so only one of these can be about.
class LoadedCodes
{
public:
    LoadedCodes() { obd::DtcReader::init(); }
    explicit LoadedCodes(std::initializer_list<obd::DtcRow> rows) { loadRows(rows); }
    ~LoadedCodes() { obd::DtcReader::clean(); }
    LoadedCodes(LoadedCodes const&) = delete;
    LoadedCodes& operator=(LoadedCodes const&) = delete;
};

} // namespace support
