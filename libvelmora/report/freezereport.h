#pragma once

#include "libvelmora/report/moduletopic.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/vehicle/makerchoice.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Gives the code that set the frame the meaning of that maker.
void applyMaker(FreezeReport& report, MakerChoice const& maker);

inline bool hasAnswer(FreezeReport const& report)
{
    return report.answer == TopicAnswer::Read;
}

// "frame", "answered", "answer" and "freeze", which is null for a frame that holds nothing.
Json toJsonValue(FreezeReport const& report);

} // namespace velmora
