#pragma once

#include "libvelmora/uds/moduleasker.h"
#include "libvelmora/uds/udscodes.h"

#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace velmora {

// A control module as it was found, and what it tells of itself. Texts are empty where it told none.
struct FoundModule
{
    std::string request; // identifier, hexadecimal
    std::string reply;
    std::string name;                                     // F197
    std::string part;                                     // F187
    std::string software;                                 // F189, else F195
    std::optional<unsigned int> codes;                    // how many trouble codes matter; nothing if it does not tell
    std::map<unsigned int, std::string> identifiers = {}; // F180 to F19F, where they were asked for: those it told
};

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
    // Asks a module what it is and how many codes it has.
    void identify(FoundModule& module);
    // Asks for all standard identifiers.
    void readIdentifiers(FoundModule& module);

private:
    std::set<unsigned int> listen();
    std::vector<unsigned int> candidates(std::set<unsigned int> const& heard) const;
    std::optional<FoundModule> ask(unsigned int id, ModuleAnswer::Kind& kind);
    std::string text(RequestAddress const& address, unsigned int did);

    ModuleAsker& m_asker;
    std::function<void()> const m_check;
    std::function<void(ScanProgress const&)> const m_progress;
    bool const m_long; // identifiers of 29 bits
};

} // namespace velmora
