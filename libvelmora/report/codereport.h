#pragma once

#include "libvelmora/report/moduletopic.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/vehicle/makerchoice.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Whether any of the codes means something else with each maker.
bool hasMakersCodes(CodeReport const& report);

// Gives the codes the meanings of that maker.
void applyMaker(CodeReport& report, MakerChoice const& maker);

using ModuleCodes = ModuleTopic<CodeReport>;

// Whether the module told at least one of its lists.
bool hasAnswer(CodeReport const& report);

// "lamp", and for each list its codes, or null and a word for why there are none.
Json toJsonValue(CodeReport const& report);

} // namespace velmora
