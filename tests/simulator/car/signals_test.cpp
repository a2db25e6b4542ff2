// Data beyond OBD: services 22, 21, 1A and 19, modules with identifiers of their own, and what an adapter needs to be
// told to reach them.
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

namespace {

using obdsim::Ms;

Conversation reached(std::string const& vehicle, std::initializer_list<char const*> commands,
                     std::string const& adapter = "elm327-v2.3")
{
    auto host = simulated(vehicle, adapter);
    host.ask({"ATE0", "ATS0", "ATSP6", "0100"});
    host.ask(commands);
    return host;
}

TEST(Service22, tellsIdentifiersTogetherAndRefusesByCode)
{
    auto host = reached("petrol-can11-modules", {"ATH1", "ATSH7E1"});
    std::string const oil = host.ask("221E1C");
    ASSERT_EQ(oil.size(), 3 + 16 + 3U) << oil;
    EXPECT_EQ(oil.substr(0, 11), "7E905621E1C");
    EXPECT_EQ(host.ask("221E301"), "7E9037F223100000000\r\r>");
    EXPECT_EQ(host.ask("221E311"), "7E9037F223300000000\r\r>");
    EXPECT_EQ(host.ask("22AAAA1"), "7E9037F223100000000\r\r>");
    EXPECT_EQ(host.ask("2101"), "7E9037F211100000000\r\r>") << "the service is not there";
    EXPECT_EQ(host.ask("221E20AAAA1E1C").substr(0, 11), "7E91008621E");
    EXPECT_EQ(host.ask("22F4001"), "7E9037F223100000000\r\r>") << "no PID of service 01";
    host.ask("ATSH7E0");
    EXPECT_EQ(host.ask("22F41C1"), "7E80462F41C06000000\r\r>") << "F4xx is PID xx";
    EXPECT_EQ(host.ask("22F190AA1"), "7E8037F221300000000\r\r>") << "half an identifier";
    EXPECT_EQ(host.ask("22F190").substr(0, 19), "7E8101462F19056454C");
    EXPECT_EQ(host.ask("3E001"), "7E8027E000000000000\r\r>");
    EXPECT_EQ(host.ask("3E80"), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATSH7DF", "22AAAA"}), "NO DATA\r\r>") << "nobody refuses what all were asked";
}

TEST(Service22, answersAreLateOrAnnouncedTwice)
{
    auto host = reached("petrol-can11-modules", {"ATSH7E1", "ATH1"});
    EXPECT_EQ(host.ask("221E20"), "7E9037F227800000000\r7E9037F227800000000\r7E904621E2001000000\r\r>");
    EXPECT_EQ(host.ask("221E21"), "NO DATA\r\r>");
    host.pass(Ms(500));
    EXPECT_EQ(host.ask("221E1C2").substr(0, 20), "7E904621E2102000000\r") << "the late answer comes first";
}

TEST(Service21, numbersBeyondAFieldAreCutToIt)
{
    auto host = withVehicle(R"(
name = "Car"
protocol = 6
[[module]]
id = "7E8"
[[module.signals]]
request = "2101"
data = "AA 00 00 00 00 AA"
fields = [{ at = 1, bytes = 2, value = "speed", offset = -100000 }, { at = 3, value = "speed", offset = 300 },
          { at = 4, value = "speed", offset = -1 }]
)");
    EXPECT_EQ(host.ask({"ATE0", "ATS0", "ATSP6", "ATSH7E0", "2101"}), "008\r0:6101AA8000FF\r1:FFAA0000000000\r\r>");
}

TEST(Services21And1A, tellLocalIdentifiers)
{
    auto host = reached("petrol-can11-modules", {"ATSH7D6", "ATCRA7DE", "ATFCSH7D6", "ATFCSD300000", "ATFCSM1"});
    EXPECT_EQ(host.ask("2106"), "00B\r0:610601020304\r1:8048503C000000\r\r>");
    EXPECT_EQ(host.ask("1A90").substr(0, 19), "00D\r0:5A9053314D36\r");
    EXPECT_EQ(host.ask("2107"), "7F2112\r\r>");
}

TEST(Service19, countsAndListsCodes)
{
    auto host = reached("electric-can11", {"ATSH7E4"});
    EXPECT_EQ(host.ask("19018D"), "5901FF000002\r\r>");
    EXPECT_EQ(host.ask("19028D"), "00B\r0:5902FF0A1B00\r1:2F0AA61C08AAAA\r\r>");
    EXPECT_EQ(host.ask("190A").substr(0, 5), "00F\r0");
    EXPECT_EQ(host.ask("1903"), "7F1912\r\r>");
}

TEST(Service18, listsCodesOfModulesBeforeService19)
{
    auto host = reached("petrol-can11-modules", {"ATSH7D6", "ATCRA7DE"});
    EXPECT_EQ(host.ask("1800FF00"), "5801415560\r\r>");
    EXPECT_EQ(host.ask("1802FF00"), "5801415560\r\r>");
    EXPECT_EQ(host.ask("1801FF00"), "7F1812\r\r>");
    EXPECT_EQ(host.ask("19028D"), "7F1911\r\r>");
}

TEST(OwnHeaders, ofALegacyBusReachOneModule)
{
    auto host = simulated("petrol-kwp-fast", "elm327-v1.5");
    host.ask({"ATE0", "ATS0", "ATH1", "ATSP5", "0100", "ATSH8018F1"});
    EXPECT_EQ(host.ask("2101"), "83F11861013C2A\r\r>");
    host.ask("ATSH8011F1");
    EXPECT_EQ(host.ask("1800FF00"), "85F11158010420E8EC\r\r>");
    std::string const longReply = host.ask("2102");
    EXPECT_EQ(longReply.substr(0, 12), "80F111426102") << "66 bytes are more than the format byte tells";
    EXPECT_EQ(longReply.size(), 2 * (4 + 66 + 1) + 3U);
    host.ask("ATSH8040F1");
    EXPECT_EQ(host.ask("2101"), "NO DATA\r\r>");
}

TEST(ReceiveFilter, takesObdModulesOnlyUntilTold)
{
    auto host = reached("electric-can11", {"ATSH7B3"});
    EXPECT_EQ(host.ask("220100"), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATCRA7BB", "22F1871"}), "00E\r0:62F187393732\r\r>");
    EXPECT_EQ(host.ask({"ATCRA7XX", "ATH1", "3E001"}), "7BB027E00AAAAAAAAAA\r\r>");
    EXPECT_EQ(host.ask({"ATCRA", "3E00"}), "NO DATA\r\r>");
    EXPECT_EQ(host.ask("ATCRA7YX"), "?\r\r>");
}

TEST(FlowControl, isHeededAtTheRightIdentifierOnly)
{
    auto host = reached("electric-can11", {"ATSH7B3", "ATCRA7BB"});
    EXPECT_EQ(host.ask("22F187"), "00E\r0:62F187393732\r\r>") << "the adapter's own goes to 7BB";
    EXPECT_EQ(host.ask("ATFCSM1"), "?\r\r>") << "nothing to send yet";
    EXPECT_EQ(host.ask({"ATFCSH7B3", "ATFCSM1"}), "?\r\r>") << "no data yet";
    EXPECT_EQ(host.ask({"ATFCSD300000", "ATFCSM1", "22F187"}),
              "00E\r0:62F187393732\r1:35302D45313030\r2:30AAAAAAAAAAAA\r\r>");
    EXPECT_EQ(host.ask({"ATFCSD300100", "22F187"}), "00E\r0:62F187393732\r1:35302D45313030\r\r>") << "block of one";
    EXPECT_EQ(host.ask({"ATFCSD310000", "22F187"}), "00E\r0:62F187393732\r\r>") << "wait is no leave to send";
    EXPECT_EQ(host.ask({"ATFCSD300000", "ATFCSM2", "22F187"}), "00E\r0:62F187393732\r\r>");
    EXPECT_EQ(host.ask("ATFCSD300000000000"), "?\r\r>");
}

TEST(ExtendedAddress, standsInFrontOfEachFrame)
{
    auto host = reached("petrol-can11-modules", {"ATSH6F1", "ATCRA607"});
    EXPECT_EQ(host.ask("22DDBC"), "NO DATA\r\r>");
    EXPECT_EQ(host.ask({"ATCEA07", "22DDBC"}), "00A\r0:62DDBC0352\r\r>") << "flow control lacks the address";
    EXPECT_EQ(host.ask({"ATFCSH6F1", "ATFCSD07300000", "ATFCSM1", "22DDBC"}), "00A\r0:62DDBC0352\r1:011122334400\r\r>");
    EXPECT_EQ(host.ask({"ATH1", "22DDBC"}), "607F1100A62DDBC0352\r607F121011122334400\r\r>");
    EXPECT_EQ(host.ask({"ATTA2A", "22DDBC"}), "NO DATA\r\r>") << "it answers to F1";
    EXPECT_EQ(host.ask({"ATCEA", "ATFCSM0", "ATCRA", "ATSH7DF", "011C1"}), "7E803411C0600000000\r\r>");
}

} // namespace
