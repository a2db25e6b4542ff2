#pragma once

#include <velmora/export.h>
#include <velmora/topics.h>

#include <iosfwd>
#include <string>
#include <vector>

/// What a tool may make a vehicle do.

namespace velmora {

/// An on-board test routine of service 08.
struct Routine
{
    int id;                  ///< 0 to 255
    std::string name;        ///< "Evaporative system leak test"
    std::string description; ///< what the routine does
};

/// The routines of one control module that can be run: those that it offers and that are known here. What another one
/// does, nobody can be warned of.
struct RoutinesReport
{
    TopicAnswer answer = TopicAnswer::NotOffered; ///< whether the module told its routines
    std::vector<Routine> routines;                ///< those that can be run
};

/// What a control module said when it was asked to run a routine.
struct RoutineRun
{
    /// What became of the run.
    enum class Result
    {
        Accepted,
        Refused,
        NoAnswer,   ///< it may run all the same
        Unreadable, ///< it answered in a form that can't be decoded
    };

    Routine routine;    ///< the one that was asked for
    Result result;      ///< what became of it
    std::string reason; ///< of a refusal, such as "conditions not correct (22)"; empty if the module gave none
};

/// What a control module said when it was asked to clear its trouble codes.
struct ClearReport
{
    /// What became of the clearing.
    enum class Result
    {
        Cleared,
        Refused,
        NoAnswer,
        Unreadable, ///< it answered in a form that can't be decoded
    };

    Result result;      ///< what became of it
    std::string reason; ///< of a refusal
};

/// Throws Error unless a module has cleared its codes: Refused if one refused, else VehicleSilent.
VELMORA_EXPORT void requireCleared(std::vector<ModuleTopic<ClearReport>> const& modules);
/// Throws Error if any module refused, with what it said, and as requireCleared does.
VELMORA_EXPORT void requireAllCleared(std::vector<ModuleTopic<ClearReport>> const& modules);
/// Throws Error unless the module said that it runs the routine.
VELMORA_EXPORT void requireAccepted(RoutineRun const& run);

/// "01 Evaporative system leak test"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Routine const& routine);
/// A line for each routine, or why there are none.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, RoutinesReport const& report);
/// "01 Evaporative system leak test: refused: conditions not correct (22)"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, RoutineRun const& run);
/// "cleared", or "refused: conditions not correct (22)"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, ClearReport const& report);

} // namespace velmora
