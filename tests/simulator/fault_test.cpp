#include "simulator/fault.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::FaultError;
using obdsim::FaultKind;
using obdsim::Ms;
using obdsim::parseFaults;
using obdsim::Time;

Conversation faulty(std::vector<std::string> const& faults)
{
    return simulated("petrol-can11", "elm327-v1.5", faults);
}

TEST(Fault, textsAreRead)
{
    auto const plan = parseFaults({"garbage=0.25", "nul=1", "cut@120", "stall@80:500", "slow=30", "loss@99",
                                   "error:BUS BUSY@3", "error:CAN ERROR=0.5", "prompt@2", "prompt=0.1", "echo",
                                   "quirk:prompt-late", "seed=7", "silent@4", "reset@5", "reset:LV RESET@6"});
    ASSERT_EQ(plan.faults.size(), 13U);
    EXPECT_EQ(plan.faults[0].kind, FaultKind::Garbage);
    EXPECT_EQ(plan.faults[0].probability, 0.25);
    EXPECT_EQ(plan.faults[2].kind, FaultKind::Cut);
    EXPECT_EQ(plan.faults[2].position, 120U);
    EXPECT_EQ(plan.faults[3].duration, Ms(500));
    EXPECT_EQ(plan.faults[4].duration, Ms(30));
    EXPECT_EQ(plan.faults[6].word, "BUS BUSY");
    EXPECT_EQ(plan.faults[6].position, 3U);
    EXPECT_EQ(plan.faults[7].probability, 0.5);
    EXPECT_EQ(plan.faults[10].kind, FaultKind::Silent);
    EXPECT_EQ(plan.faults[10].position, 4U);
    EXPECT_EQ(plan.faults[11].kind, FaultKind::Reset);
    EXPECT_EQ(plan.faults[11].word, "");
    EXPECT_EQ(plan.faults[12].word, "LV RESET");
    EXPECT_EQ(plan.faults[12].position, 6U);
    EXPECT_TRUE(plan.quirks.has(obdsim::Quirk::EchoStuck));
    EXPECT_TRUE(plan.quirks.has(obdsim::Quirk::PromptLate));
    EXPECT_EQ(plan.seed, 7U);
    EXPECT_TRUE(parseFaults({"echo"}).empty());
    auto const ends = parseFaults(
        {"garbage=0", "nul=1", "baud=300", "seed=999999999", "command=0", "wait=7", "cut@1", "error:X@1", "stall@1:0"});
    EXPECT_EQ(ends.faults[0].probability, 0);
    EXPECT_EQ(ends.faults[1].probability, 1);
    EXPECT_EQ(ends.faults[2].position, 1U);
    EXPECT_EQ(ends.faults[3].word, "X");
    EXPECT_EQ(ends.faults[4].duration, Ms(0));
    EXPECT_EQ(ends.baud, 300);
    EXPECT_EQ(ends.seed, 999999999U);
    EXPECT_EQ(ends.command, Ms(0));
    EXPECT_EQ(ends.wait, Ms(7));
    EXPECT_EQ(parseFaults({"baud=4000000"}).baud, 4000000);
    EXPECT_EQ(parseFaults({}).seed, 1U);
}

TEST(Fault, wrongTextIsToldWithTheFormsThereAre)
{
    for (char const* text :
         {"",          "garbage",        "garbage=",    "garbage=2",       "garbage=-1",  "garbage=x",
          "garbage@5", "cut=3",          "cut@0",       "cut@x",           "cut@5:3",     "stall@5",
          "stall=5",   "stall@5:x",      "slow=x",      "slow@5",          "loss=3",      "error@3",
          "error:@3",  "error:BUS BUSY", "error:X@",    "quirk:none",      "silent",      "silent=1",
          "silent@0",  "reset",          "reset:@3",    "reset:X",         "reset=1",     "seed=x",
          "baud=9",    "baud",           "wait=x",      "command=",        "fire=1",      "prompt",
          "cut=0.5",   "loss=0.5",       "silent=0",    "reset:X=0.5",     "slow@5:3",    "nul@5",
          "nul@5:3",   "prompt@2:5",     "error:X@3:5", "garbage=0.5x",    "stall=0.5",   "stall@5:",
          "baud=299",  "baud=4000001",   "baud=300x",   "seed=1234567890", "command=1.5", "garbage=1.01",
          "loss@",     "loss@-1"}) {
        try {
            parseFaults({text});
            ADD_FAILURE() << text;
        } catch (FaultError const& error) {
            std::string const what = error.what();
            EXPECT_EQ(what.find("fault \"" + std::string(text) + "\": "), 0U) << what;
        }
    }
}

TEST(FaultyPeer, sameSeedGivesTheSameGarbage)
{
    auto const run = [](char const* seed) {
        auto host = faulty({"garbage=0.05", "nul=0.02", seed});
        return host.ask("ATZ") + host.ask("ATE0") + host.ask("0100") + host.ask("0902");
    };
    std::string const first = run("seed=3");
    EXPECT_EQ(first, run("seed=3"));
    EXPECT_NE(first, run("seed=4"));
    EXPECT_NE(first.find('\0'), std::string::npos);
}

