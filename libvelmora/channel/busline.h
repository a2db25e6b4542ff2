#pragma once

#include <obd/obdprotocol.h>

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// How frames look, headers shown.
enum class BusKind : int
{
    Unknown,
    J1850, // PWM and VPW
    Iso9141,
    Kwp,
    Can11,
    Can29
};

BusKind busKindOf(obd::ObdProtocol protocol);
// Of the adapter's protocol numbers; Unknown where none has that one.
BusKind busKindOf(int protocol);
bool isCanBus(BusKind bus);

// One whole frame.
struct BusLine
{
    unsigned int module = 0;         // who sent it
    std::string header;              // its digits
    std::vector<std::uint8_t> bytes; // all bytes behind the header: on CAN from the PCI on, else with the check byte

    enum class Kind : int
    {
        Single, // of its own; all frames of the legacy buses are
        First,
        Consecutive
    };
    Kind kind = Kind::Single;
    // The bytes of the service: without PCI, filling and check byte.
    std::vector<std::uint8_t> payload;
};

// Reads a line of digits, blanks removed. Nothing if it is no whole frame: half a byte, fewer bytes than the PCI or the
// KWP length tell, a kind that no module sends. A consecutive frame may be shorter than eight bytes; whether it is
// whole its first frame tells. extended: on CAN an address byte stands in front of the PCI; it is left out.
std::optional<BusLine> parseBusLine(BusKind bus, std::string_view digits, bool extended = false);

// Whether the check byte at the end of a legacy line is right.
bool hasRightCheckByte(BusKind bus, std::string_view digits);

std::string frameDigits(std::vector<std::uint8_t> const& bytes);

} // namespace velmora
