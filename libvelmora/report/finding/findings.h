#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <cstdint>
#include <string>
#include <vector>

namespace velmora {

enum class Severity : std::uint8_t
{
    Note,    // worth a look
    Warning, // not known to be right yet
    Bad,
};

// Where in a report the data stands that a finding rests on.
enum class DataTopic : std::uint8_t
{
    Adapter, // of no module
    Info,
    Codes,
    Readiness,
    Values,
    Monitors,
    Oxygen,
    Supported, // the sets of what the module supports
};

struct Evidence
{
    DataTopic topic;
    unsigned int module = 0; // id
    std::string text = {};   // empty where the finding says it all
};

// Something that is wrong, or not known to be right yet, or that the data suggests.
struct Finding
{
    Severity severity;
    std::string module; // "7E8 ECM"
    std::string what;   // such as "confirmed, permanent"
    std::string text;
    char const* kind; // the same in all languages and versions: "codes-cleared-recently"
    std::vector<Evidence> evidence;
    std::vector<std::string> otherwise = {}; // what else may lie behind it
};

// Whether the finding was not told by the vehicle but worked out, so that it may be wrong.
inline bool isSuggestion(Finding const& finding)
{
    return !finding.otherwise.empty();
}

// All of a vehicle. First what it told: lamps, codes, failed tests and what has not been tested; then what the data
// suggests.
std::vector<Finding> findings(VehicleReport const& report);

// "note", "warning" or "bad", for programs.
char const* severityKey(Severity severity);

// Where the data stands: "codes-7E8" in pages, "/modules/0/codes" in the JSON document.
std::string anchorOf(Evidence const& evidence);
std::string pointerTo(Evidence const& evidence, VehicleReport const& report);

Json toJsonValue(std::vector<Finding> const& findings, VehicleReport const& report);

} // namespace velmora
