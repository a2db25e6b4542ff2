#pragma once

#include "simulator/peer.h"

namespace obdsim {

enum class BusFamily : int
{
    J1850Pwm,
    J1850Vpw,
    Iso9141,
    Kwp,
    Can11,
    Can29
};

/// How a bus is woken before the first request.
enum class BusInit : int
{
    None,
    FiveBaud,
    Fast
};

/// One of the OBD bus protocols, under the number that ELM327 adapters give it.
struct Protocol
{
    int number;
    char const* name; ///< as an ELM327 prints it
    BusFamily family;
    int kilobaud;
    BusInit init;
    Time probe;    ///< what trying this protocol costs during a search
    Time frameGap; ///< between two frames of one module
    Time byteTime; ///< of a byte on the wire; not used on CAN, whose frames are counted in bits
};

/// From the end of the last byte on a K line to the next request: P3 of ISO 14230-2, at least 55 ms, 59 ms on average
/// with an ELM327 (data sheet v2.1, page 71).
constexpr Time requestGap = Ms(59);

/// The protocol of that number (1 to 9), null for any other number.
Protocol const* findProtocol(int number);

bool isCan(Protocol const& protocol);

/// ISO 9141-2 and ISO 14230-4.
bool isKLine(Protocol const& protocol);

/// How long a message of an adapter keeps a bus other than CAN busy. On a K line the adapter leaves P4 between its
/// bytes.
Time sendingTime(Protocol const& protocol, std::size_t bytes);

/// The same for a message of a module, which leaves no gap.
Time receivingTime(Protocol const& protocol, std::size_t bytes);

/// A CAN frame with that many data bytes, without its stuff bits.
Time canFrameTime(Protocol const& protocol, std::size_t dataBytes);

} // namespace obdsim
