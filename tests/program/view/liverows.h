#pragma once

#include "program/view/live/livetable.h"

#include <sstream>
#include <string>
#include <vector>

namespace support {

// A row of one number, whose statistics are that number, too.
inline velmora::cli::LiveRow numberRow(std::string const& name, std::string const& value, std::string const& unit)
{
    velmora::cli::LiveRow row{};
    row.uid = 120;
    row.name = name;
    row.unit = unit;
    row.numeric = true;
    row.value = row.minimum = row.mean = row.maximum = value;
    return row;
}

inline std::vector<std::string> linesOf(std::string const& text)
{
    std::vector<std::string> list;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        list.push_back(line);
    }
    return list;
}

} // namespace support
