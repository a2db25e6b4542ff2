#pragma once

#include "libvelmora/report/moduletopic.h"

#include <string>
#include <vector>

namespace velmora {

// An on-board test routine.
struct Routine
{
    int id;
    std::string name;
    std::string description;
};

struct RoutinesReport
{
    TopicAnswer answer = TopicAnswer::NotOffered;
    std::vector<Routine> routines; // those that can be run
};

// What a control module said when it was asked to run a routine.
struct RoutineRun
{
    enum class Result
    {
        Accepted,
        Refused,
        NoAnswer,
    };

    Routine routine;
    Result result;
    std::string reason; // of a refusal; empty if the module gave none
};

// "01"
std::string routineId(int id);

// "accepted", "refused" or "no answer".
char const* resultWord(RoutineRun::Result result);

Json toJsonValue(RoutinesReport const& report);

Json toJsonValue(RoutineRun const& run);

} // namespace velmora
