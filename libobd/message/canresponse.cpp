#include "libobd/message/canresponse.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <algorithm>
#include <array>
#include <utility>

namespace obd {

namespace {

constexpr std::uint32_t firstFrameData = 6;
constexpr std::uint32_t consecutiveFrameData = 7;
constexpr std::uint32_t sequenceNumbers = 16;
constexpr int rejected = -1;

// What modules are known to fill a short frame up with.
constexpr std::array<unsigned char, 4> paddingBytes = {0x00, 0xAA, 0xFF, 0x55};

bool isPadding(unsigned char byte)
{
    return std::find(paddingBytes.begin(), paddingBytes.end(), byte) != paddingBytes.end();
}

unsigned char lowNibble(unsigned char byte)
{
    return byte & 0x0F;
}

std::uint32_t dividedUp(std::uint32_t dividend, std::uint32_t divisor)
{
    return (dividend + divisor - 1) / divisor;
}

// Slot arithmetic is modulo 2^32 on purpose: sequence number 0 stands before slot 0 and must not look like a low
// offset.
std::uint32_t slotOffset(std::uint32_t slot)
{
    return firstFrameData + consecutiveFrameData * slot;
}

int notEnoughData()
{
    TERVEX_LOG(Error) << "Not enough data";
    return rejected;
}

} // namespace

std::size_t CanResponse::reach(unsigned char pci)
{
    bool const isSingle = pci >> 4 == static_cast<int>(CanFrameType::Single);
    return std::max<std::size_t>(FrameBytes, isSingle ? pci + 1U : 0U);
}

int CanResponse::parse(std::vector<unsigned char> const& frame)
{
    return parse(ByteView(frame));
}

int CanResponse::parse(ByteView frame)
{
    if (frame.empty()) {
        return rejected;
    }
    m_frameType = static_cast<CanFrameType>(byteAt(frame, 0) >> 4);
    switch (m_frameType) {
    case CanFrameType::Single:
        return parseSingle(frame);
    case CanFrameType::First:
        return parseFirst(frame);
    case CanFrameType::Consecutive:
        return parseConsecutive(frame);
    }
    return rejected;
}

bool CanResponse::payload(std::vector<unsigned char>& out) const&
{
    if (isComplete()) {
        out = m_payload;
    }
    return isComplete();
}

bool CanResponse::payload(std::vector<unsigned char>& out) &&
{
    if (isComplete()) {
        out = std::move(m_payload);
    }
    return isComplete();
}

// The reply's text no longer shows where a line ended, so a short frame's padding is told by its value.
int CanResponse::parseSingle(ByteView frame)
{
    m_length = lowNibble(byteAt(frame, 0));
    if (frame.size() - 1 < m_length) {
        return notEnoughData();
    }
    ByteView const data = slice(frame, 1, m_length);
    m_payload.assign(data.begin(), data.end());
    m_received = m_length;

    std::size_t consumed = m_length + 1;
    while (consumed < FrameBytes && consumed < frame.size() && isPadding(byteAt(frame, consumed))) {
        ++consumed;
    }
    return static_cast<int>(consumed);
}

int CanResponse::parseFirst(ByteView frame)
{
    if (frame.size() < FrameBytes) {
        return notEnoughData();
    }
    m_length = static_cast<std::uint32_t>(lowNibble(byteAt(frame, 0)) << 8 | byteAt(frame, 1));
    if (m_length < firstFrameData) {
        TERVEX_LOG(Error) << "Invalid response length: " << m_length;
        return rejected;
    }
    std::uint32_t const expected = dividedUp(m_length - firstFrameData, consecutiveFrameData);
    tervex::TraceStream << "Expecting " << expected << " CAN CF frames";
    m_slotsFilled.resize(expected);
    m_futileTries.fill(0);
    // Numbers repeat every 16 frames. The rounds are counted by 15, since number 0 spends its first try before slot 0.
    m_sequenceRounds = dividedUp(expected, sequenceNumbers - 1);
    m_payload.resize(m_length);
    copyInto(m_payload, 0, slice(frame, 2, firstFrameData));
    m_received = firstFrameData;
    return FrameBytes;
}

int CanResponse::parseConsecutive(ByteView frame)
{
    if (m_payload.empty()) {
        TERVEX_LOG(Error) << "Consecutive frame received before FF";
        return rejected;
    }
    std::uint32_t const offset = claimOffset(lowNibble(byteAt(frame, 0)));
    auto const size = static_cast<std::uint32_t>(m_payload.size());
    if (size < offset) {
        TERVEX_LOG(Error) << "Too much data incoming (" << offset << ") vs length info (" << size << ")";
        return rejected;
    }
    std::uint32_t count = consecutiveFrameData;
    if (offset + count > size) {
        count = size - offset;
        tervex::TraceStream << "Last CF? Expecting " << count << " payload bytes";
    }
    if (frame.size() < FrameBytes) {
        return notEnoughData();
    }
    copyInto(m_payload, offset, slice(frame, 1, count));
    m_received += count;
    return FrameBytes;
}

// Where the data of a consecutive frame belong: the first free slot whose number modulo 16 is right, which is marked as
// filled. If none is free it is the last one tried.
std::uint32_t CanResponse::claimOffset(unsigned char sequence)
{
    std::uint32_t const firstSlot = sequence - 1U;
    for (unsigned char& tries = m_futileTries[sequence]; tries < m_sequenceRounds; ++tries) {
        std::uint32_t const slot = firstSlot + sequenceNumbers * tries;
        if (slot < m_slotsFilled.size() && !m_slotsFilled[slot]) {
            m_slotsFilled[slot] = true;
            return slotOffset(slot);
        }
    }
    std::uint32_t const lastRound = std::max(m_sequenceRounds, 1U) - 1;
    return slotOffset(firstSlot + sequenceNumbers * lastRound);
}

} // namespace obd
