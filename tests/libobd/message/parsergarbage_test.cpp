// Replies that no adapter should give: noise, lies and masses of it, on every bus family.

#include "libobd/message/messageparser.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/payload/plaincanparser.h"

#include <gtest/gtest.h>

#include <array>
#include <chrono>
#include <random>
#include <string_view>
#include <utility>

namespace {

using obd::ResponseMap;
using Text = std::vector<unsigned char>;

constexpr std::array families = {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolJ1850,
                                 obd::ObdProtocolCan11, obd::ObdProtocolCan29};
constexpr std::size_t hundredKilobytes = 100'000;

bool parse(obd::ObdProtocol protocol, Text const& text, ResponseMap& responses)
{
    return obd::MessageParser::parseResponseMessage(protocol, text, responses);
}

bool isCan(obd::ObdProtocol protocol)
{
    return protocol == obd::ObdProtocolCan11 || protocol == obd::ObdProtocolCan29;
}

std::size_t payloadBytes(ResponseMap const& responses)
{
    std::size_t total = 0;
    for (auto const& [id, payload] : responses) {
        total += payload.size();
    }
    return total;
}

unsigned int highestId(obd::ObdProtocol protocol)
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

Text repeated(std::string_view pattern, std::size_t size)
{
    Text const once = support::replyText(pattern);
    Text text;
    text.reserve(size);
    while (text.size() < size) {
        text.push_back(once[text.size() % once.size()]);
    }
    return text;
}

class Noise
{
public:
    explicit Noise(unsigned int seed) : m_engine(seed) {}

    unsigned int below(unsigned int limit) { return static_cast<unsigned int>(m_engine() % limit); }

    template <std::size_t N>
    char const* oneOf(std::array<char const*, N> const& choices)
    {
        return choices[below(static_cast<unsigned int>(N))];
    }

    Text characters(std::string_view alphabet, std::size_t size)
    {
        Text text(size);
        for (unsigned char& character : text) {
            character = static_cast<unsigned char>(alphabet[below(static_cast<unsigned int>(alphabet.size()))]);
        }
        return text;
    }

