#pragma once

#include <obd/iecu.h>

#include <map>
#include <vector>

namespace obd {

// Log why a reply can't be used. They return false, to be handed on by the reader of the reply.
bool refuseLength(std::vector<unsigned char> const& data);
bool refuse(char const* reason);

// Tells the log of a question about a module that delivered nothing.
void logUnknownEcu(IEcu const& ecu);

// What is stored for the module, null with a log line if there is nothing.
template <typename T>
T const* findOrLog(std::map<unsigned int, T> const& records, IEcu const& ecu)
{
    auto const found = records.find(ecu.id());
    if (found == records.end()) {
        logUnknownEcu(ecu);
        return nullptr;
    }
    return &found->second;
}

// The same for a store of which nobody is surprised when it is empty: a module need not have the item.
template <typename T>
T findOrEmpty(std::map<unsigned int, T> const& records, IEcu const& ecu)
{
    auto const found = records.find(ecu.id());
    return found != records.end() ? found->second : T();
}

} // namespace obd
