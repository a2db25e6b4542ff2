#include "libvelmora/record/dialoguerecorder.h"

#include <gtest/gtest.h>

#include <thread>

using namespace velmora;

TEST(DialogueRecorder, takesDownEachCommandWithItsReply)
{
    DialogueRecorder recorder;
    recorder.onSent("ATZ\r");
    recorder.onReceived("\r\rELM327 v1.5");
    recorder.onReceived("\r\r>");
    recorder.onSent("01");
    recorder.onSent("0C\r");
    obdsim::Dialogue const dialogue = recorder.dialogue();
    ASSERT_EQ(dialogue.exchanges.size(), 2U);
    EXPECT_EQ(dialogue.exchanges[0].sent, "ATZ");
    EXPECT_EQ(dialogue.exchanges[0].received(), "\r\rELM327 v1.5\r\r>");
    EXPECT_EQ(dialogue.exchanges[1].sent, "010C");
    EXPECT_EQ(dialogue.exchanges[1].received(), "");
}

TEST(DialogueRecorder, partsSeveralCommandsSentAtOnce)
{
    DialogueRecorder recorder;
    recorder.onSent("ATE0\r\r0100\r");
    obdsim::Dialogue const dialogue = recorder.dialogue();
    ASSERT_EQ(dialogue.exchanges.size(), 3U);
    EXPECT_EQ(dialogue.exchanges[1].sent, "") << "an empty line repeats the last command";
}

TEST(DialogueRecorder, dropsWhatComesBeforeTheFirstCommand)
{
    DialogueRecorder recorder;
    recorder.onReceived("\xFC>");
    EXPECT_TRUE(recorder.dialogue().exchanges.empty());
    recorder.onSent("ATI\r");
    EXPECT_EQ(recorder.dialogue().exchanges[0].received(), "");
}

TEST(DialogueRecorder, keepsAMegabyteOfAReplyThatHasNoEnd)
{
    constexpr std::size_t megabyte = 1U << 20U;
    DialogueRecorder recorder;
    recorder.onSent("ATI\r");
    for (int i = 0; i < 3; ++i) {
        recorder.onReceived(std::string(megabyte / 2 + 1, '>'));
    }
    recorder.onSent("ATE0\r");
    recorder.onReceived("OK\r\r>");
    obdsim::Dialogue const dialogue = recorder.dialogue();
    EXPECT_EQ(dialogue.exchanges[0].received().size(), megabyte);
    EXPECT_EQ(dialogue.exchanges[1].received(), "OK\r\r>");
}

TEST(DialogueRecorder, takesDownPausesFromTheCommandOn)
{
    DialogueRecorder recorder;
    auto const rest = [] { std::this_thread::sleep_for(std::chrono::milliseconds(22)); };
    recorder.onSent("ATI\r");
    rest();
    recorder.onReceived("ELM");
    recorder.onReceived("327\r\r>");
    rest();
    recorder.onSent("ATE0\r");
    recorder.onReceived("OK\r");
    rest();
    recorder.onReceived("\r>");
    auto const& exchanges = recorder.dialogue().exchanges;
    ASSERT_EQ(exchanges.size(), 2U);
    ASSERT_EQ(exchanges[0].chunks.size(), 1U) << "what comes at once stands together";
    EXPECT_GE(exchanges[0].chunks[0].pause, obdsim::Ms(22));
    EXPECT_EQ(exchanges[0].chunks[0].bytes, "ELM327\r\r>");
    ASSERT_EQ(exchanges[1].chunks.size(), 2U);
    EXPECT_LT(exchanges[1].chunks[0].pause, obdsim::Ms(22)) << "the pause before the command is the host's";
    EXPECT_GE(exchanges[1].chunks[1].pause, obdsim::Ms(22));
    EXPECT_EQ(recorder.sentFrom(1), std::vector<std::string>{"ATE0"});
    EXPECT_EQ(recorder.sentFrom(0).size(), 2U);
    EXPECT_TRUE(recorder.sentFrom(2).empty());
}

TEST(DialogueRecorder, tellsProtocolAndHeadersFromTheBytes)
{
    DialogueRecorder recorder;
    recorder.onSent("ATDPN\r");
    recorder.onReceived("ATDPN\rA0\r\r>");
    EXPECT_EQ(recorder.dialogue().protocol, 0);
    EXPECT_EQ(recorder.dialogue().headers, obdsim::DialogueHeaders::Off);
    recorder.onSent("AT H1\r");
    recorder.onReceived("OK\r\r>");
    recorder.onSent("AT DPN\r");
    recorder.onReceived("A7\r\r>");
    EXPECT_EQ(recorder.dialogue().protocol, 7);
    EXPECT_EQ(recorder.dialogue().headers, obdsim::DialogueHeaders::Late);
}

TEST(DialogueRecorder, writesWhatItsReaderReadsBack)
{
    DialogueRecorder recorder;
    recorder.onSent("ATZ\r");
    recorder.onReceived(std::string_view("\0\rELM\\327 \xFC\r\r>", 14));
    recorder.onSent("0100\r");
    recorder.onReceived("SEARCHING...\r");
    obdsim::Dialogue dialogue = recorder.dialogue();
    dialogue.vehicle = "a car";
    dialogue.adapter = "an adapter";
    obdsim::Dialogue const again = obdsim::parseDialogue(obdsim::formatDialogue(dialogue), "recording");
    ASSERT_EQ(again.exchanges.size(), 2U);
    EXPECT_EQ(again.exchanges[0].received(), std::string_view("\0\rELM\\327 \xFC\r\r>", 14));
    EXPECT_EQ(again.exchanges[1].received(), "SEARCHING...\r") << "its prompt never came";
    EXPECT_TRUE(again.raw);
}