    Text anyBytes(std::size_t size)
    {
        Text text(size);
        for (unsigned char& byte : text) {
            byte = static_cast<unsigned char>(below(256));
        }
        return text;
    }

private:
    std::mt19937 m_engine;
};

// Holds for every reply: ids in their width, and no more bytes out than came in. The one exception is a CAN message
// whose frame was rejected after its length had been taken over: it may count as complete with its gaps at zero.
void expectSane(obd::ObdProtocol protocol, Text const& text)
{
    ResponseMap responses;
    parse(protocol, text, responses);
    std::size_t const longestMessage = isCan(protocol) ? 4095 : 0;
    EXPECT_LE(payloadBytes(responses), text.size() / 2 + longestMessage);
    if (!responses.empty()) {
        EXPECT_LE(responses.rbegin()->first, highestId(protocol));
    }
}

TEST(ParserGarbage, HundredKilobytesOfNoiseOnEveryFamily)
{
    Noise noise(1);
    std::array const texts = {
        noise.anyBytes(hundredKilobytes),
        noise.characters("0123456789ABCDEF", hundredKilobytes),
        noise.characters("01278E", hundredKilobytes),
        noise.characters("0123456789abcdefXYZ:.<", hundredKilobytes - 1),
    };
    for (obd::ObdProtocol const protocol : families) {
        for (Text const& text : texts) {
            expectSane(protocol, text);
        }
    }
}

TEST(ParserGarbage, HundredKilobytesOfOnePatternOnEveryFamily)
{
    for (char const* const pattern : {"0",
                                      "1",
                                      "2",
                                      "7",
                                      "8",
                                      "F",
                                      "Z",
                                      "00",
                                      "7E8 00",
                                      "7E8 01 41",
                                      "7E8 10 14 01 02 03 04 05 06",
                                      "7E8 1F FF 01 02 03 04 05 06",
                                      "7E8 21 01 02 03 04 05 06 07",
                                      "7E8 0F",
                                      "7E8 03 41 0D 37 CC CC CC CC",
                                      "18DAF110 03 41 0D 37",
                                      "18DAF110 10 14 01 02 03 04 05 06",
                                      "48 6B 10 41",
                                      "48 6B 10",
                                      "48 6B",
                                      "48",
                                      "80 F1 10",
                                      "81 F1 10 41 00",
                                      "BF F1 10",
                                      "83 F1 10 41 0D"}) {
        for (obd::ObdProtocol const protocol : families) {
            expectSane(protocol, repeated(pattern, hundredKilobytes));
        }
    }
}

// The bound is far above what it takes, and far below what a cost that grows with the square would take.
TEST(ParserGarbage, AMegabyteOfTheSmallestFramesIsReadInTime)
{
    constexpr std::size_t megabyte = 1'000'000;
    std::array<char const*, families.size()> const smallest = {"48 6B 10 41", "80 F1 10 00", "48 6B 10",
                                                               "7E8 00 7E9 00", "18DAF110 00"};
    auto const start = std::chrono::steady_clock::now();
    for (std::size_t i = 0; i < families.size(); ++i) {
        ResponseMap responses;
        EXPECT_TRUE(parse(families[i], repeated(smallest[i], megabyte), responses));
    }
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
}

TEST(ParserGarbage, EveryCutOfAGoodReplyIsSane)
{
    struct
    {
        obd::ObdProtocol protocol;
        char const* text;
    } const replies[] = {
        {obd::ObdProtocolIso9141, "48 6B 10 41 00 BE 3E B8 11 FA 48 6B 18 41 00 80 10 00 00 4C"},
        {obd::ObdProtocolIso14230, "86 F1 10 41 00 BE 3E B8 11 1D 86 F1 18 41 00 80 10 00 00 60"},
        {obd::ObdProtocolJ1850, "41 6B 10 41 00 BE 3E B8 11 A2 41 6B 18 41 00 80 10 00 00 3C"},
        {obd::ObdProtocolCan11, "7E8 10 14 49 02 01 31 44 34 7E8 21 47 50 30 30 52 35 35 7E8 22 42 31 32 33 34 35 36"},
        {obd::ObdProtocolCan29,
         "18DAF110 10 0A 49 04 01 31 44 34 18DAF118 03 7F 09 12 18DAF110 21 47 50 30 30 00 00 00"},
    };
    for (auto const& reply : replies) {
        Text const whole = support::replyText(reply.text);
        for (std::size_t from = 0; from <= whole.size(); ++from) {
            for (std::size_t size = 0; size <= whole.size() - from; ++size) {
                auto const start = whole.begin() + static_cast<std::ptrdiff_t>(from);
                expectSane(reply.protocol, Text(start, start + static_cast<std::ptrdiff_t>(size)));
            }
        }
    }
}

std::string hexDigit(unsigned int value)
{
    return {"0123456789ABCDEF"[value & 0xF]};
}

// A reply of likely pieces, so that frames are found, and break, in every way.
Text likelyCanReply(Noise& noise, obd::ObdProtocol protocol)
{
    static constexpr std::array<char const*, 6> ids11 = {"7E8", "7E9", "7e8", "7EA", "7E8", "CCC"};
    static constexpr std::array<char const*, 4> ids29 = {"18DAF110", "18DAF118", "F8DAF110", "18DAF110"};
    static constexpr std::array<char const*, 10> starts = {"1014", "100A", "1006", "11FF", "0341",
                                                           "0641", "07",   "0F",   "00",   "30"};
    std::string text;
    for (unsigned int frames = noise.below(12); frames > 0; --frames) {
        text += protocol == obd::ObdProtocolCan11 ? noise.oneOf(ids11) : noise.oneOf(ids29);
        if (noise.below(2) == 0) {
            text += '2' + hexDigit(noise.below(4));
        } else {
            text += noise.oneOf(starts);
        }
        Text const data = noise.characters("00012345AF5Z", 2 * noise.below(9) + noise.below(8) / 7);
        text.append(data.begin(), data.end());
    }
    return support::replyText(text);
}

TEST(ParserGarbage, CanRepliesGiveWhatThePlainReadingGives)
{
    Noise noise(2);
    support::LogCapture const quiet;
    std::size_t readable = 0;
    for (int round = 0; round < 20'000; ++round) {
        obd::ObdProtocol const protocol = round % 2 == 0 ? obd::ObdProtocolCan11 : obd::ObdProtocolCan29;
        Text const text = likelyCanReply(noise, protocol);
        ResponseMap responses;
        ResponseMap plain;
        ASSERT_EQ(parse(protocol, text, responses), support::parsePlainly(protocol, text, plain))
            << std::string(text.begin(), text.end());
        ASSERT_EQ(responses, plain) << std::string(text.begin(), text.end());
        readable += payloadBytes(responses) > 0 ? 1 : 0;
    }
    EXPECT_GT(readable, 4'000U) << "too few of the replies made up are readable";
}

// Long messages whose frames are lost, doubled and shuffled; now and then a new first frame comes between.
Text shuffledLongMessage(Noise& noise)
{
    unsigned int const length = 6 + noise.below(noise.below(3) == 0 ? 4090 : 300);
    std::string text = "7E81" + hexDigit(length >> 8) + hexDigit(length >> 4) + hexDigit(length) + "010203040506";
    std::vector<std::string> frames;
    for (unsigned int slot = 0; 6 + 7 * slot < length; ++slot) {
        unsigned int const fate = noise.below(60);
        Text const data = noise.characters("0123456789ABCDEF", 14);
        std::string const frame = "7E82" + hexDigit(slot + 1) + std::string(data.begin(), data.end());
        frames.insert(frames.end(), fate == 0 ? 2 : 1, fate == 1 ? text : frame);
        if (frames.size() > 1 && noise.below(4) == 0) {
            std::swap(frames.back(), frames[noise.below(static_cast<unsigned int>(frames.size()))]);
        }
    }
    for (std::string const& frame : frames) {
        text += frame;
    }
    return support::replyText(text);
}

TEST(ParserGarbage, ShuffledLongMessagesGiveWhatThePlainReadingGives)
{
    Noise noise(3);
    support::LogCapture const quiet;
    std::size_t readable = 0;
    for (int round = 0; round < 100; ++round) {
        Text const text = shuffledLongMessage(noise);
        ResponseMap responses;
        ResponseMap plain;
        ASSERT_EQ(parse(obd::ObdProtocolCan11, text, responses),
                  support::parsePlainly(obd::ObdProtocolCan11, text, plain));
        ASSERT_EQ(responses, plain);
        readable += payloadBytes(responses) > 0 ? 1 : 0;
    }
    EXPECT_GT(readable, 20U) << "too few of the replies made up are readable";
}

} // namespace
