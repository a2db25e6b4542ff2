#include "libvelmora/record/vinmask.h"

#include <gtest/gtest.h>

using namespace velmora;

namespace {

obdsim::Dialogue dialogueOf(int protocol, std::string const& sent, std::vector<std::string> const& chunks)
{
    obdsim::Dialogue dialogue;
    dialogue.protocol = protocol;
    obdsim::Exchange exchange{sent, {}};
    for (std::string const& bytes : chunks) {
        exchange.chunks.push_back({obdsim::Time(0), bytes});
    }
    dialogue.exchanges.push_back(exchange);
    return dialogue;
}

std::string masked(int protocol, std::string const& sent, std::string const& reply)
{
    obdsim::Dialogue dialogue = dialogueOf(protocol, sent, {reply});
    maskVins(dialogue);
    return dialogue.exchanges.front().received();
}

} // namespace

TEST(VinMask, blanksTheTailInCanFrames)
{
    EXPECT_EQ(masked(6, "0902",
                     "7E8 10 14 49 02 01 31 4E 34 \r7E8 21 41 4C 33 41 50 37 44 \r7E8 22 43 31 32 33 34 35 36 \r\r>"),
              "7E8 10 14 49 02 01 31 4E 34 \r7E8 21 41 4C 33 41 50 37 44 \r7E8 22 43 30 30 30 30 30 30 \r\r>");
}

TEST(VinMask, leavesTheFillingOfCanFrames)
{
    // 19 bytes, for the count of items is missing: the tail ends one byte short of the frame.
    EXPECT_EQ(masked(6, "0902", "7E81013490257414C4C\r7E82145524E41544956\r7E82249563132333455\r\r>"),
              "7E81013490257414C4C\r7E82145524E41544956\r7E82230303030303055\r\r>");
}

TEST(VinMask, readsIdentifiersOf29Bits)
{
    EXPECT_EQ(masked(7, "0902", "18DAF110101449020157564D\r18DAF1102156454C4D4F5241\r18DAF1102253333132333435\r\r>"),
              "18DAF110101449020157564D\r18DAF1102156454C4D4F5241\r18DAF1102253303030303030\r\r>");
}

TEST(VinMask, keepsInterleavedModulesApart)
{
    EXPECT_EQ(masked(6, "09021",
                     "7E8101449020157564D\r7E9101449020157564D\r7E92156454C4D4F5241\r7E82156454C4D4F5241\r"
                     "7E82253333132333435\r7E92253333637383930\r\r>"),
              "7E8101449020157564D\r7E9101449020157564D\r7E92156454C4D4F5241\r7E82156454C4D4F5241\r"
              "7E82253303030303030\r7E92253303030303030\r\r>");
}

TEST(VinMask, mendsTheCheckByteOfJ1850)
{
    // The check bytes were worked out apart from this code: CRC with 1D, preset FF, inverted.
    EXPECT_EQ(masked(2, "0902",
                     "48 6B 10 49 02 01 00 00 00 57 B3\r48 6B 10 49 02 02 44 58 2D 53 99\r"
                     "48 6B 10 49 02 03 49 4D 30 30 11\r48 6B 10 49 02 04 31 39 32 31 B6\r"
                     "48 6B 10 49 02 05 32 33 34 35 A8\r\r>"),
              "48 6B 10 49 02 01 00 00 00 57 B3\r48 6B 10 49 02 02 44 58 2D 53 99\r"
              "48 6B 10 49 02 03 49 4D 30 30 11\r48 6B 10 49 02 04 31 39 30 30 33\r"
              "48 6B 10 49 02 05 30 30 30 30 47\r\r>");
}

TEST(VinMask, mendsTheSumOfIso14230)
{
    EXPECT_EQ(masked(5, "0902",
                     "87F110490201000000572B\r87F11049020241555A5A1F\r87F11049020338515034E3\r"
                     "87F11049020436413132B1\r87F11049020533343536AA\r\r>"),
              "87F110490201000000572B\r87F11049020241555A5A1F\r87F11049020338515034E3\r"
              "87F11049020436413030AE\r87F1104902053030303098\r\r>");
}

