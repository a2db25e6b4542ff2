#pragma once

#include "simulator/bus/protocol.h"
#include "simulator/bytes.h"

#include <optional>

namespace obdsim {

/// One frame as it passes on the bus.
struct Frame
{
    std::uint32_t source = 0;             ///< CAN identifier, or the address of the sender
    Bytes header;                         ///< identifier bytes, or format/priority, target, source
    Bytes data;                           ///< with the PCI bytes and the padding on CAN
    std::optional<std::uint8_t> checksum; ///< last byte on the buses without CAN
};

/// Whom a request is for.
struct Target
{
    bool everyone = false;                    ///< functional addressing
    std::uint32_t module = 0;                 ///< otherwise: the id under which that module answers
    std::uint32_t identifier = 0;             ///< on CAN: of the request
    std::optional<std::uint8_t> address = {}; ///< extended address of the request
};

/// Value of the bytes that fill a CAN frame up to eight; none: short frames.
using Padding = std::optional<std::uint8_t>;

/// The header of a request to all modules: 7DF, 18 DB 33 F1, 68 6A F1, ...
Bytes functionalHeader(Protocol const& protocol);

/// The reading of a request header: 11-bit identifiers are two bytes, 29-bit
/// ones four, the others three. Nothing if no OBD module would listen to it.
std::optional<Target> targetOf(Protocol const& protocol, Bytes const& header);

/// The frames in which a module sends `payload`.
/// `everyone`: the request had been to all modules. `padding` matters on CAN only.
/// `tester`: first byte of each frame of a module with an extended address.
std::vector<Frame> frameReply(Protocol const& protocol, std::uint32_t source, bool everyone, Bytes const& payload,
                              Padding padding, std::optional<std::uint8_t> tester = std::nullopt);

/// The service bytes of a request's CAN data field (ISO 15765-2 single frame);
/// nothing if it is no single frame.
std::optional<Bytes> unwrapSingleFrame(Bytes const& data);

} // namespace obdsim
