#pragma once

#include "libvelmora/channel/adapterstate.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Where a request goes beside the broadcast to all modules, and how its answer is heard. Texts are hexadecimal digits;
// what is empty or 0 stays as the adapter has it.
struct RequestAddress
{
    std::string header{};     // 3 digits: CAN 11 bit; 8, or the last 6 of 18xxxxxx: CAN 29 bit; 6: of a legacy bus
    std::string reply{};      // identifier of the answer, X for any digit; wanted on CAN where the pair is none of
                              // ISO 15765-4
    std::string extended{};   // CAN: address byte in front of all that is sent; with it, its frames hold a byte less
    std::string tester{};     // CAN: the one in front of the answer's frames
    std::string flowHeader{}; // CAN: own flow control, for pairs that are none of ISO 15765-4 ...
    std::string flowData{};   // ... such as "300000"
    unsigned int waitMs = 0;  // that an answer may take: 5 to 1040
    bool adaptive = true;     // the adapter may shorten that time by what it has seen
    // It is set once for several requests, until one goes elsewhere; the adapter then waits as long as the library
    // wants, or waitMs.
    bool stays = false;

    bool operator==(RequestAddress const&) const = default;
};

// A command to the adapter, and another one for adapters that do not know it.
struct AddressStep
{
    std::string command;
    std::string otherwise;

    bool operator==(AddressStep const&) const = default;
};

// One thing that an address changes: how, and how it is taken back; the latter may be empty.
struct AddressChange
{
    std::string set;
    AddressStep restore;
};

// What sets an address on a bus, in its order. What the adapter has confirmed to the library is what is given back;
// wait is the ATST that is in force. Nothing for an address that is none of this bus.
std::vector<AddressChange> addressChanges(RequestAddress const& address, AdapterState const& state,
                                          std::string const& wait);

// In which order settings are given back: whose answers are taken before whom is asked, how long at last.
int restoreOrder(std::string const& command);

// What two commands have in common that set the same: "ATSH", "ATFCSD".
std::string addressWord(std::string const& command);

// Where a control module listens alone, by the identifier of its replies (ISO 15765-4): 7E0 for 7E8, 18DA10F1 for
// 18DAF110. Nothing for other modules and buses.
std::optional<RequestAddress> physicalAddress(BusKind bus, unsigned int module);

} // namespace velmora
