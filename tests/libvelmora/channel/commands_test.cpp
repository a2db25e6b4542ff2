// What a line to an adapter means, and how the adapter stands behind those that it has confirmed.

#include "libvelmora/channel/adapterstate.h"
#include "libvelmora/channel/elmcommand.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;

TEST(ElmCommands, AreReadInAnyCaseAndWithBlanks)
{
    std::string values;
    for (char const each : {'/', '0', '9', ':', '@', 'A', 'F', 'G', '`', 'a', 'f', 'g'}) {
        values += std::to_string(hexDigitValue(each)) + " ";
    }
    EXPECT_EQ(values, "-1 0 9 -1 -1 10 15 -1 -1 10 15 -1 ");
    EXPECT_EQ(compactText(" a`z{A!\x7f\xfc\r\n"), "A`Z{A!\x7f");
    ElmCommand const request("01 0c 1f\r");
    EXPECT_EQ(request.text(), "010C1F");
    EXPECT_THAT(request.bytes(), ElementsAre(0x01, 0x0C, 0x1F));
    EXPECT_EQ(request.service(), 1U);
    for (char const* none : {"", "010", "01G0", "0x10", "ATI"}) {
        EXPECT_FALSE(ElmCommand(none).isRequest()) << none;
        EXPECT_EQ(ElmCommand(none).service(), 0U);
    }
}

TEST(ElmCommands, AreAskedTwiceOnlyIfTheyRead)
{
    std::string reading;
    for (char const* service : {"01", "02", "03", "04", "05", "06", "07", "08", "09", "0A",  "10", "14",
                                "19", "1A", "21", "22", "27", "2E", "2F", "31", "3E", "ATI", ""}) {
        reading += ElmCommand(service).onlyReads() ? std::string(service) + " " : "";
    }
    EXPECT_EQ(reading, "01 02 03 05 06 07 09 0A 19 1A 21 22 ");
}

TEST(ElmCommands, OfOneShapeHaveUpToSixSensors)
{
    EXPECT_TRUE(ElmCommand("010C0D0E0F1011").hasFixedShape());
    EXPECT_FALSE(ElmCommand("010C0D0E0F101112").hasFixedShape());
    EXPECT_FALSE(ElmCommand("01").hasFixedShape());
    EXPECT_FALSE(ElmCommand("220C").hasFixedShape());
}

TEST(ElmCommands, ForMasksAreTold)
{
    for (char const* mask : {"0100", "0120", "01E0", "0600", "0840", "0900"}) {
        EXPECT_TRUE(ElmCommand(mask).asksForMask()) << mask;
    }
    for (char const* other : {"0101", "0110", "0200", "0A00", "01", "010020", "2200", "ATI"}) {
        EXPECT_FALSE(ElmCommand(other).asksForMask()) << other;
    }
}

TEST(ElmCommands, AreQuestionsResetsOrMonitoring)
{
    for (char const* question :
         {"ATI", "AT@1", "AT@2", "ATDP", "ATDPN", "ATRV", "ATIGN", "ATCS", "ATPPS", "STI", "STDI", "ATKW"}) {
        EXPECT_TRUE(ElmCommand(question).onlyAsks()) << question;
        EXPECT_EQ(ElmCommand(question).setting(), std::nullopt) << question;
    }
    for (char const* monitor : {"ATMA", "ATMR10", "ATMT10", "ATMP1234", "STM", "STMA"}) {
        EXPECT_TRUE(ElmCommand(monitor).monitors()) << monitor;
        EXPECT_EQ(ElmCommand(monitor).setting(), std::nullopt) << monitor;
    }
    for (char const* reset : {"ATZ", "ATWS"}) {
        EXPECT_TRUE(ElmCommand(reset).resets()) << reset;
        EXPECT_EQ(ElmCommand(reset).setting(), std::nullopt) << reset;
    }
    for (char const* none : {"ATE0", "ATM0", "STPX", "010C", "ATD", "ATIA", ""}) {
        EXPECT_FALSE(ElmCommand(none).onlyAsks() || ElmCommand(none).monitors() || ElmCommand(none).resets()) << none;
    }
}

