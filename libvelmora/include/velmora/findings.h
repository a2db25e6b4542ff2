#pragma once

#include <velmora/export.h>
#include <velmora/report.h>

#include <cstdint>
#include <string>
#include <vector>

/// What a report means: what is wrong with a vehicle, by what it told and by what the data suggests.

namespace velmora {

/// How much a finding matters.
enum class Severity : std::uint8_t
{
    Note,    ///< worth a look
    Warning, ///< not known to be right yet
    Bad,
};

/// Where in a report the data stands that a finding rests on.
enum class DataTopic : std::uint8_t
{
    Adapter, ///< of no module
    Info,
    Codes,
    Readiness,
    Values,
    Monitors,
    Oxygen,
    Supported, ///< the sets of what the module supports
};

/// What a finding rests on.
struct Evidence
{
    DataTopic topic;         ///< where it stands
    unsigned int module = 0; ///< id of the control module
    std::string text = {};   ///< empty where the finding says it all
};

/// Something that is wrong, or not known to be right yet, or that the data suggests.
struct Finding
{
    Severity severity;                       ///< how much it matters
    std::string module;                      ///< "7E8 ECM"
    std::string what;                        ///< such as "confirmed, permanent"
    std::string text;                        ///< the finding
    char const* kind;                        ///< the same in all languages and versions: "codes-cleared-recently"
    std::vector<Evidence> evidence;          ///< what it rests on
    std::vector<std::string> otherwise = {}; ///< what else may lie behind it
};

/// Whether the finding was not told by the vehicle but worked out, so that it may be wrong.
inline bool isSuggestion(Finding const& finding)
{
    return !finding.otherwise.empty();
}

/// All of a vehicle. First what it told: lamps, codes, failed tests and what has not been tested; then what the data
/// suggests.
VELMORA_EXPORT std::vector<Finding> findings(VehicleReport const& report);

/// Whether the lamp is on, or a code is confirmed or permanent. A pending code is no finding yet.
VELMORA_EXPORT bool hasFindings(CodeReport const& report);
/// Whether the module told lamp or confirmed codes, without which no findings mean nothing.
VELMORA_EXPORT bool canBeChecked(CodeReport const& report);
/// What a check would need and the module has, but did not tell: "lamp", "confirmed codes".
VELMORA_EXPORT std::vector<std::string> untold(CodeReport const& report);

} // namespace velmora