TEST(FaultyPeer, promptIsLostInOneReply)
{
    auto host = faulty({"prompt@2"});
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(FaultyPeer, replyIsCutAtAByte)
{
    auto host = faulty({"cut@14"});
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>") << "10 bytes";
    EXPECT_EQ(host.ask("ATI"), "ELM");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(FaultyPeer, outputStallsBeforeAByte)
{
    auto host = faulty({"stall@14:700"});
    host.ask("ATE0");
    host.peer().receive("ATI\r");
    Time const start = host.peer().now();
    EXPECT_EQ(host.peer().advanceTo(start + Ms(600)), "ELM");
    EXPECT_EQ(host.peer().advanceTo(start + Ms(704)), "327 v1.5\r\r>");
    host.ask("ATI");
    EXPECT_EQ(host.lastWait(), Ms(4)) << "one pause";
}

TEST(FaultyPeer, slowAdapterAnswersLater)
{
    auto host = faulty({"slow=300"});
    host.ask("ATE0");
    host.ask("ATI");
    EXPECT_EQ(host.lastWait(), Ms(304));
}

TEST(FaultyPeer, errorWordTakesThePlaceOfAReply)
{
    auto host = faulty({"error:BUS BUSY@3"});
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0100").substr(0, 13), "SEARCHING...\r");
    Time const start = host.peer().now();
    host.peer().receive("0100\r");
    EXPECT_EQ(host.peer().advanceTo(start + Ms(19)), "");
    EXPECT_EQ(host.peer().advanceTo(start + Ms(20)), "BUS BUSY\r\r>");
    host.listen();
    EXPECT_EQ(host.ask("0100").substr(0, 5), "41 00");
}

TEST(FaultyPeer, errorWordFollowsTheEcho)
{
    auto host = faulty({"error:STOPPED@1"});
    EXPECT_EQ(host.ask("ATI"), "ATI\rSTOPPED\r\r>");
}

TEST(FaultyPeer, linkBreaksAndANewClientHasItAgain)
{
    auto host = faulty({"loss@14"});
    host.ask("ATE0");
    EXPECT_TRUE(host.peer().linkIsUp());
    EXPECT_EQ(host.ask("ATI"), "ELM");
    EXPECT_FALSE(host.peer().linkIsUp());
    EXPECT_EQ(host.ask("ATI"), "");
    host.peer().connect();
    EXPECT_TRUE(host.peer().linkIsUp());
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r") << "and loses it at the same byte";
}

TEST(FaultyPeer, adapterFallsSilentAndSpeaksAgainToANewClient)
{
    auto host = faulty({"silent@3"});
    EXPECT_EQ(host.ask("ATE0"), "ATE0\rOK\r\r>");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
    EXPECT_EQ(host.ask("ATI"), "");
    EXPECT_EQ(host.ask("ATI"), "");
    host.peer().connect();
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
    EXPECT_EQ(faulty({"silent@1"}).ask("ATI"), "ATI") << "what was echoed before";
}

TEST(FaultyPeer, adapterStartsAnewInPlaceOfAReply)
{
    struct Row
    {
        char const* fault;
        char const* said;
    };
    for (auto const& row : {Row{"reset@3", ""}, Row{"reset:LV RESET@3", "LV RESET\r\r>"},
                            Row{"reset:banner@3", "\r\rELM327 v1.5\r\r>"}}) {
        auto host = faulty({row.fault});
        host.ask({"ATE0", "ATH1"});
        EXPECT_EQ(host.ask("0100"), row.said) << row.fault;
        EXPECT_EQ(host.ask("ATI"), "ATI\rELM327 v1.5\r\r>") << "the echo is on again";
        EXPECT_EQ(host.ask("0100"), "0100\rSEARCHING...\r41 00 BE 3F B8 13 \r41 00 88 18 00 11 \r\r>");
    }
}

TEST(FaultyPeer, echoStaysOn)
{
    auto host = faulty({"echo"});
    EXPECT_EQ(host.ask({"ATE0", "ATI"}), "ATI\rELM327 v1.5\r\r>");
}

TEST(FaultyPeer, replayHasFaultsToo)
{
    Conversation host(obdsim::replay(VELMORA_SOURCE_DIR "/tests/dialogues/kwpfast-van-2005-stn.dialogue",
                                     {"error:NO DATA@2", "quirk:echo-stuck"}));
    host.ask("ATE0");
    EXPECT_EQ(host.ask("0100"), "0100\rNO DATA\r\r>");
}

TEST(Simulation, wrongNamesAreTold)
{
    EXPECT_THROW(obdsim::simulate({"no-such-car", "elm327-v1.5", {}}), obdsim::SimulatorError);
    try {
        obdsim::simulate({"petrol-can11", "no-such-adapter", {}});
        ADD_FAILURE();
    } catch (obdsim::SimulatorError const& error) {
        std::string const begin =
            "no adapter \"no-such-adapter\"; the adapters are elm327-v1.5, elm327-v1.2, elm327-v1.3a, elm327-v1.4, ";
        EXPECT_EQ(std::string(error.what()).substr(0, begin.size()), begin);
        EXPECT_TRUE(std::string(error.what()).ends_with(", unknown, silent")) << error.what();
    }
    EXPECT_THROW(obdsim::simulate({"petrol-can11", "elm327-v1.5", {"fire=1"}}), obdsim::SimulatorError);
    EXPECT_THROW(obdsim::replay("/no/such/file"), obdsim::SimulatorError);
}

TEST(FaultyPeer, cutReplyIsLostToItsPromptAndNoFurther)
{
    std::string questions;
    for (int i = 0; i < 10; ++i) {
        questions += "?\r\r>";
    }
    EXPECT_EQ(faulty({"quirk:leftover-questions", "cut@3"}).ask("ATZ"), "AT" + questions);
}

TEST(FaultyPeer, whatWasUnderWayIsLostWithTheConnection)
{
    auto host = faulty({"slow=300"});
    host.ask("ATE0");
    host.peer().receive("ATI\r");
    EXPECT_EQ((host.pass(Ms(10)), host.peer().nextOutput().has_value()), true);
    host.peer().connect();
    EXPECT_EQ(host.listen(), "");
    EXPECT_EQ(host.ask("ATI"), "ELM327 v1.5\r\r>");
}

} // namespace