TEST(VinMask, dropsAReplyThatItCannotRead)
{
    EXPECT_EQ(masked(6, "0902", "014\r0: 49 02 01 31 4E 34\r1: 41 4C 33 41 50 37 44\r2: 43 31 32 33 34 35 36\r\r>"),
              "NO DATA\r\r>");
    EXPECT_EQ(masked(0, "0902", "7E81014490201314E34\r7E821414C3341503744\r7E82243313233343536\r\r>"), "NO DATA\r\r>");
    EXPECT_EQ(masked(6, "0902", "7E81014490201314E34\r7E821414C3341503744\r\r>"), "NO DATA\r\r>")
        << "the last frame may stand in another reply";
    EXPECT_EQ(masked(5, "0902", "87F110490201000000572B\r87F110490202\r\r>"), "NO DATA\r\r>") << "a line cut off";
    EXPECT_EQ(masked(5, "0902", "87F11049\r\r>"), "87F11049\r\r>") << "too short to tell what it is";
}

TEST(VinMask, blanksALateReplyBehindAnotherRequest)
{
    EXPECT_EQ(masked(6, "0904", "7E81014490201314E34\r7E821414C3341503744\r7E82243313233343536\r7E8037F0912\r\r>"),
              "7E81014490201314E34\r7E821414C3341503744\r7E82243303030303030\r7E8037F0912\r\r>");
}

TEST(VinMask, leavesOtherRepliesAlone)
{
    EXPECT_EQ(masked(6, "0100", "7E8064100BE3FB813\r\r>"), "7E8064100BE3FB813\r\r>");
    EXPECT_EQ(masked(6, "0902", "7E8037F0912\r\r>"), "7E8037F0912\r\r>");
    EXPECT_EQ(masked(6, "0902", "NO DATA\r\r>"), "NO DATA\r\r>");
    EXPECT_EQ(masked(6, "010C", "7E804410C4902\r\r>"), "7E804410C4902\r\r>") << "an engine speed that looks like one";
}

TEST(VinMask, blanksFramesOfTheNumbersOwnMessageAlone)
{
    std::string const first = "7E81014490201314E34\r";
    std::string const rest = "7E821414C3341503744\r7E82243313233343536\r";
    std::string const blanked = "7E821414C3341503744\r7E82243303030303030\r";
    for (char const* const other : {"7E8027E00\r",       // a single frame of the same module
                                    "7E83000\r",         // flow control
                                    "7E9224331323334\r", // another module's
                                    "7E8\r", "7E82\r", "7E820414243444546\r", "7E8\r\r", "7E82441424344454647\r"}) {
        EXPECT_EQ(masked(6, "0904", first + other + rest + ">"), first + other + blanked + ">") << other;
    }
    EXPECT_EQ(masked(6, "0904", first + "7E8211449024142434\r7E82243313233343536\r>"),
              first + "7E8211449024142434\r7E82243303030303030\r>")
        << "characters that read like the beginning of another";
    EXPECT_EQ(masked(6, "0904", first + "7E8224331323334353\r>"), first + "7E8224330303030303\r>")
        << "the last digit is half a byte";
    EXPECT_EQ(masked(6, "0904", "7E8104902\r7E810144902\r>"), "7E8104902\r7E810144902\r>") << "too short for any";
}

TEST(VinMask, readsLegacyLinesWithoutTheirCheckByte)
{
    EXPECT_EQ(masked(5, "0902",
                     "87F11049020100000057\r87F11049020241555A5A\r87F11049020338515034\r"
                     "87F11049020436413132\r87F11049020533343536\r\r>"),
              "87F11049020100000057\r87F11049020241555A5A\r87F11049020338515034\r"
              "87F11049020436413030\r87F11049020530303030\r\r>");
    EXPECT_EQ(masked(5, "0902", "87F11049020100000057\r87F11049020241555A5A\r87F11049020338515034\r\r>"),
              "NO DATA\r\r>")
        << "its end may stand in another reply";
}

TEST(VinMask, readsNoLineThatHoldsWords)
{
    EXPECT_EQ(masked(6, "0902", "7E81014490201314E34 <DATA ERROR\r7E821414C3341503744\r7E82243313233343536\r\r>"),
              "NO DATA\r\r>");
}

TEST(VinMask, keepsThePiecesInWhichBytesCame)
{
    obdsim::Dialogue dialogue =
        dialogueOf(6, "0902", {"7E81014490201314E34\r7E821414C33", "41503744\r7E8224331323", "3343536\r\r>"});
    maskVins(dialogue);
    auto const& chunks = dialogue.exchanges.front().chunks;
    ASSERT_EQ(chunks.size(), 3U);
    EXPECT_EQ(chunks[1].bytes, "41503744\r7E8224330303");
    EXPECT_EQ(chunks[2].bytes, "0303030\r\r>");
}
