#pragma once

#include "libvelmora/output/outputaddress.h"
#include "libvelmora/watch/sleepjudge.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// What the watch is to do, from its file or the command line.
struct WatchSettings
{
    std::string port;    // empty: as for any command
    std::string vehicle; // empty: an id that is made up once and kept
    bool fullVin = false;
    bool fast = false;
    std::vector<std::string> sensors; // as sensor wishes: "RPM@10hz"
    std::vector<std::string> signals; // files of signals of one's own
    std::vector<OutputAddress> outputs;
    BatterySettings battery;
    std::chrono::minutes codesEvery{10};
};

// Reads the text of a settings file. Throws Error (wrong use) that names every mistake with line and key; name is what
// the file is called in it.
WatchSettings parseWatchSettings(std::string_view text, std::string const& name);

// Throws Error if the file can't be read, and as parseWatchSettings. Signal files are named from its folder.
WatchSettings readWatchSettings(std::string const& file);

// "90s", "2min", "1h", "250ms"; nothing for any other text and for none at all.
std::optional<std::chrono::milliseconds> parseDuration(std::string_view text);

// "voltage", or "every 30min". False, with the settings untouched, for any other text.
bool parseWake(std::string_view text, BatterySettings& settings);

// What may stand in topics and labels: letters, digits, '_' and '-'.
bool isVehicleName(std::string_view text);

} // namespace velmora
