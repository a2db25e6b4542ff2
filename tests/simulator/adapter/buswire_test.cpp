// What passes on the wire between an adapter and a car, to the microsecond: who is heard, when, and how long for.
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;
using obdsim::Time;
using std::chrono::microseconds;

std::string carOn(int protocol, std::string const& modules)
{
    return "name = \"Car\"\nprotocol = " + std::to_string(protocol) + "\n" + modules;
}

std::string module(std::string const& id, std::string const& rest)
{
    return "[[module]]\nid = \"" + id + "\"\n" + rest;
}

/// A host that has chosen the protocol, without echo and blanks.
Conversation onBus(int protocol, std::string const& modules, std::vector<char const*> const& commands = {},
                   std::string const& adapter = "elm327-v2.3")
{
    auto host = withVehicle(carOn(protocol, modules), adapter);
    std::string const choice = "ATSP" + std::to_string(protocol);
    host.ask({"ATE0", "ATS0", choice.c_str()});
    for (char const* const command : commands) {
        host.ask(std::string(command));
    }
    return host;
}

std::string const raw =
    "raw = { \"0100\" = \"41 00 BE 1F B8 10\", \"010D\" = \"41 0D 37\", \"010C\" = \"41 0C 1A F8\" }\n";

TEST(BusWire, aRequestAndItsReplyTakeTheirBytes)
{
    constexpr int p4 = 5200; // between the bytes of an adapter on a K line
    struct Bus
    {
        int protocol;
        int request; // microseconds: header, two bytes, check byte
        int reply;   // header, four bytes, check byte
    };
    for (auto const& each : {Bus{1, 6 * 192, 8 * 192}, Bus{2, 6 * 769, 8 * 769}, Bus{3, 6 * 962 + 5 * p4, 8 * 962},
                             Bus{4, 6 * 962 + 5 * p4, 8 * 962}, Bus{5, 6 * 962 + 5 * p4, 8 * 962}}) {
        auto host = onBus(each.protocol, module("10", "latency = 40\n" + raw), {"0100"});
        host.pass(Ms(1000));
        EXPECT_EQ(host.ask("010C1"), "410C1AF8\r\r>");
        EXPECT_EQ(host.lastWait(), Ms(4 + 40) + microseconds(each.request + each.reply)) << each.protocol;
    }
}

TEST(BusWire, aLineIsFreeSomeTimeBehindItsLastByte)
{
    auto host = onBus(5, module("10", "latency = 40\n" + raw), {"0100"});
    host.pass(Ms(1000));
    host.ask("010C1");
    Time const alone = host.lastWait();
    host.pass(Ms(9));
    host.ask("010C1");
    EXPECT_EQ(host.lastWait() - alone, Ms(59 - 10 - 4)) << "P3 has begun with the reply, a millisecond before";
    host.pass(Ms(58 - 4));
    host.ask("010C1");
    EXPECT_EQ(host.lastWait(), alone);
    host.pass(Ms(57 - 4));
    host.ask("010C1");
    EXPECT_EQ(host.lastWait() - alone, Ms(1));
}

TEST(BusWire, aReplyAtTheEndOfTheTimeIsHeard)
{
    auto const ask = [](char const* timeout) {
        return onBus(3, module("10", "latency = 406\n" + raw), {"ATSI", "ATAT0", timeout}).ask("010C");
    };
    EXPECT_EQ(ask("ATST65"), "410C1AF8\r\r>") << "413.696 ms";
    EXPECT_EQ(ask("ATST64"), "NO DATA\r\r>");
}

TEST(BusWire, modulesThatAreEquallyFastAnswerInTheirOrder)
{
    auto host = onBus(6, module("7E9", raw) + module("7E8", raw) + module("7EA", raw), {"ATH1"});
    EXPECT_EQ(host.ask("010D"), "7E903410D3700000000\r7E803410D3700000000\r7EA03410D3700000000\r\r>");
    auto line = onBus(5, module("12", raw) + module("11", raw), {"ATH1", "0100"});
    EXPECT_EQ(line.ask("010D"), "83F112410D370B\r83F111410D370A\r\r>");
}

