// A reply's way from the adapter's bytes to payloads: cleaning, parser, CAN assembly. The first byte of the input
// chooses the bus family, the rest is the reply. Checked on every input:
//   - ids fit the bus's header, and the payloads hold no more bytes than the text has pairs;
//   - the same text gives the same result again, and in lower case too;
//   - entries that are there before stay, and an unknown protocol touches nothing;
//   - on the legacy buses a single character at the end makes no difference;
//   - a whole frame in front of the text adds its payload and changes nothing else;
//   - on CAN the plain reading, which decodes everything that is left for every frame, gives the same.

#include "libobd/adapter/elmtransport.h"
#include "libobd/bytes/bytes.h"
#include "libobd/message/messageparser.h"
#include "tests/support/payload/plaincanparser.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <iostream>
#include <optional>
#include <utility>

namespace {

using obd::ObdProtocol;
using obd::ResponseMap;
using Bytes = std::vector<unsigned char>;

struct Outcome
{
    bool usable = false;
    ResponseMap responses;

    bool operator==(Outcome const&) const = default;
};

void require(bool holds, char const* what)
{
    if (!holds) {
        std::cerr << "Broken: " << what << '\n';
        std::abort();
    }
}

bool isCan(ObdProtocol protocol)
{
    return protocol == obd::ObdProtocolCan11 || protocol == obd::ObdProtocolCan29;
}

Outcome parsed(ObdProtocol protocol, Bytes const& text, ResponseMap before = {})
{
    Outcome outcome{false, std::move(before)};
    outcome.usable = obd::MessageParser::parseResponseMessage(protocol, text, outcome.responses);
    return outcome;
}

Bytes characters(char const* text)
{
    Bytes result;
    while (*text != '\0') {
        result.push_back(static_cast<unsigned char>(*text++));
    }
    return result;
}

Bytes lowerCase(Bytes text)
{
    for (unsigned char& character : text) {
        character = static_cast<unsigned char>(std::tolower(character));
    }
    return text;
}

unsigned int highestId(ObdProtocol protocol)
{
    switch (protocol) {
    case obd::ObdProtocolCan11:
        return 0xFFF; // three digits, of which the bus uses 11 bits
    case obd::ObdProtocolCan29:
        return 0x1FFFFFFF;
    default:
        return 0xFF;
    }
}

// A CAN message is complete when as many bytes came in as it holds, so it adds no more than was there. One message may:
// the one of which a frame was rejected after its length had been taken over. That frame ends the reply, so there is
// one at most, and it is no longer than a first frame can tell.
void checkSizes(ObdProtocol protocol, Bytes const& text, ResponseMap const& responses)
{
    constexpr std::size_t longestCanMessage = 4095;
    std::size_t total = 0;
    std::size_t longest = 0;
    for (auto const& [id, payload] : responses) {
        require(id <= highestId(protocol), "id within the header's width");
        total += payload.size();
        longest = std::max(longest, payload.size());
    }
    if (isCan(protocol)) {
        require(longest <= longestCanMessage, "message no longer than a first frame can tell");
        require(total - longest <= text.size() / 2, "all payloads but one within the text");
    } else {
        require(total <= text.size() / 2, "payloads within the text");
    }
}

// No module of the reply has the numbers of these entries.
void checkEarlierEntries(ObdProtocol protocol, Bytes const& text, Outcome const& outcome)
{
    ResponseMap const before = {{0xFFFFFFFF, {0x01}}, {0x20000000, {}}};
    ResponseMap expected = outcome.responses;
    expected.insert(before.begin(), before.end());
    Outcome const again = parsed(protocol, text, before);
    require(again.responses == expected, "earlier entries stay");
    require(again.usable || !outcome.usable, "earlier entries make no reply unusable");
}

void checkUnknownProtocol(Bytes const& text)
{
    ResponseMap const before = {{0x7E8, {0x41}}};
    require(parsed(obd::ObdProtocolUnknown, text, before) == Outcome{false, before},
            "an unknown protocol touches nothing");
}

// Pairs are read from the start, so the last character of an odd count says nothing.
void checkLastCharacter(ObdProtocol protocol, Bytes text, Outcome const& outcome)
{
    if (isCan(protocol)) {
        return;
    }
    if (text.size() % 2 != 0) {
        text.pop_back();
    } else {
        text.push_back('4');
    }
    require(parsed(protocol, text) == outcome, "a single last character is ignored");
}

struct Frame
{
    Bytes text;
    unsigned int id = 0;
    Bytes payload;
};

// A frame of a module that the text does not name: a header that is read as this one would hold its letters.
std::optional<Frame> canFrameBefore(char const* frame, unsigned int id, Bytes const& text)
{
    Bytes const lower = lowerCase(text);
    Bytes const letters = characters("bcd");
    if (std::search(lower.begin(), lower.end(), letters.begin(), letters.end()) != lower.end()) {
        return std::nullopt;
    }
    return Frame{characters(frame), id, {0x11, 0x22, 0x33, 0x44, 0x55, 0x66, 0x77}};
}

// A frame with the text's own first header bytes, so that it ends where the text begins.
std::optional<Frame> saeFrameBefore(Bytes const& text)
{
    std::array<unsigned char, 3> header{};
    if (obd::hexTextToBytes(text, header) < header.size()) {
        return std::nullopt;
    }
    unsigned char const data = header[0] == 0x01 ? 0x02 : 0x01;
    Frame frame{{}, 0xC5, {data}};
    obd::bytesToHexText({header[0], header[1], 0xC5, data}, frame.text);
    return frame;
}

// A whole frame whose end does not hang on what follows.
std::optional<Frame> frameBefore(ObdProtocol protocol, Bytes const& text)
{
    switch (protocol) {
    case obd::ObdProtocolCan11:
        return canFrameBefore("BCD0711223344556677", 0xBCD, text);
    case obd::ObdProtocolCan29:
        return canFrameBefore("1ABCDEF50711223344556677", 0x1ABCDEF5, text);
    case obd::ObdProtocolIso14230:
        return Frame{characters("82F1C51122FF"), 0xC5, {0x11, 0x22}};
    default:
        return saeFrameBefore(text);
    }
}

void checkFrameBefore(ObdProtocol protocol, Bytes const& text, Outcome const& outcome)
{
    std::optional<Frame> frame = frameBefore(protocol, text);
    if (!frame) {
        return;
    }
    ResponseMap expected = outcome.responses;
    Bytes& payload = expected[frame->id];
    payload.insert(payload.begin(), frame->payload.begin(), frame->payload.end());
    frame->text.insert(frame->text.end(), text.begin(), text.end());
    require(parsed(protocol, frame->text) == Outcome{true, expected}, "a frame in front adds its payload only");
}

void checkPlainReading(ObdProtocol protocol, Bytes const& text, Outcome const& outcome)
{
    if (isCan(protocol)) {
        Outcome plain;
        plain.usable = support::parsePlainly(protocol, text, plain.responses);
        require(plain == outcome, "the plain reading gives the same");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    // The seeds begin with a digit, 0 to 4.
    auto const protocol = static_cast<ObdProtocol>(static_cast<unsigned char>(data[0] - '0') % obd::ObdProtocolUnknown);
    Bytes text(data + 1, data + size);
    obd::cleanReply(text);
    obd::removeBytes(text, " ");

    Outcome const outcome = parsed(protocol, text);
    checkSizes(protocol, text, outcome.responses);
    require(parsed(protocol, text) == outcome, "the same text gives the same");
    require(parsed(protocol, lowerCase(text)) == outcome, "letter case makes no difference");
    checkEarlierEntries(protocol, text, outcome);
    checkUnknownProtocol(text);
    checkLastCharacter(protocol, text, outcome);
    checkFrameBefore(protocol, text, outcome);
    checkPlainReading(protocol, text, outcome);
    return 0;
}
