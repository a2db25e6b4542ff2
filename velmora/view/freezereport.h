#pragma once

#include "velmora/view/troublecode.h"

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

struct ModuleFreeze
{
    unsigned int id;
    std::string name;
    bool offered; // whether the module told what its frame holds
    std::optional<FreezeFrame> frame;
};

std::string toText(std::vector<ModuleFreeze> const& modules, unsigned int frame);
std::string toJson(std::vector<ModuleFreeze> const& modules, unsigned int frame);

} // namespace velmora
