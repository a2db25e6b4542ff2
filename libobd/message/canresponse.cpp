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

// Modulo 2^32, as the slots are counted.
std::uint32_t slotOffset(std::uint32_t slot)
{
    return firstFrameData + consecutiveFrameData * slot;
}

// A log record is large, and a function that holds one has its stack guarded and checked at each call. These stand
// apart so that no frame pays for it that is as it should be.
[[gnu::noinline]] int notEnoughData()
{
    TERVEX_LOG(Error) << "Not enough data";
    return rejected;
}

[[gnu::noinline]] int noFirstFrame()
{
    TERVEX_LOG(Error) << "Consecutive frame received before FF";
    return rejected;
}

[[gnu::noinline]] int tooMuchData(std::uint32_t offset, std::uint32_t size)
{
    TERVEX_LOG(Error) << "Too much data incoming (" << offset << ") vs length info (" << size << ")";
    return rejected;
}

} // namespace

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
    m_slots.expect(expected);
    m_payload.resize(m_length);
    copyInto(m_payload, 0, slice(frame, 2, firstFrameData));
    m_received = firstFrameData;
    return FrameBytes;
}

int CanResponse::parseConsecutive(ByteView frame)
{
    if (m_payload.empty()) {
        return noFirstFrame();
    }
    std::uint32_t const offset = slotOffset(m_slots.claim(lowNibble(byteAt(frame, 0))));
    auto const size = static_cast<std::uint32_t>(m_payload.size());
    if (size < offset) {
        return tooMuchData(offset, size);
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

} // namespace obd
