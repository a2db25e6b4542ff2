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
};

/// The protocol of that number (1 to 9), null for any other number.
Protocol const* findProtocol(int number);

bool isCan(Protocol const& protocol);

} // namespace obdsim