TEST(ElmCommands, NameTheSettingThatTheyChange)
{
    std::pair<char const*, char const*> const rows[] = {
        {"ATCAF1", "ATCAF"}, {"ATCFC1", "ATCFC"}, {"ATCRA7E8", "ATCRA"}, {"ATCEA07", "ATCEA"}, {"ATCP18", "ATCP"},
        {"ATCF700", "ATCF"}, {"ATCM700", "ATCM"}, {"ATAT1", "ATAT"},     {"ATAL", "ATAL"},     {"ATST64", "ATST"},
        {"ATSH7E0", "ATSH"}, {"ATSP6", "ATTP"},   {"ATTP6", "ATTP"},     {"ATE0", "ATE"},      {"ATL0", "ATL"},
        {"ATS0", "ATS"},     {"ATM0", "ATM"},     {"ATH1", "ATH"},       {"ATR1", "ATR"},
    };
    for (auto const& [command, word] : rows) {
        EXPECT_THAT(ElmCommand(command).setting(), testing::Optional(std::string(word))) << command;
    }
    for (char const* none : {"ATRV1", "ATRD", "ATLP", "ATD", "ATPC", "010C"}) {
        EXPECT_EQ(ElmCommand(none).setting(), std::nullopt) << none;
    }
}

void confirm(AdapterState& state, std::vector<std::pair<char const*, char const*>> const& dialogue)
{
    for (auto const& [command, reply] : dialogue) {
        state.observe(ElmCommand(command), reply);
    }
}

TEST(AdapterState, FollowsWhatTheAdapterHasConfirmed)
{
    AdapterState state;
    EXPECT_FALSE(state.echoOff());
    EXPECT_FALSE(state.headersOn());
    EXPECT_EQ(state.protocol(), 0);
    confirm(state, {{"ATI", "ATI\rELM327 v1.5\r"}, {"ATE0", "OK"}, {"ATH1", "OK"}, {"ATST64", "?"}, {"ATSP6", "OK"}});
    EXPECT_EQ(state.identity(), "ELM327V1.5");
    EXPECT_TRUE(state.echoOff());
    EXPECT_TRUE(state.headersOn());
    EXPECT_EQ(state.setting("ATST"), "") << "which was refused";
    EXPECT_EQ(state.protocol(), 6);
    EXPECT_EQ(state.shownBus(), BusKind::Can11);
    confirm(state, {{"ATI", "\r"}, {"ATRV", "OK"}, {"ATH0", "OK"}, {"ATE1", "OK"}});
    EXPECT_EQ(state.identity(), "ELM327V1.5");
    EXPECT_EQ(state.shownBus(), BusKind::Unknown) << "without headers no frame is shown";
    EXPECT_FALSE(state.echoOff());
    EXPECT_THAT(state.setUp(), ElementsAre("ATE1", "ATH0", "ATTP6"));
}

TEST(AdapterState, TakesTheBusByItsNumberOnceItIsFound)
{
    AdapterState state;
    confirm(state, {{"ATST32", "OK"}, {"ATTPA8", "OK"}});
    EXPECT_EQ(state.protocol(), 8);
    EXPECT_THAT(state.setUp(), ElementsAre("ATST32", "ATTP8"));
    confirm(state, {{"ATTP0", "OK"}, {"ATST64", "OK"}, {"ATDPN", "A0"}});
    EXPECT_EQ(state.protocol(), 0);
    EXPECT_THAT(state.setUp(), ElementsAre("ATST64", "ATTP0"));
    confirm(state, {{"ATDPN", "A3"}, {"ATDPN", "?"}});
    EXPECT_EQ(state.protocol(), 3);
    EXPECT_THAT(state.setUp(), ElementsAre("ATST64", "ATTP3"));
    EXPECT_EQ(state.setting("ATTP"), "ATTP0");
    confirm(state, {{"ATTPB", "OK"}});
    EXPECT_EQ(state.protocol(), 0) << "no bus of vehicles has that number";
}

TEST(AdapterState, IsThatOfAFreshOneBehindAReset)
{
    struct Row
    {
        char const* command;
        char const* reply;
        bool isReset;
    };
    for (auto const& [command, reply, isReset] :
         {Row{"ATZ", "ELM327 v1.5", true}, Row{"ATWS", "ELM327 v1.5", true}, Row{"ATD", "OK", true},
          Row{"ATD", "?", false}, Row{"ATD0", "OK", false}}) {
        AdapterState state;
        confirm(state, {{"ATI", "ELM327 v1.5"}, {"ATE0", "OK"}, {"ATTP6", "OK"}, {command, reply}});
        EXPECT_EQ(state.setUp().empty(), isReset) << command;
        EXPECT_EQ(state.echoOff(), !isReset) << command;
        EXPECT_EQ(state.identity().empty(), isReset) << command;
    }
}

} // namespace

} // namespace velmora
