#pragma once

#include <velmora/actions.h>
#include <velmora/export.h>
#include <velmora/topics.h>
#include <velmora/troublecode.h>
#include <velmora/vin.h>

#include <cstddef>
#include <string>
#include <vector>

/// What a car told, topic by topic, as a text for people and as the JSON that docs/json.md describes. A whole report is
/// in <velmora/document.h>; each value can be printed with `<<`, too, in a line or a few.

namespace velmora {

/// How a text for people is drawn.
struct TextStyle
{
    bool coloured = false;   ///< with the sequences that switch a terminal's colours
    bool detailed = false;   ///< with what few ask for, such as all meanings of a code
    std::size_t columns = 0; ///< how wide a line may be; 0 where that does not matter
};

/// Indented lines under the heading of each control module, as for all topics.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<CodeReport>> const& modules, TextStyle const& style);
/// Each counter with its number.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<CountersReport>> const& modules, TextStyle const& style);
/// The code that a frame is of, and the values.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<FreezeReport>> const& modules, TextStyle const& style);
/// A line for each text, with a dash for one that was not told.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<InfoReport>> const& modules, TextStyle const& style);
/// A summary, then the tests by monitor; what failed comes first.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<MonitorsReport>> const& modules, TextStyle const& style);
/// The sensors with their places, and below each its tests.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<OxygenReport>> const& modules, TextStyle const& style);
/// A verdict, then the monitors: what is not complete first.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<ReadinessReport>> const& modules, TextStyle const& style);
/// The routines with what they do.
VELMORA_EXPORT std::string toText(std::vector<ModuleTopic<RoutinesReport>> const& modules, TextStyle const& style);
/// What became of a run.
VELMORA_EXPORT std::string toText(ModuleTopic<RoutineRun> const& run, TextStyle const& style);
/// All meanings of a code, a line each with its maker.
VELMORA_EXPORT std::string toText(TroubleCode const& code);
/// What a vehicle identification number says, a line each.
VELMORA_EXPORT std::string toText(VinFacts const& facts, TextStyle const& style);

/// An array with an object for each control module, as for all topics; ends in a line feed.
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<ClearReport>> const& modules);
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<CodeReport>> const& modules);      ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<CountersReport>> const& modules);  ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<FreezeReport>> const& modules);    ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<InfoReport>> const& modules);      ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<MonitorsReport>> const& modules);  ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<OxygenReport>> const& modules);    ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<ReadinessReport>> const& modules); ///< as of all topics
VELMORA_EXPORT std::string toJson(std::vector<ModuleTopic<RoutinesReport>> const& modules);  ///< as of all topics
/// An array of one object: what became of a run.
VELMORA_EXPORT std::string toJson(ModuleTopic<RoutineRun> const& run);
/// An array with an object for each code and all its meanings.
VELMORA_EXPORT std::string toJson(std::vector<TroubleCode> const& codes);
/// One object.
VELMORA_EXPORT std::string toJson(VinFacts const& facts);

} // namespace velmora
