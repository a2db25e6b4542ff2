#include "simulator/dialogue.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>

namespace {

using obdsim::Dialogue;
using obdsim::DialogueError;
using obdsim::DialogueHeaders;
using obdsim::Ms;
using obdsim::parseDialogue;
using obdsim::Time;

std::string const head = "vehicle: car\nadapter: ELM327 v2.3\nprotocol: 5\nheaders: on\n\n";

TEST(Dialogue, isReadWithEscapesAndPauses)
{
    Dialogue const dialogue =
        parseDialogue("# a comment\n" + head +
                          "-> ATZ\n<- ATZ\\r\\r\\xFCELM327 v2.3\\r\\r>\n"
                          "# between\n->\n<- SEARCHING...\\r\n<- OK\\r\n.. 800\n<- 86\\x20\\r\\r>\n",
                      "a.dialogue");
    EXPECT_EQ(dialogue.vehicle, "car");
    EXPECT_EQ(dialogue.adapter, "ELM327 v2.3");
    EXPECT_EQ(dialogue.protocol, 5);
    EXPECT_EQ(dialogue.headers, DialogueHeaders::On);
    EXPECT_FALSE(dialogue.raw);
    ASSERT_EQ(dialogue.exchanges.size(), 2U);
    EXPECT_EQ(dialogue.exchanges[0].sent, "ATZ");
    EXPECT_EQ(dialogue.exchanges[0].received(), "ATZ\r\r\xFC"
                                                "ELM327 v2.3\r\r>");
    EXPECT_EQ(dialogue.exchanges[1].sent, "");
    ASSERT_EQ(dialogue.exchanges[1].chunks.size(), 2U);
    EXPECT_EQ(dialogue.exchanges[1].chunks[0].bytes, "SEARCHING...\rOK\r");
    EXPECT_EQ(dialogue.exchanges[1].chunks[1].pause, Ms(800));
    EXPECT_EQ(dialogue.exchanges[1].chunks[1].bytes, "86 \r\r>");
}

struct ErrorCase
{
    std::string text;
    char const* error;
};

TEST(Dialogue, malformedFileIsToldWithItsLine)
{
    ErrorCase const cases[] = {
        {"", "a.dialogue:0: the header has no end"},
        {"vehicle: car\n", "a.dialogue:1: the header has no end"},
        {"vehicle car\n", "a.dialogue:1: a header line is"},
        {"colour: red\n", "a.dialogue:1: unknown header \"colour\""},
        {"protocol: 10\n", "a.dialogue:1: the protocol is"},
        {"protocol: A\n", "a.dialogue:1: the protocol is"},
        {"headers: some\n", "a.dialogue:1: headers are"},
        {"raw: maybe\n", "a.dialogue:1: raw is"},
        {head + "ATZ\n", "a.dialogue:6: a line begins with"},
        {head + "->ATZ\n", "a.dialogue:6: a line begins with"},
        {head + "<- OK\n", "a.dialogue:6: bytes are received before"},
        {head + "-> ATZ\n<- \\q\n", "a.dialogue:7: wrong escape"},
        {head + "-> ATZ\n<- \\x4\n", "a.dialogue:7: wrong escape"},
        {head + "-> ATZ\n<- OK\\", "a.dialogue:7: wrong escape"},
        {head + "-> ATZ\n.. soon\n", "a.dialogue:7: a pause is"},
        {head + "-> ATZ\n.. -5\n", "a.dialogue:7: a pause is"},
        {head + "-> ATZ\n.. 5\n", "a.dialogue:7: no received line follows"},
        {head + "-> ATZ\n.. 5\n-> ATI\n", "a.dialogue:8: no received line follows"},
    };
    for (auto const& row : cases) {
        try {
            parseDialogue(row.text, "a.dialogue");
            ADD_FAILURE() << row.text;
        } catch (DialogueError const& error) {
            EXPECT_EQ(std::string(error.what()).substr(0, std::string(row.error).size()), row.error);
        }
    }
    EXPECT_THROW(obdsim::loadDialogue("/no/such/file"), DialogueError);
    EXPECT_THROW(obdsim::loadDialogue(testing::TempDir()), DialogueError);
}

TEST(Dialogue, isWrittenInTheFormThatIsRead)
{
    Dialogue dialogue;
    dialogue.vehicle = "car";
    dialogue.adapter = "ELM327 v1.5";
    dialogue.protocol = 6;
    dialogue.headers = DialogueHeaders::Late;
    dialogue.raw = true;
    dialogue.exchanges = {{"ATI", {{Time(0), "ELM327 v1.5\r\r>"}}},
                          {"", {{Time(0), "A \\\t"}, {Ms(12), std::string(" \0\xFF\n>", 5)}}}};
    std::string const text = obdsim::formatDialogue(dialogue, {"how it came"});
    EXPECT_EQ(text, "# how it came\nvehicle: car\nadapter: ELM327 v1.5\nprotocol: 6\nheaders: late\nraw: yes\n\n"
                    "-> ATI\n<- ELM327 v1.5\\r\\r>\n->\n<- A \\\\\\t\n.. 12\n<- \\x20\\x00\\xFF\\n>\n");
    EXPECT_EQ(obdsim::formatDialogue(parseDialogue(text, "x"), {"how it came"}), text);
}

TEST(Dialogue, everyRecordedOneIsReadAndWrittenBack)
{
    int count = 0;
    for (auto const& file : std::filesystem::directory_iterator(VELMORA_SOURCE_DIR "/tests/dialogues")) {
        if (file.path().extension() != ".dialogue") {
            continue;
        }
        ++count;
        Dialogue const dialogue = obdsim::loadDialogue(file.path());
        EXPECT_FALSE(dialogue.exchanges.empty()) << file.path();
        Dialogue const again = parseDialogue(obdsim::formatDialogue(dialogue), "again");
        ASSERT_EQ(again.exchanges.size(), dialogue.exchanges.size()) << file.path();
        for (std::size_t i = 0; i < again.exchanges.size(); ++i) {
            EXPECT_EQ(again.exchanges[i].sent, dialogue.exchanges[i].sent) << file.path();
            EXPECT_EQ(again.exchanges[i].received(), dialogue.exchanges[i].received()) << file.path();
        }
    }
    EXPECT_GT(count, 80);
}

TEST(Dialogue, whatItsHeaderLeavesOutIsNotKnown)
{
    Dialogue const dialogue = parseDialogue("vehicle: car\n\n-> ATZ\n.. 86400000\n<- \\t\\n\\\\\n", "a.dialogue");
    EXPECT_EQ(dialogue.protocol, 0);
    EXPECT_EQ(dialogue.adapter, "");
    EXPECT_FALSE(dialogue.raw);
    EXPECT_EQ(dialogue.exchanges[0].chunks[0].pause, Ms(86400000)) << "a day";
    EXPECT_EQ(dialogue.exchanges[0].received(), "\t\n\\");
    EXPECT_THROW(parseDialogue("vehicle: car\n\n-> ATZ\n.. 86400001\n<- OK\n", "x"), DialogueError);
}

TEST(Dialogue, blankLinesReturnsAndPausesMayBeMany)
{
    Dialogue const dialogue =
        parseDialogue("\n\n# first\nvehicle: car\r\nadapter: x\r\nprotocol: 9\r\nraw: no\r\n\r\n\n"
                      "-> ATZ\r\n.. 5\n\n# on\n.. 7\n<- OK\n.. 0\n<- >\n",
                      "x");
    EXPECT_EQ(dialogue.protocol, 9);
    EXPECT_EQ(dialogue.exchanges.at(0).sent, "ATZ");
    ASSERT_EQ(dialogue.exchanges[0].chunks.size(), 1U);
    EXPECT_EQ(dialogue.exchanges[0].chunks[0].pause, Ms(12));
    EXPECT_EQ(dialogue.exchanges[0].chunks[0].bytes, "OK>");
    EXPECT_EQ(parseDialogue("protocol: 0\n\n", "x").protocol, 0);
    EXPECT_TRUE(parseDialogue("vehicle: a: b\n\n", "x").exchanges.empty());
    EXPECT_EQ(parseDialogue("vehicle: a: b\n\n", "x").vehicle, "a: b");
    EXPECT_EQ(parseDialogue(head + "->\n<-\n<- \n<- a\n", "x").exchanges[0].received(), "a");
}

TEST(Dialogue, aLineThatIsTooShortIsNone)
{
    for (char const* const line :
         {"x", "-", "<", "--", "-< x", "<> x", ".x 5", "->x", "<-x", "..5", "-> ATZ\n..", "-> ATZ\n.. ",
          "-> ATZ\n.. 0000000005\n<- x", "-> ATZ\n.. 1234567890\n<- x", "-> ATZ\n.. 5x\n<- x", "-> ATZ\n<- \\x4",
          "-> ATZ\n<- \\xG0", "-> ATZ\n<- \\x4G", "-> \\"}) {
        EXPECT_THROW(parseDialogue(head + line + "\n", "x"), DialogueError) << line;
    }
    for (char const* const header : {"protocol: /\n\n", "protocol: :\n\n", "protocol: \n\n", "protocol: 66\n\n",
                                     "raw: \n\n", "headers: \n\n", "vehicle:car\n\n"}) {
        EXPECT_THROW(parseDialogue(header, "x"), DialogueError) << header;
    }
}

TEST(Dialogue, repliesAreWrittenLineByLine)
{
    Dialogue dialogue;
    dialogue.exchanges = {{" A ", {{Time(0), "\r\rA\r\nB\r>C"}, {Ms(1), ">"}, {Ms(2), "~\x7F!"}}}};
    std::string const text = obdsim::formatDialogue(dialogue);
    EXPECT_EQ(text, "vehicle: \nadapter: \nprotocol: 0\nheaders: off\n\n"
                    "-> \\x20A\\x20\n<- \\r\\rA\\r\\n\n<- B\\r>\n<- C\n.. 1\n<- >\n.. 2\n<- ~\\x7F!\n");
    dialogue.headers = DialogueHeaders::On;
    EXPECT_NE(obdsim::formatDialogue(dialogue).find("\nheaders: on\n\n"), std::string::npos);
}

} // namespace
