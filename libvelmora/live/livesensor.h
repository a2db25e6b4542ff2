#pragma once

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A sensor that is read live: one of a parameter's, or a signal of one's own.
struct LiveSensor
{
    unsigned int module = 0; // id of the control module; 0 if any may answer
    int id = 0;              // the PID of its parameter, or the signal's number
    int uid = 0;             // by which values name it
    bool isSignal = false;
    std::string key;     // for settings and recordings: "RPM", "LAMBDA_2", or a signal's own
    std::string request; // of a signal, hexadecimal; empty for one that is worked out of others
    std::string name;    // for people
    std::string unit;    // as it is shown
    std::string metricUnit;
    bool numeric = true;
    std::optional<double> hertz; // how often it is to come
};

// All sensors that come in one turn.
using LiveParameter = std::vector<LiveSensor>;

// A parameter that can be chosen.
struct LiveOffer
{
    int id = 0;
    std::string title;
};

} // namespace velmora
