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
    bool lengths = false;      ///< ATD1: the data length code behind CAN identifiers
    bool formatting = true;    ///< ATCAF1: the adapter handles PCI bytes
    bool flowControl = true;   ///< ATCFC1: the adapter sends the flow control frames
    bool longMessages = false; ///< ATAL: eight data bytes
    bool responses = true;     ///< ATR1: wait for answers
    int timeoutTicks = 0;      ///< ATST; 0 for the default
    int defaultTicks = 0x32;   ///< of this adapter
    int adaptiveTiming = 1;
    std::optional<Bytes> header;  ///< ATSH: two, three or four bytes
    std::uint8_t priority = 0x18; ///< ATCP, first byte of 29-bit headers of three bytes
    std::optional<std::uint32_t> canFilter;
    std::optional<std::uint32_t> canMask;
    std::optional<std::uint8_t> extendedAddress; ///< ATCEA
    std::uint8_t testerAddress = 0xF1;           ///< ATTA
    int flowMode = 0;                            ///< ATFCSM
    std::optional<std::uint32_t> flowHeader;     ///< ATFCSH
    Bytes flowData;                              ///< ATFCSD
    std::optional<std::uint8_t> receiveAddress;  ///< ATSR, the buses without CAN
    Time baudWait = Ms(75);                      ///< ATBRT

    /// In steps of 4.096 ms (ELM327 data sheet v2.1, page 69, programmable parameter 03).
    Time timeout() const { return std::chrono::microseconds(4096) * (timeoutTicks == 0 ? defaultTicks : timeoutTicks); }
};

} // namespace obdsim
