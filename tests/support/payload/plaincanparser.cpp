#include "tests/support/payload/plaincanparser.h"

#include "libobd/bytes/bytes.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <map>
#include <string_view>

namespace support {

namespace {

using Bytes = std::vector<unsigned char>;

constexpr int rejected = -1;

struct Message
{
    std::uint32_t length = 0;
    std::uint32_t received = 0;
    Bytes payload;
    std::vector<bool> filled;
    std::uint32_t rounds = 1;
};

int readSingle(Message& message, Bytes const& frame)
{
    message.length = frame[0] % 16;
    std::size_t end = 1 + message.length;
    if (frame.size() < end) {
        return rejected;
    }
    message.payload.assign(frame.begin() + 1, frame.begin() + static_cast<std::ptrdiff_t>(end));
    message.received = message.length;
    constexpr std::string_view padding("\x00\xAA\xFF\x55", 4);
    while (end < 8 && end < frame.size() && padding.find(static_cast<char>(frame[end])) != std::string_view::npos) {
        ++end;
    }
    return static_cast<int>(end);
}

int readFirst(Message& message, Bytes const& frame)
{
    if (frame.size() < 8) {
        return rejected;
    }
    message.length = frame[0] % 16U * 256U + frame[1];
    if (message.length < 6) {
        return rejected;
    }
    std::uint32_t const expected = (message.length - 6 + 6) / 7;
    message.filled.resize(expected);
    message.rounds = (expected + 14) / 15;
    message.payload.resize(message.length);
    std::copy(frame.begin() + 2, frame.begin() + 8, message.payload.begin());
    message.received = 6;
    return 8;
}

std::uint32_t slotFor(Message& message, std::uint32_t sequence)
{
    std::uint32_t slot = sequence - 1;
    if (message.rounds == 0) {
        return slot;
    }
    for (std::uint32_t tries = 0;;) {
        if (slot < message.filled.size() && !message.filled[slot]) {
            message.filled[slot] = true;
            return slot;
        }
        if (++tries == message.rounds) {
            return slot;
        }
        slot += 16;
    }
}

int readConsecutive(Message& message, Bytes const& frame)
{
    if (message.payload.empty()) {
        return rejected;
    }
    std::uint32_t const offset = 6 + 7 * slotFor(message, frame[0] % 16);
    if (offset > message.payload.size() || frame.size() < 8) {
        return rejected;
    }
    for (std::uint32_t i = 0; i < 7 && offset + i < message.payload.size(); ++i) {
        message.payload.at(offset + i) = frame[1 + i];
        ++message.received;
    }
    return 8;
}

int readFrame(Message& message, Bytes const& frame)
{
    switch (frame.empty() ? rejected : frame[0] / 16) {
    case 0:
        return readSingle(message, frame);
    case 1:
        return readFirst(message, frame);
    case 2:
        return readConsecutive(message, frame);
    default:
        return rejected;
    }
}

Bytes takeFront(Bytes& text, std::size_t count)
{
    auto const end = text.begin() + static_cast<std::ptrdiff_t>(count);
    Bytes front(text.begin(), end);
    text.erase(text.begin(), end);
    return front;
}

unsigned int idOf(obd::ObdProtocol protocol, Bytes header)
{
    if (protocol == obd::ObdProtocolCan11) {
        header.insert(header.begin(), '0');
    }
    Bytes bytes;
    obd::hexTextToBytes(header, bytes);
    unsigned int id = 0;
    for (unsigned char const byte : bytes) {
        id = id << 8 | byte;
    }
    return id & 0x1FFFFFFF;
}

bool readFrames(obd::ObdProtocol protocol, Bytes& text, std::map<unsigned int, Message>& messages)
{
    std::size_t const headerCharacters = protocol == obd::ObdProtocolCan11 ? 3 : 8;
    do {
        if (text.size() < headerCharacters) {
            return !messages.empty();
        }
        Message& message = messages[idOf(protocol, takeFront(text, headerCharacters))];
        Bytes rest;
        obd::hexTextToBytes(text, rest);
        int const consumed = readFrame(message, rest);
        if (consumed < 0) {
            return true;
        }
        takeFront(text, 2 * static_cast<std::size_t>(consumed));
    } while (!text.empty());
    return true;
}

} // namespace

bool parsePlainly(obd::ObdProtocol protocol, std::vector<unsigned char> text, obd::ResponseMap& responses)
{
    std::map<unsigned int, Message> messages;
    if (!readFrames(protocol, text, messages)) {
        return false;
    }
    for (auto const& [id, message] : messages) {
        if (message.length == message.received) {
            responses[id] = message.payload;
        }
    }
    return !responses.empty();
}

} // namespace support
