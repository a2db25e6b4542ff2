#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using obdsim::Ms;
using obdsim::Quirk;
using obdsim::Time;

constexpr char const* car = R"(
name = "Car"
protocol = 6
padding = "AA"
[[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 BE 3E A8 17"
"010D" = "41 0D 37"
)";

Conversation clone(Quirk quirk)
{
    return withVehicle(car, "elm327-v1.5", {quirk});
}

TEST(Quirk, namesAreUniqueAndFound)
{
    auto const names = obdsim::quirkNames();
    EXPECT_EQ(names.size(), obdsim::quirkCount);
    EXPECT_EQ(std::set<std::string>(names.begin(), names.end()).size(), names.size());
    for (std::size_t i = 0; i < names.size(); ++i) {
        EXPECT_EQ(obdsim::findQuirk(names[i]), static_cast<Quirk>(i));
    }
    EXPECT_FALSE(obdsim::findQuirk("no-such-quirk"));
}

TEST(Quirk, latePromptComesWithTheNextCommand)
{
    auto host = clone(Quirk::PromptLate);
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK");
    EXPECT_EQ(host.ask("ATH1"), "\r\r>OK\r\r>");
}

TEST(Quirk, slowPromptComesBehindItsReply)
{
    auto host = clone(Quirk::PromptSlow);
    host.peer().receive("ATI\r");
    EXPECT_EQ(host.peer().advanceTo(Ms(100)), "ATI\rELM327 v1.5\r");
    EXPECT_EQ(host.peer().advanceTo(Ms(300)), "\r>");
}

TEST(Quirk, firstCommandOfAConnectionIsLostOrItsPrompt)
{
    auto deaf = clone(Quirk::FirstSwallowed);
    EXPECT_EQ(deaf.ask("ATI"), "ATI\r");
    EXPECT_EQ(deaf.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
    auto mute = clone(Quirk::FirstPromptLost);
    EXPECT_EQ(mute.ask("ATI"), "ATI\rELM327 v1.5\r\r");
    EXPECT_EQ(mute.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
    mute.peer().connect();
    EXPECT_EQ(mute.ask("ATI"), "ATI\rELM327 v1.5\r\r");
}

TEST(Quirk, lineEndsAndPromptsOfClones)
{
    EXPECT_EQ(clone(Quirk::SingleReturn).ask("ATI"), "ATI\rELM327 v1.5\r>");
    EXPECT_EQ(clone(Quirk::DoublePrompt).ask("ATZ"), "ATZ\r\r\rELM327 v1.5\r\r>\r>");
    EXPECT_EQ(clone(Quirk::LinefeedsOn).ask("ATI"), "ATI\r\nELM327 v1.5\r\n\r\n>");
}

TEST(Quirk, bannerWithJunkAndQuestions)
{
    EXPECT_EQ(clone(Quirk::JunkBeforeBanner).ask("ATZ"), "ATZ\r\xFC\r\rELM327 v1.5\r\r>");
    EXPECT_EQ(clone(Quirk::QuestionBeforeBanner).ask("ATZ"), "ATZ\r?\r\r\rELM327 v1.5\r\r>");
    std::string const reply = clone(Quirk::LeftoverQuestions).ask("ATZ");
    EXPECT_EQ(std::count(reply.begin(), reply.end(), '?'), 10);
    EXPECT_EQ(std::count(reply.begin(), reply.end(), '>'), 11);
}

TEST(Quirk, firstCommandOfAConnectionIsStopped)
{
    auto host = clone(Quirk::StoppedFirst);
    EXPECT_EQ(host.ask("ATI"), "ATI\rSTOPPED\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
    host.peer().connect();
    EXPECT_EQ(host.ask("ATI"), "ATI\rSTOPPED\r\r>");
}

TEST(Quirk, radioModuleSpeaksFirst)
{
    EXPECT_EQ(clone(Quirk::Greeting).listen(), "+CONNECTING<<00:00:00:00:00:00\r\n");
}

TEST(Quirk, settingsThatDoNotTake)
{
    EXPECT_EQ(clone(Quirk::EchoStuck).ask({"ATE0", "ATI"}), "ATI\rELM327 v1.5\r\r>");
    EXPECT_EQ(clone(Quirk::EchoKeptOff).ask({"ATE0", "ATD", "ATI"}), "ELM327 v1.5\r\r>");
    EXPECT_EQ(clone(Quirk::HeadersStuck).ask({"ATE0", "ATSP6", "ATH0", "010D"}), "7E8 03 41 0D 37 \r\r>");
    EXPECT_EQ(clone(Quirk::FormattingStuck).ask({"ATE0", "ATSP6", "ATCAF0", "010D"}), "41 0D 37 \r\r>");
}

TEST(Quirk, commandsReadCarelessly)
{
    EXPECT_EQ(clone(Quirk::OkToAll).ask({"ATE0", "ATAMC"}), "OK\r\r>");
    EXPECT_EQ(clone(Quirk::FirstLettersOnly).ask({"ATE0", "ATIXY51"}), "ELM327 v1.5\r\r>");
    EXPECT_EQ(clone(Quirk::NoCountDigit).ask({"ATE0", "ATSP6", "010D1"}), "?\r\r>");
}

TEST(Quirk, framesInOtherForms)
{
    EXPECT_EQ(clone(Quirk::PaddingShown).ask({"ATE0", "ATS0", "ATSP6", "0100"}), "4100BE3EA817AA\r\r>");
    EXPECT_EQ(clone(Quirk::PaddingShown).ask({"ATE0", "ATS0", "ATH1", "ATSP6", "010D"}), "7E803410D37AAAAAAAA\r\r>");
    EXPECT_EQ(clone(Quirk::BytePerLine).ask({"ATE0", "ATSP6", "010D"}), "41\r0D\r37\r\r>");
    EXPECT_EQ(clone(Quirk::FramesTwice).ask({"ATE0", "ATSP6", "010D"}), "41 0D 37 \r41 0D 37 \r\r>");
}

TEST(Quirk, piecesOfAReplyComeApart)
{
    auto host = clone(Quirk::Pieces);
    host.ask("ATE0");
    host.peer().receive("ATI\r");
    std::vector<std::string> pieces;
    Time due = host.peer().now() + Ms(4);
    while (auto const next = host.peer().nextOutput()) {
        EXPECT_EQ(*next, due += Ms(15));
        pieces.push_back(host.peer().advanceTo(*next));
    }
    EXPECT_EQ(pieces, (std::vector<std::string>{"ELM32", "7 v1.", "5\r", "\r", ">"}));
}

TEST(Quirk, searchNotices)
{
    EXPECT_EQ(clone(Quirk::SearchOk).ask({"ATE0", "010D"}), "SEARCHING...\rOK\r41 0D 37 \r\r>");
    auto host = clone(Quirk::TightDescription);
    EXPECT_EQ(host.ask({"ATE0", "010D", "ATDP"}), "AUTO,ISO 15765-4 (CAN 11/500)\r\r>");
    auto first = clone(Quirk::FirstNoData);
    EXPECT_EQ(first.ask({"ATE0", "ATSP6", "010D"}), "NO DATA\r\r>");
    EXPECT_EQ(first.ask("010D"), "41 0D 37 \r\r>");
}

TEST(Quirk, busStartOfClones)
{
    constexpr char const* kLine = R"(
name = "K line"
protocol = 3
[[module]]
id = "11"
[module.raw]
"0100" = "41 00 BE 1F B8 10"
)";
    auto split = withVehicle(kLine, "elm327-v1.5", {Quirk::BusInitSplit, Quirk::InitWithoutDots});
    EXPECT_EQ(split.ask({"ATE0", "ATH1", "ATSP3", "0100"}), "BUS INIT: OK\r");
    split.pass(Ms(1000));
    EXPECT_EQ(split.ask("0100"), "48 6B 11 41 00 BE 1F B8 10 AA \r\r>");
}

} // namespace
