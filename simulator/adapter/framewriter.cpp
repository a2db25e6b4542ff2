#include "simulator/adapter/framewriter.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr std::uint8_t singleFrame = 0x0;
constexpr std::uint8_t firstFrame = 0x1;

std::uint8_t kind(Frame const& frame)
{
    return static_cast<std::uint8_t>(frame.data.empty() ? 0 : frame.data[0] >> 4);
}

Bytes from(Bytes const& data, std::size_t index)
{
    return {data.begin() + static_cast<std::ptrdiff_t>(std::min(index, data.size())), data.end()};
}

} // namespace

FrameWriter::FrameWriter(Protocol const& protocol, Settings const& settings, Quirks const& quirks)
    : m_protocol(protocol), m_settings(settings), m_quirks(quirks)
{}

std::string FrameWriter::lines(Frame const& frame) const
{
    std::string const once = isCan(m_protocol) ? canLines(frame) : serialLine(frame);
    return m_quirks.has(Quirk::FramesTwice) ? once + once : once;
}

std::string FrameWriter::canLines(Frame const& frame) const
{
    bool const formatting = m_settings.formatting || m_quirks.has(Quirk::FormattingStuck);
    if (!headersShown()) {
        return formatting ? formattedCan(frame) : text(frame.data) + "\r";
    }
    // A genuine ELM327 prints every byte that it has received, the padding too (data sheet v2.1, page 41).
    bool const cut = formatting && m_quirks.has(Quirk::PaddingCut);
    Bytes const data = cut ? withoutPadding(frame.data) : frame.data;
    return header(frame) + text(data) + "\r";
}

/// Headers off: the PCI bytes become a length line and line numbers.
std::string FrameWriter::formattedCan(Frame const& whole) const
{
    Frame frame = whole;
    if (m_settings.extendedAddress) {
        frame.data = from(frame.data, 1);
    }
    if (kind(frame) == singleFrame) {
        return text(from(withoutPadding(frame.data), 1)) + "\r";
    }
    std::string const blank = m_settings.spaces ? " " : "";
    if (kind(frame) == firstFrame) {
        auto const length = static_cast<std::uint32_t>((frame.data[0] & 0x0F) << 8 | frame.data[1]);
        return hexNumber(length, 3) + "\r0:" + blank + text(from(frame.data, 2)) + "\r";
    }
    auto const number = static_cast<std::uint32_t>(frame.data[0] & 0x0F);
    return hexNumber(number, 1) + ":" + blank + text(from(frame.data, 1)) + "\r";
}

std::string FrameWriter::serialLine(Frame const& frame) const
{
    if (!headersShown()) {
        return text(frame.data) + "\r";
    }
    Bytes all = frame.header;
    all.insert(all.end(), frame.data.begin(), frame.data.end());
    if (frame.checksum) {
        all.push_back(*frame.checksum);
    }
    return text(all) + "\r";
}

/// The identifier of a CAN frame: three digits for 11 bits, four bytes for 29.
std::string FrameWriter::header(Frame const& frame) const
{
    std::string const blank = m_settings.spaces ? " " : "";
    std::string id = m_protocol.family == BusFamily::Can11 ? hexNumber(frame.source, 3) + blank : text(frame.header);
    if (!m_settings.lengths) {
        return id;
    }
    return id + hexNumber(static_cast<std::uint32_t>(frame.data.size()), 1) + blank;
}

std::string FrameWriter::text(Bytes const& bytes) const
{
    std::string const separator = m_quirks.has(Quirk::BytePerLine) ? "\r" : m_settings.spaces ? " " : "";
    std::string line;
    for (auto const byte : bytes) {
        line += hexByte(byte) + separator;
    }
    if (separator == "\r" && !line.empty()) {
        line.pop_back();
    }
    return line;
}

/// The adapter cuts a single frame to the length in its PCI byte, and prints
/// consecutive frames as they come.
Bytes FrameWriter::withoutPadding(Bytes const& data) const
{
    if (data.empty() || data[0] >> 4 != singleFrame || m_quirks.has(Quirk::PaddingShown)) {
        return data;
    }
    std::size_t const size = std::min<std::size_t>(data.size(), 1 + (data[0] & 0x0FU));
    return {data.begin(), data.begin() + static_cast<std::ptrdiff_t>(size)};
}

bool FrameWriter::headersShown() const
{
    return m_settings.headers || m_quirks.has(Quirk::HeadersStuck);
}

} // namespace obdsim
