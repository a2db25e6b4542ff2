#pragma once

#include <obd/obdprotocol.h>

#include <chrono>
#include <cstddef>

namespace velmora {

// What a user asks of the poller.
struct PollWill
{
    bool fast = false;              // as fast as the bus allows: too much traffic has upset modules, so never unasked
    std::size_t pidsPerRequest = 6; // at most; with fast only
};

// How hard a vehicle may be asked.
struct PollPace
{
    std::chrono::milliseconds floor{30}; // from the start of a request that succeeded to the next one
    std::chrono::milliseconds gap{0};    // from the start of any request to the next one
    std::size_t pidsPerRequest = 1;
    bool addresses = false; // one module's values may be asked for at its own address
};

// Several PIDs a request and modules' own addresses go with the highest speed on CAN only. K lines keep their floor,
// and take one PID a request as SAE J1850 does: only ISO 15765-4 has a rule for more. On SAE J1850 old modules must not
// be asked more often than each 100 ms; modelYear is 0 where it is not known.
PollPace choosePace(PollWill const& will, obd::ObdProtocol protocol, int modelYear);
// For a vehicle of which nobody wants speed and nobody has asked the model year.
PollPace carefulPace(obd::ObdProtocol protocol);

} // namespace velmora
