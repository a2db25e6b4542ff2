#include "simulator/bus/frame.h"

#include "simulator/bus/checksum.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr std::uint8_t tester = 0xF1;
constexpr std::size_t canDataSize = 8;
constexpr std::size_t firstFramePayload = 6;
constexpr std::size_t nextFramePayload = 7;
constexpr std::uint32_t functional11 = 0x7DF;
constexpr std::uint32_t replyOffset11 = 8; // 7E0 is answered by 7E8

Bytes bigEndian(std::uint32_t number, std::size_t size)
{
    Bytes bytes(size);
    // NOLINTNEXTLINE(modernize-loop-convert): clang before 16 can't compile the library's reversing views
    for (auto byte = bytes.rbegin(); byte != bytes.rend(); ++byte) {
        *byte = static_cast<std::uint8_t>(number & 0xFF);
        number >>= 8;
    }
    return bytes;
}

std::uint32_t fromBigEndian(Bytes const& bytes)
{
    std::uint32_t number = 0;
    for (auto const byte : bytes) {
        number = number << 8 | byte;
    }
    return number;
}

Bytes slice(Bytes const& bytes, std::size_t from, std::size_t count)
{
    auto const end = std::min(bytes.size(), from + count);
    return {bytes.begin() + static_cast<std::ptrdiff_t>(from), bytes.begin() + static_cast<std::ptrdiff_t>(end)};
}

using Tester = std::optional<std::uint8_t>;

Frame canFrame(Protocol const& protocol, std::uint32_t source, Tester first, Bytes pci, Bytes const& part,
               Padding padding)
{
    if (first) {
        pci.insert(pci.begin(), *first);
    }
    pci.insert(pci.end(), part.begin(), part.end());
    if (padding) {
        pci.resize(canDataSize, *padding);
    }
    return {source, bigEndian(source, protocol.family == BusFamily::Can11 ? 2 : 4), std::move(pci), std::nullopt};
}

std::vector<Frame> canReply(Protocol const& protocol, std::uint32_t source, Bytes const& payload, Padding padding,
                            Tester own)
{
    std::size_t const address = own ? 1 : 0;
    if (payload.size() + address <= nextFramePayload) {
        auto const length = static_cast<std::uint8_t>(payload.size());
        return {canFrame(protocol, source, own, {length}, payload, padding)};
    }
    Bytes const lengthPci = {static_cast<std::uint8_t>(0x10 | payload.size() >> 8),
                             static_cast<std::uint8_t>(payload.size() & 0xFF)};
    std::size_t const first = firstFramePayload - address;
    std::size_t const next = nextFramePayload - address;
    std::vector<Frame> frames = {canFrame(protocol, source, own, lengthPci, slice(payload, 0, first), std::nullopt)};
    std::uint8_t sequence = 1;
    for (std::size_t at = first; at < payload.size(); at += next) {
        auto const pci = static_cast<std::uint8_t>(0x20 | (sequence++ & 0x0F));
        frames.push_back(canFrame(protocol, source, own, {pci}, slice(payload, at, next), padding));
    }
    return frames;
}

Bytes kwpHeader(std::uint8_t source, std::size_t length)
{
    // The format byte holds lengths up to 63; longer messages have a byte of their own.
    if (length < 0x40) {
        return {static_cast<std::uint8_t>(0x80 | length), tester, source};
    }
    return {0x80, tester, source, static_cast<std::uint8_t>(length)};
}

Bytes replyHeader(Protocol const& protocol, std::uint8_t source, bool everyone, std::size_t length)
{
    switch (protocol.family) {
    case BusFamily::J1850Pwm:
        return everyone ? Bytes{0x41, 0x6B, source} : Bytes{0xC4, tester, source};
    case BusFamily::J1850Vpw:
        return everyone ? Bytes{0x48, 0x6B, source} : Bytes{0x6C, tester, source};
    case BusFamily::Iso9141:
        return {0x48, 0x6B, source};
    default:
        return kwpHeader(source, length);
    }
}

bool isJ1850(Protocol const& protocol)
{
    return protocol.family == BusFamily::J1850Pwm || protocol.family == BusFamily::J1850Vpw;
}

Frame serialReply(Protocol const& protocol, std::uint32_t source, bool everyone, Bytes const& payload)
{
    Frame frame{source, replyHeader(protocol, static_cast<std::uint8_t>(source), everyone, payload.size()), payload,
                std::nullopt};
    Bytes all = frame.header;
    all.insert(all.end(), payload.begin(), payload.end());
    frame.checksum = isJ1850(protocol) ? j1850Crc(all) : sumChecksum(all);
    return frame;
}

std::optional<Target> target11(std::uint32_t id)
{
    if (id == functional11) {
        return Target{true, 0, id};
    }
    return Target{false, id + replyOffset11, id};
}

std::optional<Target> target29(std::uint32_t id)
{
    // ISO 15765-4: functional 18 DB tt ss, physical 18 DA tt ss; the reply swaps them.
    std::uint32_t const kind = id >> 16 & 0xFF;
    if (kind == 0xDB) {
        return Target{true, 0, id};
    }
    // Other identifiers reach a module that listens to them.
    std::uint32_t const reply = (id & 0xFFFF0000U) | (id & 0xFF) << 8 | (id >> 8 & 0xFF);
    return Target{false, kind == 0xDA ? reply : 0, id};
}

std::optional<Target> targetOnWire(Protocol const& protocol, Bytes const& header)
{
    Bytes const standard = functionalHeader(protocol);
    bool const functionalKwp = protocol.family == BusFamily::Kwp && header[0] >= 0xC0;
    if (functionalKwp || (header[0] == standard[0] && header[1] == standard[1])) {
        return Target{true, 0};
    }
    return Target{false, header[1]};
}

} // namespace

Bytes functionalHeader(Protocol const& protocol)
{
    switch (protocol.family) {
    case BusFamily::Can11:
        return bigEndian(functional11, 2);
    case BusFamily::Can29:
        return {0x18, 0xDB, 0x33, tester};
    case BusFamily::J1850Pwm:
        return {0x61, 0x6A, tester};
    case BusFamily::Kwp:
        return {0xC0, 0x33, tester};
    default:
        return {0x68, 0x6A, tester};
    }
}

std::optional<Target> targetOf(Protocol const& protocol, Bytes const& header)
{
    if (protocol.family == BusFamily::Can11 && header.size() == 2) {
        return target11(fromBigEndian(header));
    }
    if (protocol.family == BusFamily::Can29 && header.size() == 4) {
        return target29(fromBigEndian(header));
    }
    if (!isCan(protocol) && header.size() == 3) {
        return targetOnWire(protocol, header);
    }
    return std::nullopt;
}

std::vector<Frame> frameReply(Protocol const& protocol, std::uint32_t source, bool everyone, Bytes const& payload,
                              Padding padding, Tester own)
{
    if (isCan(protocol)) {
        return canReply(protocol, source, payload, padding, own);
    }
    return {serialReply(protocol, source, everyone, payload)};
}

std::optional<Bytes> unwrapSingleFrame(Bytes const& data)
{
    if (data.empty() || data[0] == 0 || data[0] > nextFramePayload || data.size() <= data[0]) {
        return std::nullopt;
    }
    return slice(data, 1, data[0]);
}

} // namespace obdsim
