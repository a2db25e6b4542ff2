#pragma once

#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

namespace support {

// Reads a table that is kept as text beside its tests: one row a line, cells between "|", blanks around a cell cut off.
// Empty lines and lines that begin with "#" are comments. path: from the root of the sources.
inline std::vector<std::vector<std::string>> readTable(std::string const& path)
{
    std::ifstream file(std::string(VELMORA_SOURCE_DIR) + "/" + path);
    if (!file) {
        throw std::runtime_error("no table " + path);
    }
    std::vector<std::vector<std::string>> rows;
    for (std::string line; std::getline(file, line);) {
        if (line.empty() || line.front() == '#') {
            continue;
        }
        std::vector<std::string> cells;
        std::istringstream rest(line + "|");
        for (std::string cell; std::getline(rest, cell, '|');) {
            std::size_t const first = cell.find_first_not_of(' ');
            std::size_t const last = cell.find_last_not_of(' ');
            cells.push_back(first == std::string::npos ? std::string() : cell.substr(first, last - first + 1));
        }
        rows.push_back(std::move(cells));
    }
    return rows;
}

} // namespace support
