// Messages put together from their frames, and what is told of replies that hold them.

#include "libvelmora/channel/canmessagelist.h"
#include "libvelmora/channel/replyhealer.h"

#include <fmt/format.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

// "+" or "-" for each frame, kept or not; each message with its bytes and how long it is to be; habits that were met.
std::string puttingTogether(std::vector<std::string> const& lines, bool extended = false, BusKind bus = BusKind::Can11)
{
    HabitCounts counts{};
    ModuleMessages messages(bus, counts, extended);
    std::string text;
    for (std::string const& line : lines) {
        auto const frame = parseBusLine(bus, line, extended);
        text += frame && messages.add(*frame, line, text.size()) ? "+" : "-";
    }
    for (ModuleMessage const& each : messages.all()) {
        text += fmt::format(" {:X}:{}/{}{}{}{}", each.module, frameDigits(each.payload), each.length,
                            each.segmented() ? "s" : "", each.broken ? "!" : "", each.inOrder ? "" : "~");
        text += each.complete() ? "" : fmt::format(" lacks {}", each.missingFrames());
    }
    for (unsigned int const module : {0x7E8U, 0x7E9U}) {
        text += messages.orphans(module) != 0 ? fmt::format(" {} of {:X} left", messages.orphans(module), module) : "";
    }
    for (Habit const habit :
         {Habit::RepeatedFrame, Habit::OrphanFrame, Habit::BrokenLine, Habit::Padding, Habit::ShortLastFrame}) {
        unsigned int const times = counts[static_cast<std::size_t>(habit)];
        text += times != 0 ? fmt::format(", {} {}", times, habitName(habit)) : "";
    }
    return text;
}

// A message of so many bytes in its frames, each byte its own place.
std::vector<std::string> framesOfLength(std::size_t length)
{
    std::vector<std::uint8_t> payload;
    for (std::size_t i = 0; i < length; ++i) {
        payload.push_back(static_cast<std::uint8_t>(i));
    }
    return plainFrames("7E8", payload);
}

TEST(CanMessages, ArePutTogetherFromTheirFrames)
{
    EXPECT_EQ(puttingTogether({"7E8024100"}), "+ 7E8:4100/2");
    EXPECT_EQ(puttingTogether({"7E8024100AA"}), "+ 7E8:4100/2, 1 filling cut off");
    EXPECT_EQ(puttingTogether({"7E80741000102030405"}), "+ 7E8:41000102030405/7") << "in one frame";
    EXPECT_EQ(puttingTogether({"7E81008010203040506", "7E8210708AAAAAAAAAA"}), "++ 7E8:0102030405060708/8s");
    EXPECT_EQ(puttingTogether({"7E8100D010203040506"}), "+ 7E8:010203040506/13s lacks 1");
    EXPECT_EQ(puttingTogether({"7E8100E010203040506"}), "+ 7E8:010203040506/14s lacks 2");
    EXPECT_EQ(puttingTogether({"7E81123010203040506"}), "+ 7E8:010203040506/291s lacks 41");
    EXPECT_EQ(puttingTogether({"486B104100FA"}, false, BusKind::J1850), "+ 10:4100/2");
    EXPECT_EQ(puttingTogether({"607F1100A0102030405", "607F107"}, true), "+- 607:0102030405/10s lacks 1")
        << "no frame at all";
    EXPECT_EQ(puttingTogether({"607F1100C0102030405", "607F1210607080910AA"}, true),
              "++ 607:01020304050607080910AA/12s lacks 1");
    EXPECT_EQ(puttingTogether({"607F1100B0102030405", "607F121060708091011"}, true),
              "++ 607:0102030405060708091011/11s");
}

TEST(CanMessages, KnowWhichFramesAreNotTheirs)
{
    EXPECT_EQ(puttingTogether({"7E82101020304050607"}), "- 1 of 7E8 left, 1 frames without their beginning");
    EXPECT_EQ(puttingTogether({"7E8024100", "7E82101020304050607"}),
              "+- 7E8:4100/2 1 of 7E8 left, 1 frames without their beginning");
    EXPECT_EQ(puttingTogether({"7E9100D010203040506", "7E82101020304050607", "7E92101020304050607"}),
              "+-+ 7E9:01020304050601020304050607/13s 1 of 7E8 left, 1 frames without their beginning");
    EXPECT_EQ(puttingTogether({"7E8100D010203040506", "7E82001020304050607", "7E82201020304050607"}),
              "+-- 7E8:010203040506/13s lacks 1 2 of 7E8 left, 2 frames without their beginning")
        << "numbers that it does not reach";
    EXPECT_EQ(puttingTogether({"7E8100D010203040506", "7E82101020304050607", "7E82107020304050607"}),
              "++- 7E8:01020304050601020304050607/13s, 1 frames without their beginning")
        << "it is whole";
    EXPECT_EQ(puttingTogether({"7E8100D010203040506", "7E8100D010203040506"}),
              "+- 7E8:010203040506/13s lacks 1, 1 frames that came twice");
    EXPECT_EQ(puttingTogether({"7E8100D010203040506", "7E82101020304050607", "7E8100D010203040506"}),
              "+++ 7E8:01020304050601020304050607/13s 7E8:010203040506/13s lacks 1")
        << "the beginning of another one";
    EXPECT_EQ(puttingTogether({"7E8100D010203040506", "7E8100D010203040507"}),
              "++ 7E8:010203040506/13s lacks 1 7E8:010203040507/13s lacks 1");
    EXPECT_EQ(puttingTogether({"7E81014010203040506", "7E82101020304050607", "7E82101020304050607"}),
              "++- 7E8:01020304050601020304050607/20s lacks 1, 1 frames that came twice");
}

