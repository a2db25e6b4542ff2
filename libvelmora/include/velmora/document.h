#pragma once

#include <velmora/export.h>
#include <velmora/print.h>
#include <velmora/report.h>

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>

/// A whole report to be handed over: as a page, as Markdown, as plain text, as JSON.

namespace velmora {

/// Whose rule for the OBD part of an inspection a report is held against.
enum class InspectionRule : std::uint8_t
{
    None,
    UsEpa,        ///< "us-epa"
    UsCalifornia, ///< "us-california"
    UkMot,        ///< "uk-mot"
    DeAu,         ///< "de-au"
};

/// By its name, "none" too. Nothing for any other text.
VELMORA_EXPORT std::optional<InspectionRule> parseInspectionRule(std::string const& text);

/// What the vehicle does not tell of a report.
struct DocumentOptions
{
    std::chrono::system_clock::time_point made = std::chrono::system_clock::now(); ///< shown in local time
    std::string port = {};    ///< where the adapter was; not shown if empty
    std::string vehicle = {}; ///< the owner's name of it; may be empty
    bool maskVin = false;     ///< shows the last six characters of the VIN, which name the car, as zeros
    InspectionRule inspection = InspectionRule::None; ///< what the report suggests for an inspection, if not None
    std::optional<int> modelYear = {}; ///< for the rules of the USA; by the VIN if empty, where it tells it for sure
};

/// Headings and aligned columns: adapter and bus, what is wrong with the whole vehicle, then all that each module told.
VELMORA_EXPORT std::string toText(VehicleReport const& report, DocumentOptions const& options, TextStyle const& style);
/// VehicleReport::toJson, with what the options add to it.
VELMORA_EXPORT std::string toJson(VehicleReport const& report, DocumentOptions const& options);

/// Whether writeDocument could write that file, which can be told before minutes are spent with the vehicle. Throws
/// Error as it does.
VELMORA_EXPORT void checkDocument(std::string const& file, bool replace = false);
/// Writes a report whole, in the form that the file's ending names: .html, .md, .json or .txt. Throws Error for another
/// ending, for a file that stands already, unless replace, and for one that can't be written.
VELMORA_EXPORT void writeDocument(std::string const& file, VehicleReport const& report, DocumentOptions const& options,
                                  bool replace = false);

} // namespace velmora
