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

// Whether the lamp is on, or a code is confirmed or permanent. A pending code is no finding yet.
bool hasFindings(CodeReport const& report);

// Whether the module told at least one of its lists.
bool hasAnswer(CodeReport const& report);

// Whether the module told lamp or confirmed codes, without which no findings mean nothing.
bool canBeChecked(CodeReport const& report);

// What a check would need and the module has, but did not tell: "lamp", "confirmed codes".
std::vector<std::string> untold(CodeReport const& report);

// "lamp", and for each list its codes, or null and a word for why there are none.
Json toJsonValue(CodeReport const& report);

} // namespace velmora
