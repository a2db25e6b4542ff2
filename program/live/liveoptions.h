#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace velmora::cli {

// As given on the command line.
struct LiveOptions
{
    std::vector<std::string> sensors;
    std::string csv;
    bool force = false;             // csv may replace a file
    unsigned long count = 0;        // readings of every sensor; 0: no end
    double duration = 0.0;          // seconds; 0: no end
    std::string play;               // a recording in the place of a vehicle
    double speed = 1.0;             // of play
    bool fast = false;              // as fast as the bus allows
    std::size_t pidsPerRequest = 6; // at most; with fast only
    std::string rate;               // of sensors without a rate of their own
};

} // namespace velmora::cli
