#pragma once

#include "libobd/bytes/bytes.h"
#include "libobd/message/canslots.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace obd {

// The frame type in the high nibble of an ISO 15765-2 PCI byte. The adapter does the flow control itself, so values
// above 2 are no frames to us.
enum class CanFrameType : unsigned char
{
    Single = 0,
    First = 1,
    Consecutive = 2,
};

// The ISO 15765-2 message of one control module within one reply, put together from its frames. Consecutive frames are
// placed by their sequence number, so they may come out of order. One thread.
class CanResponse
{
public:
    // The data bytes of a CAN frame.
    static constexpr std::size_t FrameBytes = 8;

    // No frame looks at more bytes than this: a PCI byte and the up to 15 that its nibble can tell.
    static constexpr std::size_t MaxFrameBytes = 16;

    // How many bytes a frame that begins with this PCI byte looks at: those of a CAN frame, unless it tells more.
    static std::size_t reach(unsigned char pci)
    {
        bool const isSingle = pci >> 4 == static_cast<int>(CanFrameType::Single);
        return isSingle ? std::max<std::size_t>(FrameBytes, pci + 1U) : FrameBytes;
    }

    // Takes in the frame at the start of the bytes, which begin with its PCI byte and may go on with other frames.
    // Returns how many bytes the frame took, or -1, mostly with a log line, if it is none or does not fit.
    int parse(std::vector<unsigned char> const& frame);
    int parse(ByteView frame);

    // True, with the message in out, if as many bytes came in as the message has; else out is left alone. A message of
    // which no frame was accepted counts as a complete empty one.
    bool payload(std::vector<unsigned char>& out) const&;
    // The same for a message that is not needed any more: moves it out.
    bool payload(std::vector<unsigned char>& out) &&;

private:
    int parseSingle(ByteView frame);
    int parseFirst(ByteView frame);
    int parseConsecutive(ByteView frame);
    bool isComplete() const { return m_length == m_received; }

    CanFrameType m_frameType{};
    std::uint32_t m_length = 0;
    std::uint32_t m_received = 0; // a sum: a repeated frame counts again
    std::vector<unsigned char> m_payload;
    CanSlots m_slots;
};

} // namespace obd
