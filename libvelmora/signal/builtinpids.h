#pragma once

#include "libvelmora/signal/signal.h"

#include <cstddef>
#include <optional>
#include <string_view>
#include <vector>

namespace velmora {

// How well the layout of a PID's data is known: SAE J1979-DA itself is not at hand.
enum class PidStanding
{
    Recorded,   // replies of cars agree with it
    Replies,    // the layout was worked out from replies of cars
    Agreed,     // several public lists say so
    Listed,     // one public list says so
    Unverified, // nobody says so for sure: not decoded
    NameOnly,   // no layout is known
};

// A value in the reply to a PID of service 01 that the core does not decode.
struct BuiltinPid
{
    unsigned char pid = 0;
    std::size_t length = 0; // of the data, 0 if it is not known; a reply of another length tells nothing
    PidStanding standing = PidStanding::NameOnly;
    Signal signal;                        // its formula is missing where it is not decoded
    std::optional<FormulaNode> supported; // 0: the module does not tell this value
};

// In rising order of PID.
std::vector<BuiltinPid> const& builtinPids();

// Whether the value is shown when its PID is asked for.
bool isDecoded(BuiltinPid const& pid);

// "recorded", "one source", and so on: how well a value is known, for people.
std::string_view standingWord(PidStanding standing);

} // namespace velmora
