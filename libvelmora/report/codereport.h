#pragma once

#include "libvelmora/report/moduletopic.h"
#include "libvelmora/report/troublecode.h"
#include "libvelmora/vehicle/makerchoice.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

enum class CodeKind : int
{
    Confirmed, // stored, and as a rule the reason for the lamp
    Pending,   // seen in this or the last driving cycle
    Permanent, // not to be cleared by a tool
};

// What a control module tells of its codes of one kind.
struct CodeList
{
    enum class Answer : int
    {
        Read,
        Refused,
        Silent,
        Unreadable,
    };

    CodeKind kind;
    Answer answer;
    std::string reason; // of a refusal
    std::vector<TroubleCode> codes;
};

struct CodeReport
{
    std::optional<bool> lamp; // whether the malfunction indicator is on
    std::vector<CodeList> lists;
    MakerChoice maker = {}; // whose meanings the codes are given
};

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

// "lamp", and for each list its codes, or null and a word for why there are none.
Json toJsonValue(CodeReport const& report);

} // namespace velmora