TEST(BusWire, eachFrameOfAMessageHasItsGap)
{
    for (auto const& [protocol, id, first, next] : {std::tuple{6, "7E8", 222 + 2000 + 222 + 2 * 2000, 222 + 2000},
                                                    {9, "18DAF110", 524 + 3000 + 524 + 2 * 3000, 524 + 3000},
                                                    {2, "10", 20000 + 11 * 769, 20000 + 11 * 769}}) {
        auto host = onBus(protocol, module(id, "latency = 4\n[module.info]\nvin = \"WDX-SIM0019212345\"\n"),
                          {"ATH1", "ATAT0", "0902"});
        Time before{};
        for (auto const& [request, gap] : {std::pair{"09021", 0}, {"09022", first}, {"09023", next}}) {
            host.pass(Ms(500));
            host.ask(request);
            EXPECT_TRUE(gap == 0 || host.lastWait() - before == microseconds(gap)) << protocol << " " << request;
            before = host.lastWait();
        }
    }
    auto own = onBus(6, module("7E8", "latency = 4\nframe_gap = 7\n[module.info]\nvin = \"WDX-SIM0019212345\"\n"),
                     {"ATAT0", "09022"});
    Time const second = own.lastWait();
    own.pass(Ms(500));
    own.ask("09023");
    EXPECT_EQ(own.lastWait() - second, Ms(7) + microseconds(222));
}

TEST(BusWire, filterAndMaskCountAlone)
{
    std::string const two = module("7E8", raw) + module("7E9", raw);
    EXPECT_EQ(onBus(6, two, {"ATH1", "ATCF7E9"}).ask("010D"), "7E903410D3700000000\r\r>") << "each bit counts";
    EXPECT_EQ(onBus(6, two, {"ATH1", "ATCM001"}).ask("010D"), "7E803410D3700000000\r\r>") << "a bit that is 0";
    EXPECT_EQ(onBus(6, two, {"ATH1", "ATCM000"}).ask("010D"), "7E803410D3700000000\r7E903410D3700000000\r\r>");
    EXPECT_EQ(onBus(6, module("7BB", raw), {"ATH1"}).ask("010D"), "NO DATA\r\r>") << "no module of OBD";
    EXPECT_EQ(onBus(7, module("18DAF1FE", raw), {"ATH1"}).ask("010D"), "18DAF1FE03410D3700000000\r\r>");
    EXPECT_EQ(onBus(7, module("18DBF1FE", raw), {"ATH1"}).ask("010D"), "NO DATA\r\r>");
}

TEST(BusWire, headersOfOtherBusesReachNobody)
{
    std::string const two = module("18DAF110", raw) + module("18DAF118", raw);
    EXPECT_EQ(onBus(7, two, {"ATH1", "ATSHDA18F1"}).ask("010D"), "18DAF11803410D3700000000\r\r>")
        << "18 stands in front";
    EXPECT_EQ(onBus(7, two, {"ATH1", "ATSHDA18F1", "ATCP10"}).ask("010D"), "NO DATA\r\r>");
    EXPECT_EQ(onBus(7, two, {"ATH1", "ATSH18DA10F1"}).ask("010D"), "18DAF11003410D3700000000\r\r>");
    EXPECT_EQ(onBus(7, two, {"ATSH7E0"}).ask("010D"), "NO DATA\r\r>");
    EXPECT_EQ(onBus(6, module("7E8", raw), {"ATSH18DB33F1"}).ask("010D"), "NO DATA\r\r>");
    EXPECT_EQ(onBus(5, module("10", raw), {"0100", "ATSH18DB33F1"}).ask("010D"), "NO DATA\r\r>");
}

TEST(BusWire, whatIsForCanAloneLeavesALineAsItIs)
{
    auto host = onBus(5, module("10", raw), {"0100"});
    EXPECT_EQ(host.ask({"ATCAF0", "010D"}), "410D37\r\r>") << "there are no PCI bytes";
    EXPECT_EQ(host.ask({"ATCEA07", "010D"}), "410D37\r\r>") << "nor extended addresses";
}