TEST(CanMessages, TellFramesThatClaimOnePlaceFromThoseOutOfOrder)
{
    EXPECT_EQ(puttingTogether({"7E81014010203040506", "7E82201020304050607", "7E82101020304050607"}),
              "+++ 7E8:0102030405060102030405060701020304050607/20s~");
    EXPECT_EQ(puttingTogether({"7E81014010203040506", "7E82101020304050607", "7E82107020304050607"}),
              "+++ 7E8:0102030405060102030405060707020304050607/20s!~ lacks 0");
    EXPECT_EQ(puttingTogether({"607F110110102030405", "607F121010203040506", "607F121070203040506"}, true),
              "+++ 607:0102030405010203040506070203040506/17s!~ lacks 0");
    EXPECT_EQ(puttingTogether({"607F110110102030405", "607F121010203040506", "607F122010203040506"}, true),
              "+++ 607:0102030405010203040506010203040506/17s");
}

TEST(CanMessages, MayHaveAShortLastFrameAlone)
{
    EXPECT_EQ(puttingTogether({"7E8100F010203040506", "7E82101020304050607", "7E8220809"}),
              "+++ 7E8:010203040506010203040506070809/15s, 1 last frames without filling");
    EXPECT_EQ(puttingTogether({"7E8100F010203040506", "7E82101020304050607", "7E822080900000000"}),
              "+++ 7E8:010203040506010203040506070809/15s, 1 last frames without filling")
        << "a byte of it";
    EXPECT_EQ(puttingTogether({"7E8100F010203040506", "7E82101020304050607", "7E82208090000000000"}),
              "+++ 7E8:010203040506010203040506070809/15s");
    EXPECT_EQ(puttingTogether({"7E8100F010203040506", "7E821010203040506", "7E8220809"}),
              "+-- 7E8:010203040506/15s~ lacks 2, 2 broken lines dropped")
        << "the first of them must be full";
    EXPECT_EQ(puttingTogether({"7E8100F010203040506", "7E82101020304050607", "7E82208"}),
              "++- 7E8:01020304050601020304050607/15s lacks 1, 1 broken lines dropped");
}

TEST(CanMessages, OfManyFramesBeginTheirNumbersAnew)
{
    for (std::size_t const length : {112U, 118U, 119U, 256U, 291U}) {
        std::vector<std::string> const frames = framesOfLength(length);
        EXPECT_EQ(frames.size(), 1 + length / 7) << length;
        std::string const text = puttingTogether(frames);
        EXPECT_EQ(text.substr(0, frames.size()), std::string(frames.size(), '+')) << text;
        EXPECT_TRUE(text.ends_with(fmt::format("/{}s", length))) << text;
    }
    std::vector<std::string> const frames = framesOfLength(256);
    EXPECT_EQ(frames.front(), "7E81100000102030405");
    EXPECT_EQ(frames[15].substr(0, 7), "7E82F68");
    EXPECT_EQ(frames[16].substr(0, 7), "7E8206F");
    EXPECT_EQ(frames.back(), "7E824FBFCFDFEFF0000");
}

// Its last frame has the highest number, so that 0 is of another one.
TEST(CanMessages, OfFifteenFramesHaveNoneWithTheNumberZero)
{
    EXPECT_EQ(puttingTogether({framesOfLength(110).front(), "7E82001020304050607"}),
              "+- 7E8:000102030405/110s lacks 15 1 of 7E8 left, 1 frames without their beginning");
}

TEST(PlainFrames, AreFilledUpWithZeros)
{
    EXPECT_EQ(framesOfLength(0), std::vector<std::string>{"7E800"});
    EXPECT_EQ(framesOfLength(7), std::vector<std::string>{"7E80700010203040506"});
    EXPECT_EQ(framesOfLength(8), (std::vector<std::string>{"7E81008000102030405", "7E82106070000000000"}));
    EXPECT_EQ(framesOfLength(13), (std::vector<std::string>{"7E8100D000102030405", "7E821060708090A0B0C"}));
    EXPECT_EQ(framesOfLength(14).back(), "7E8220D000000000000");
}

} // namespace

} // namespace velmora
