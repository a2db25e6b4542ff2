#pragma once

#include "libvelmora/report/moduletopic.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/vehicle/makerchoice.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What the vehicle froze when a code was set.
struct FreezeFrame
{
    struct Reading
    {
        std::string name;
        std::optional<std::string> value; // nothing if the module did not tell it
        std::string unit;
    };

    TroubleCode code;
    std::vector<Reading> readings;
};

// One frame of a control module, by number.
struct FreezeReport
{
    unsigned int number;
    bool answered; // whether the module told what its frame holds
    std::optional<FreezeFrame> frame;
};

// Gives the code that set the frame the meaning of that maker.
void applyMaker(FreezeReport& report, MakerChoice const& maker);

inline bool hasAnswer(FreezeReport const& report)
{
    return report.answered;
}

// "frame", "answered" and "freeze", which is null for a frame that holds nothing.
Json toJsonValue(FreezeReport const& report);

} // namespace velmora