std::string const patient =
    "latency = 10\nraw = { \"010D\" = \"41 0D 37\", \"0904\" = \"49 04 00\", \"0100\" = \"41 00 BE 1F B8 10\" }\n"
    "[module.delays]\n\"0904\" = { times = 1, milliseconds = 3000 }\n";

TEST(BusWire, patienceIsKnownToTheNewerChipsOnCanAndKwp)
{
    for (auto const& [protocol, adapter, last] : {std::tuple{6, "elm327-v2.3", "0349040000000000"},
                                                  {6, "elm327-v1.4", "037F097800000000"},
                                                  {5, "elm327-v2.3", "490400"},
                                                  {5, "elm327-v1.4", "7F0978"},
                                                  {3, "elm327-v2.3", "7F0978"}}) {
        auto host = onBus(protocol, module(protocol == 6 ? "7E8" : "10", patient), {"ATCAF0"}, adapter);
        host.ask(protocol == 6 ? "020100" : "0100");
        std::string const reply = host.ask(protocol == 6 ? "020904" : "0904");
        EXPECT_TRUE(reply.ends_with(std::string(last) + "\r\r>")) << protocol << adapter << reply;
    }
    auto const plain = carOn(6, module("7E8", patient));
    auto host = withVehicle("padding = \"none\"\n" + plain, "elm327-v2.3");
    EXPECT_EQ(host.ask({"ATE0", "ATS0", "ATSP6", "0904"}), "7F0978\r490400\r\r>") << "without padding, too";
    auto latest = obdsim::AdapterProfile(*obdsim::findProfile("elm327-v2.3"));
    latest.level = 210;
    Conversation first(
        std::make_shared<obdsim::Adapter>(latest, std::make_shared<obdsim::Vehicle>(obdsim::parseVehicle(plain, "x"))));
    EXPECT_EQ(first.ask({"ATE0", "ATS0", "ATSP6", "0904"}), "7F0978\r490400\r\r>") << "v2.1 brought it";
}

TEST(BusWire, whatAModuleTookLongForIsNotWhatItUsuallyTakes)
{
    auto host = onBus(6, module("7E8", patient), {"0904"});
    host.ask("010D");
    Time const wait = microseconds((10000 + 222) * 3 / 2);
    EXPECT_EQ(host.lastWait(), Ms(4 + 10) + 2 * microseconds(222) + wait) << "ten milliseconds, as learnt";
}

TEST(BusWire, theTimeOfAFurtherMessageCountsFromTheOneBefore)
{
    auto host = onBus(
        3,
        module("10",
               "latency = 40\nraw = { \"0100\" = [\"41 00 BE 1F\", \"41 00 BE 1F\"], \"010D\" = \"41 0D 37\" }\n"),
        {"0100"});
    host.pass(Ms(500));
    host.ask("010D");
    Time const request = microseconds(6 * 962 + 5 * 5200);
    Time const slowest = Ms(40) + microseconds(8 * 962);
    EXPECT_EQ(host.lastWait(), Ms(4 + 40) + request + microseconds(7 * 962) + slowest * 3 / 2);
}

TEST(BusWire, nothingIsLearntOfSilence)
{
    std::string const two = module("7E8", "latency = 4\n" + raw) + module("7E9", "latency = 58\n" + raw);
    auto host = onBus(6, two, {"ATH1"});
    EXPECT_EQ(host.ask("015C"), "NO DATA\r\r>");
    EXPECT_EQ(host.ask("010D"), "7E803410D3700000000\r7E903410D3700000000\r\r>");
}

TEST(BusWire, theRestOfAMessageIsAwaitedNoLongerThanItIsMissing)
{
    std::string const vin = "[module.info]\nvin = \"WDX-SIM0019212345\"\n";
    auto host = onBus(6, module("7E8", "latency = 4\nframe_gap = 0\nraw = { \"010D\" = \"41 0D 37\" }\n" + vin),
                      {"ATH1", "010D", "0902"});
    EXPECT_EQ(host.lastWait(), Ms(4 + 4) + 5 * microseconds(222) + microseconds((4000 + 222) * 3 / 2))
        << "two more frames and the one of flow control";
}

} // namespace
