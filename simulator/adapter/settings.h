#pragma once

#include "simulator/bytes.h"
#include "simulator/peer.h"

namespace obdsim {

/// What AT commands set, with its value after power-up.
struct Settings
{
    bool echo = true;
    bool linefeeds = false;
    bool spaces = true;
    bool headers = false;
    bool lengths = false;    ///< ATD1: the data length code behind CAN identifiers
    bool formatting = true;  ///< ATCAF1: the adapter handles PCI bytes
    bool flowControl = true; ///< ATCFC1: the adapter sends the flow control frames
    bool responses = true;   ///< ATR1: wait for answers
    int timeoutTicks = 0x32; ///< ATST, in steps of 4 ms
    int adaptiveTiming = 1;
    std::optional<Bytes> header;  ///< ATSH: two, three or four bytes
    std::uint8_t priority = 0x18; ///< ATCP, first byte of 29-bit headers of three bytes
    std::optional<std::uint32_t> canFilter;
    std::optional<std::uint32_t> canMask;
    std::optional<std::uint8_t> receiveAddress; ///< ATSR, the buses without CAN
    Time baudWait{75};                          ///< ATBRT

    Time timeout() const { return Time(timeoutTicks == 0 ? 0x32 * 4 : timeoutTicks * 4); }
};

} // namespace obdsim
