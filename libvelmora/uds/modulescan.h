#pragma once

#include "libvelmora/uds/foundmodule.h"
#include "libvelmora/uds/moduleasker.h"

#include <functional>
#include <set>
#include <string>
#include <vector>

namespace velmora {

// How a scan goes.
struct ScanProgress
{
    std::size_t done = 0;
    std::size_t all = 0;
    std::size_t found = 0;
};

// Looks for control modules beyond OBD: listens which identifiers are in use, then asks each of the others whether a
// module is there. It only reads, but it asks identifiers that no driver asks.
class ModuleScan
{
public:
    // check is called between requests; it throws to end the scan. progress may be null. The asker must outlive it.
    ModuleScan(ModuleAsker& asker, std::function<void()> check, std::function<void(ScanProgress const&)> progress);

    // In rising order of the request's identifier. Throws Error if the bus is no CAN, the vehicle moves, or the bus is
    // in trouble.
    std::vector<FoundModule> find();

private:
    std::set<unsigned int> listen();
    std::vector<unsigned int> candidates(std::set<unsigned int> const& heard) const;
    ModuleAnswer ask(unsigned int id);

    ModuleAsker& m_asker;
    std::function<void()> const m_check;
    std::function<void(ScanProgress const&)> const m_progress;
    bool const m_long; // identifiers of 29 bits
};

} // namespace velmora
