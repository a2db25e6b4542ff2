#include "libvelmora/channel/busline.h"

#include "libvelmora/channel/elmcommand.h"

#include <obd/connectionprotocol.h>

#include <algorithm>

namespace velmora {

namespace {

using FrameBytes = std::vector<std::uint8_t>;

constexpr std::size_t canFrameBytes = 8;
constexpr std::size_t legacyHeaderBytes = 3;

unsigned int numberOf(std::string_view digits)
{
    unsigned int number = 0;
    for (char const digit : digits) {
        number = number << 4U | static_cast<unsigned int>(hexDigitValue(digit));
    }
    return number;
}

std::optional<BusLine> readSingle(BusLine line)
{
    std::size_t const length = line.bytes[0];
    if (length == 0 || line.bytes.size() < length + 1) {
        return std::nullopt;
    }
    line.payload.assign(line.bytes.begin() + 1, line.bytes.begin() + 1 + static_cast<std::ptrdiff_t>(length));
    return line;
}

std::optional<BusLine> readFirst(BusLine line, std::size_t frameBytes)
{
    std::size_t const length = (line.bytes[0] & 0x0FU) << 8U | line.bytes.at(1);
    if (line.bytes.size() != frameBytes || length < frameBytes - 1) {
        return std::nullopt;
    }
    line.kind = BusLine::Kind::First;
    line.payload.assign(line.bytes.begin() + 2, line.bytes.end());
    return line;
}

std::optional<BusLine> parseCanLine(BusKind bus, std::string_view digits, bool extended)
{
    std::size_t const headerDigits = bus == BusKind::Can11 ? 3 : 8;
    std::size_t const behind = headerDigits + (extended ? 2 : 0);
    std::size_t const frameBytes = canFrameBytes - (extended ? 1 : 0);
    if (digits.size() < behind + 4) {
        return std::nullopt;
    }
    BusLine line;
    line.header = std::string(digits.substr(0, headerDigits));
    line.module = numberOf(line.header) & 0x1FFFFFFFU;
    line.bytes = digitBytes(digits.substr(behind));
    if (line.bytes.empty() || line.bytes.size() > frameBytes) {
        return std::nullopt;
    }
    switch (line.bytes[0] >> 4U) {
    case 0:
        return readSingle(std::move(line));
    case 1:
        return readFirst(std::move(line), frameBytes);
    case 2:
        line.kind = BusLine::Kind::Consecutive;
        line.payload.assign(line.bytes.begin() + 1, line.bytes.end());
        return line;
    default:
        return std::nullopt;
    }
}

// How a legacy frame divides.
struct LegacyShape
{
    std::size_t header = legacyHeaderBytes;
    std::size_t data = 0;
};

// The format byte of ISO 14230 holds the length in its low bits; for more than 63 bytes they are 0, and a byte of its
// own stands behind the addresses. Some adapters print no check byte.
std::optional<LegacyShape> kwpShape(FrameBytes const& bytes)
{
    LegacyShape shape{legacyHeaderBytes, bytes[0] & 0x3FU};
    if (shape.data == 0) {
        shape = {legacyHeaderBytes + 1, bytes[legacyHeaderBytes]};
    }
    std::size_t const rest = bytes.size() - shape.header;
    return shape.data != 0 && (rest == shape.data || rest == shape.data + 1) ? std::optional(shape) : std::nullopt;
}

std::optional<BusLine> parseLegacyLine(BusKind bus, std::string_view digits)
{
    FrameBytes const bytes = digitBytes(digits);
    if (bytes.size() < legacyHeaderBytes + 2) {
        return std::nullopt;
    }
    LegacyShape shape{legacyHeaderBytes, bytes.size() - legacyHeaderBytes - 1};
    if (bus == BusKind::Kwp) {
        std::optional<LegacyShape> const told = kwpShape(bytes);
        if (!told) {
            return std::nullopt;
        }
        shape = *told;
    }
    BusLine line;
    line.header = std::string(digits.substr(0, 2 * shape.header));
    line.module = bytes[2];
    line.bytes.assign(bytes.begin() + static_cast<std::ptrdiff_t>(shape.header), bytes.end());
    line.payload.assign(line.bytes.begin(), line.bytes.begin() + static_cast<std::ptrdiff_t>(shape.data));
    return line;
}

// SAE J1850: polynomial x^8 + x^4 + x^3 + x^2 + 1, all bits set at the start, inverted in the end.
std::uint8_t j1850CheckByte(FrameBytes const& bytes)
{
    unsigned int check = 0xFF;
    for (std::uint8_t const byte : bytes) {
        check ^= byte;
        for (int bit = 0; bit < 8; ++bit) {
            check = (check & 0x80U) != 0 ? (check << 1U ^ 0x1DU) & 0xFFU : check << 1U;
        }
    }
    return static_cast<std::uint8_t>(~check);
}

} // namespace

BusKind busKindOf(obd::ObdProtocol protocol)
{
    switch (protocol) {
    case obd::ObdProtocolIso9141:
        return BusKind::Iso9141;
    case obd::ObdProtocolIso14230:
        return BusKind::Kwp;
    case obd::ObdProtocolJ1850:
        return BusKind::J1850;
    case obd::ObdProtocolCan11:
        return BusKind::Can11;
    case obd::ObdProtocolCan29:
        return BusKind::Can29;
    case obd::ObdProtocolUnknown:
        break;
    }
    return BusKind::Unknown;
}

BusKind busKindOf(int protocol)
{
    return busKindOf(obd::toObdProtocol(static_cast<obd::VehicleProtocol>(protocol)));
}

bool isCanBus(BusKind bus)
{
    return bus == BusKind::Can11 || bus == BusKind::Can29;
}

std::optional<BusLine> parseBusLine(BusKind bus, std::string_view digits, bool extended)
{
    if (bus == BusKind::Unknown) {
        return std::nullopt;
    }
    return isCanBus(bus) ? parseCanLine(bus, digits, extended) : parseLegacyLine(bus, digits);
}

bool hasRightCheckByte(BusKind bus, std::string_view digits)
{
    FrameBytes bytes = digitBytes(digits);
    if (bytes.size() < 2) {
        return false;
    }
    std::uint8_t const told = bytes.back();
    bytes.pop_back();
    unsigned int sum = 0;
    for (std::uint8_t const byte : bytes) {
        sum += byte;
    }
    return told == (bus == BusKind::J1850 ? j1850CheckByte(bytes) : static_cast<std::uint8_t>(sum));
}

std::string frameDigits(std::vector<std::uint8_t> const& bytes)
{
    constexpr char digits[] = "0123456789ABCDEF";
    std::string text;
    for (std::uint8_t const byte : bytes) {
        text += digits[byte >> 4U];
        text += digits[byte & 0x0FU];
    }
    return text;
}

} // namespace velmora
