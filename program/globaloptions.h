#pragma once

#include <obd/vehicleprotocol.h>
#include <velmora/units.h>

#include <optional>
#include <string>
#include <vector>

namespace velmora::cli {

enum class ColorMode
{
    Auto,
    Always,
    Never,
};

// What the options before the command say, as given; the settings file fills what stays empty.
struct GlobalOptions
{
    std::string port;
    std::optional<unsigned int> baud;
    std::optional<obd::VehicleProtocol> protocol;
    std::optional<Units> units;
    std::optional<unsigned int> ecu; // control module id
    bool allEcus = false;            // all of them, where one is the usual
    bool json = false;
    std::string logFile;
    std::string traceFile;
    std::string settingsFile;
    std::vector<std::string> signalFiles;
    bool reset = false;
    bool sleep = false;  // send the adapter to sleep at the end
    bool forget = false; // drop what earlier visits have learnt
    bool yes = false;
    bool quiet = false;
    bool verbose = false;
    std::optional<ColorMode> color;
};

// "auto", "1" to "9", or as adapters print a protocol that they found, "A6". Nothing for any other text.
std::optional<obd::VehicleProtocol> parseProtocol(std::string const& text);

// A control module id in hexadecimal, with or without 0x. Nothing for any other text.
std::optional<unsigned int> parseEcuId(std::string const& text);

} // namespace velmora::cli
