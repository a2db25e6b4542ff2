// Faults beside each other, at the ends of connections, and on a line that takes its time.
#include "simulator/simulatedcar.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

#include <locale>

namespace {

using obdsim::Ms;
using obdsim::Time;

Conversation faultyCar(std::vector<std::string> const& faults)
{
    return simulated("petrol-can11", "elm327-v1.5", faults);
}

TEST(FaultOrder, aPlaceAmongBytesIsNoneAmongCommands)
{
    for (char const* const fault : {"stall@2:5", "slow=0", "garbage=0", "nul=0"}) {
        auto host = faultyCar({fault});
        EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>") << fault;
        EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>") << fault;
    }
    auto nul = faultyCar({"nul=1"});
    std::string twice;
    for (char const each : std::string("ATI\rELM327 v1.5\r\r>")) {
        twice += std::string(1, '\0') + each;
    }
    EXPECT_EQ(nul.ask("ATI"), twice);
    auto byCommand = faultyCar({"prompt@1"});
    byCommand.peer().receive("A");
    EXPECT_EQ(byCommand.peer().nextOutput(), Time(0)) << "the first byte is not late";
}

TEST(FaultOrder, garbageIsAnyByteButNone)
{
    auto host = faultyCar({"garbage=1", "seed=5"});
    std::string garbage;
    for (int i = 0; i < 100; ++i) {
        std::string const reply = host.ask("AT@1");
        for (std::size_t at = 0; at < reply.size(); at += 2) {
            garbage += reply[at];
        }
    }
    EXPECT_EQ(garbage.find('\0'), std::string::npos);
    EXPECT_NE(garbage.find('\x01'), std::string::npos);
    EXPECT_NE(garbage.find('\xFF'), std::string::npos);
}

TEST(FaultOrder, allThatIsSlowAddsUpAndNothingElse)
{
    auto host = faultyCar({"slow=300", "slow=7", "cut@5000", "prompt@90"});
    host.ask({"ATE0", "ATI"});
    EXPECT_EQ(host.lastWait(), Ms(4 + 307));
}

TEST(FaultOrder, theNextOutputIsTheOneThatComesFirst)
{
    auto host = faultyCar({"error:X@2"});
    host.ask("ATE0");
    host.peer().receive("ATI\r");
    EXPECT_EQ(host.peer().nextOutput(), host.peer().now() + Ms(4)) << "though it is not let through";
    EXPECT_EQ(host.peer().advanceTo(host.peer().now() + Ms(19)), "");
    EXPECT_EQ(host.peer().nextOutput(), host.peer().now() + Ms(1));
    EXPECT_EQ(host.listen(), "X\r\r>");
}

TEST(FaultOrder, aReplyWhoseCutIsItsPromptIsTheOnlyOneThatSuffers)
{
    auto host = faultyCar({"cut@24"});
    host.ask("ATE0");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r") << "10 bytes, and 14";
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(FaultOrder, aResetEndsWhatWasWrongBefore)
{
    auto host = faultyCar({"prompt@2", "reset:banner@3"});
    host.ask("ATE0");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r");
    EXPECT_EQ(host.ask("ATI"), "\r\rELM327 v1.5\r\r>") << "with its prompt";
    EXPECT_EQ(faultyCar({"reset@1"}).ask("ATI"), "ATI") << "what was echoed before";
    auto hasty = faultyCar({"reset@2"});
    hasty.ask("ATE0");
    hasty.peer().receive("ATI\r");
    hasty.pass(Ms(10));
    EXPECT_EQ(hasty.ask("ATI"), "\r\rELM327 v1.5\r\r>") << "who asks on hears the banner";
}

TEST(FaultOrder, aSilentAdapterKeepsWhatItHadToSay)
{
    auto host = faultyCar({"silent@2"});
    host.peer().receive("ATI\rATI\r");
    EXPECT_EQ(host.listen(), "ATI\r") << "the rest of its reply is lost";
    host.peer().receive("ATZ\r");
    EXPECT_EQ(host.listen(), "");
}

TEST(FaultOrder, aConnectionBeginsWithNothingOfTheOneBefore)
{
    auto counted = faultyCar({"prompt@2"});
    for (int i = 0; i < 2; ++i) {
        EXPECT_TRUE(counted.ask("ATI").ends_with(">"));
        EXPECT_FALSE(counted.ask("ATI").ends_with(">")) << "the second command of each";
        counted.peer().connect();
    }
    auto cut = faultyCar({"cut@6"});
    cut.peer().receive("ATI\r");
    EXPECT_EQ(cut.peer().advanceTo(Ms(3)), "ATI\r");
    cut.pass(Ms(1));
    cut.peer().receive("AT@1\r");
    cut.peer().connect();
    EXPECT_EQ(cut.ask("ATI"), "ATI\rE") << "cut at the same byte again";
    EXPECT_EQ(cut.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
}

TEST(FaultOrder, faultsThatEndLeaveWhatIsUnderWay)
{
    auto const car = obdsim::simulateCar({});
    Conversation host(car);
    host.ask("ATE0");
    car->control("fault slow=300");
    host.peer().receive("ATI\r");
    host.pass(Ms(10));
    car->control("fault none");
    EXPECT_EQ(host.listen(), "ELM327 v1.5\r\r>");
    car->control("fault silent@1");
    EXPECT_EQ(host.ask("ATI"), "");
    car->control("fault none");
    EXPECT_EQ(host.ask(""), "ELM327 v1.5\r\r>") << "it speaks again, of what it has heard";
    car->control("loss");
    car->control("fault none");
    EXPECT_EQ(host.ask("ATI"), "") << "a link stays broken";
}

TEST(FaultOrder, aProbabilityHasAPoint)
{
    struct Comma : std::numpunct<char>
    {
        char do_decimal_point() const override { return ','; }
    };
    std::locale const before = std::locale::global(std::locale(std::locale::classic(), new Comma));
    auto const plan = obdsim::parseFaults({"garbage=0.25"});
    std::locale::global(before);
    EXPECT_EQ(plan.faults.at(0).probability, 0.25) << "whatever the language";
    try {
        obdsim::parseFaults({"quirk:none"});
        ADD_FAILURE();
    } catch (obdsim::FaultError const& error) {
        std::string const what = error.what();
        EXPECT_TRUE(what.starts_with("fault \"quirk:none\": the quirks are prompt-late, prompt-slow, ")) << what;
        EXPECT_TRUE(what.ends_with("first-swallowed, first-prompt-lost")) << what;
    }
}

TEST(LineOfARate, commandsFollowEachOther)
{
    auto host = simulated("petrol-can11", "elm327-v1.5", {"baud=10000"});
    host.ask("ATE0");
    host.peer().receive("ATI\rAT@1\r");
    Time const start = host.peer().now();
    EXPECT_EQ(host.peer().nextOutput(), start + Ms(4)) << "four characters of a millisecond each";
    EXPECT_EQ(host.peer().advanceTo(start + Ms(22) - Time(1)), "");
    EXPECT_EQ(host.peer().advanceTo(start + Ms(22)), "ELM327 v1.5\r\r>") << "four, four of work, fourteen";
    EXPECT_EQ(host.listen(), "OBDII to RS232 Interpreter\r\r>");
    EXPECT_EQ(host.lastWait(), Ms(29)) << "right behind";
}

TEST(LineOfARate, whatTheLinkHadTakenArrives)
{
    auto host = simulated("petrol-can11", "elm327-v1.5", {"baud=10000", "loss@14"});
    host.ask("ATE0");
    host.peer().receive("ATI\r");
    host.pass(Ms(9));
    EXPECT_TRUE(host.peer().linkIsUp()) << "three bytes are on the line";
    EXPECT_EQ(host.listen(), "ELM");
    EXPECT_FALSE(host.peer().linkIsUp());
}

TEST(LineOfARate, aRecordingHasItToo)
{
    Conversation host(
        obdsim::replay(VELMORA_SOURCE_DIR "/tests/dialogues/kwpfast-van-2005-stn.dialogue", {"baud=10000"}));
    host.ask({"ATE0", "ATSP6"});
    EXPECT_GE(host.lastWait(), Ms(6 + 4 + 5));
}

} // namespace
