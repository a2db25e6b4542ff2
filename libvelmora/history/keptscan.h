#pragma once

#include <chrono>
#include <cstdint>
#include <string>

namespace velmora {

// One scan of a vehicle as the history keeps it.
struct KeptScan
{
    std::int64_t number = 0; // as people name it; 0 for one that is not kept yet
    std::string vehicle;     // its identification number, or the name that its owner gave it
    std::chrono::sys_time<std::chrono::milliseconds> time;
    std::string program;  // version that made it
    std::string hash;     // of the document
    std::string document; // the report as VehicleReport::toJson has it, on one line; may be left out in lists
};

// Sixteen hexadecimal digits that tell documents apart; no proof against intent.
std::string hashOf(std::string const& document);

} // namespace velmora
