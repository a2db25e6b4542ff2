#pragma once

#include <velmora/history.h>

#include <string>

namespace velmora {

// One module in both scans, and where its changes go.
struct ModulePair
{
    ModuleReport const& older;
    ModuleReport const& newer;
    std::string name; // "7E8 ECM"
    bool cleared;     // whether codes were cleared between the scans
    std::vector<Change>& list;

    void add(char const* kind, ChangeWeight weight, std::string what, std::string item, std::string before,
             std::string after) const
    {
        list.push_back({kind, weight, name, std::move(what), std::move(item), std::move(before), std::move(after)});
    }
};

// The results of on-board tests: new values, and results that left their limits or came back.
void compareTests(ModulePair const& pair);

} // namespace velmora
