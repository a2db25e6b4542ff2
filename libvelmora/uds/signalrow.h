#pragma once

#include <optional>
#include <string>

namespace velmora {

// A chosen signal as a row of what is shown.
struct SignalRow
{
    unsigned int module = 0; // as its results name it; 0 if any may answer
    int id = 0;
    std::string sensor;  // its key
    std::string request; // hexadecimal; empty for one that is worked out of others
    std::string name;
    std::string unit;
    bool numeric = true;
    std::optional<double> hertz;
};

} // namespace velmora
