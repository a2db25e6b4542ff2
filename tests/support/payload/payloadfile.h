#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace support {

// The messages of each control module by its id.
using ModuleMessages = std::map<unsigned int, std::vector<std::vector<unsigned char>>>;

// What the control modules answered to one request, worked out by hand from the frames.
struct ExpectedPayloads
{
    ModuleMessages rule;              // what the library gives on purpose, one payload a module
    ModuleMessages standard;          // what the bus standard says
    std::vector<std::string> reasons; // why the two differ
};

// By request as sent (empty for the empty line) and its occurrence in the dialogue, counted from 1.
using PayloadFile = std::map<std::pair<std::string, int>, ExpectedPayloads>;

// Throws std::runtime_error, with the line, on a file that is not in the form of tests/dialogues.
PayloadFile readPayloads(std::filesystem::path const& path);

} // namespace support
