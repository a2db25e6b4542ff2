#pragma once

#include "libobd/adapter/elmtext.h"

#include <span>
#include <string>
#include <string_view>

namespace obd {

// How an adapter changes its line rate.
enum class BaudRateDialogue : int
{
    Inherited = 0,
    Divisor, // "ATBRD" and the divisor of its 4 MHz, then a confirmation at the new rate
    Code,    // "ATSCS" and the rate's code, without confirmation
    Refused, // not at all
};

// What sets one adapter family apart from all others. What a row leaves empty is as in the last row, which holds for
// every adapter.
struct ElmFamily
{
    std::string_view word;           // stands in the adapter's name, which is compared in upper case
    std::string_view label;          // empty: the family's name tells no version
    unsigned int versionWord;        // which word of the name is the version, from 1
    std::string_view describe;       // command for the description
    std::string_view identify;       // command for the identifier
    std::string_view protocolNumber; // command for the number of the protocol in use
    std::string_view voltage;        // command for the supply voltage
    std::string_view setProtocol;    // command, in front of the protocol number, that stores it
    std::string_view tryProtocol;    // the same without storing it
    bool echoesProtocol;             // answers a protocol command with the number and "=" rather than "OK"
    BaudRateDialogue baudRate;
};

// Stands in the name of a genuine ELM adapter and of its many copies.
inline constexpr std::string_view elmFamilyWord = "ELM";

std::span<ElmFamily const> elmFamilies();

// The family that a name line is read as; null for an unknown adapter.
ElmFamily const* recogniseFamily(std::string const& nameLine);

// What holds for the adapter of that name. The name may hold the words of two families, such as an "ELM327" made by
// Diamex: each trait comes from the family that sets it.
template <typename T>
T familyTrait(std::string const& device, T ElmFamily::*trait)
{
    std::string const name = toUpper(device);
    for (ElmFamily const& family : elmFamilies()) {
        if (family.*trait != T{} && hasResponse(name, family.word)) {
            return family.*trait;
        }
    }
    return T{};
}

// Whether a reply to the identity command comes from a live adapter: it holds a family's word, or is just long enough.
bool isInterfaceSupported(std::string const& reply);

} // namespace obd
