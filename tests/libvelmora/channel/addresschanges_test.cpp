// The commands that set an address on each bus and take it back, without an adapter.

#include "libvelmora/channel/requestaddress.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace velmora {

namespace {

using testing::ElementsAre;

// How an adapter stands on a bus with headers, and whatever else it has confirmed.
AdapterState standing(std::string const& protocol, std::vector<std::string> const& more = {})
{
    AdapterState state;
    for (std::string const& command : std::vector<std::string>{"ATTP" + protocol, "ATH1"}) {
        state.observe(ElmCommand(command), "OK");
    }
    for (std::string const& command : more) {
        state.observe(ElmCommand(command), "OK");
    }
    return state;
}

// "ATSH7E0<ATSH7DF", and behind a bar what is sent to adapters that do not know that.
std::vector<std::string> changesOf(RequestAddress const& address, AdapterState const& state,
                                   std::string const& wait = {})
{
    std::vector<std::string> texts;
    for (AddressChange const& each : addressChanges(address, state, wait)) {
        std::string const otherwise = each.restore.otherwise.empty() ? "" : "|" + each.restore.otherwise;
        texts.push_back(each.set + "<" + each.restore.command + otherwise);
    }
    return texts;
}

TEST(AddressChanges, GoBackToWhatTheLibraryHasSet)
{
    RequestAddress const address{.header = "7E0", .reply = "7E8", .adaptive = false};
    EXPECT_THAT(changesOf(address, standing("6")),
                ElementsAre("ATSH7E0<ATSH7DF", "ATCRA7E8<ATCRA|ATAR", "ATAT0<ATAT1"));
    EXPECT_THAT(changesOf(address, standing("6", {"ATSH7E2", "ATCRA7EA", "ATAT2"})),
                ElementsAre("ATSH7E0<ATSH7E2", "ATCRA7E8<ATCRA7EA|ATAR", "ATAT0<ATAT2"));
    RequestAddress const priority{.header = "17FC007B"};
    EXPECT_THAT(changesOf(priority, standing("7")), ElementsAre("ATCP17<ATCP18", "ATSHFC007B<ATSHDB33F1"));
    EXPECT_THAT(changesOf(priority, standing("7", {"ATCP17"})), ElementsAre("ATSHFC007B<ATSHDB33F1"));
    EXPECT_THAT(changesOf({.header = "18DA10F1"}, standing("7", {"ATCP17"})),
                ElementsAre("ATCP18<ATCP17", "ATSHDA10F1<ATSHDB33F1"));
    EXPECT_THAT(changesOf({.header = "DA10F1"}, standing("7", {"ATCP17"})), ElementsAre("ATSHDA10F1<ATSHDB33F1"));
}

TEST(AddressChanges, KnowTheHeaderOfEachBus)
{
    std::pair<char const*, char const*> const rows[] = {
        {"1", "ATSH616AF1"}, {"2", "ATSH686AF1"}, {"3", "ATSH686AF1"}, {"4", "ATSHC033F1"}, {"5", "ATSHC033F1"}};
    for (auto const& [protocol, header] : rows) {
        EXPECT_THAT(changesOf({.header = "C410F1"}, standing(protocol)),
                    ElementsAre(std::string("ATSHC410F1<") + header))
            << protocol;
    }
    EXPECT_THAT(changesOf({.header = "7E0"}, standing("8")), ElementsAre("ATSH7E0<ATSH7DF"));
    EXPECT_THAT(changesOf({.header = "DA10F1"}, standing("9")), ElementsAre("ATSHDA10F1<ATSHDB33F1"));
}

TEST(AddressChanges, AreNoneForAnAddressOfAnotherBus)
{
    AdapterState const can11 = standing("6");
    for (RequestAddress const& wrong : {RequestAddress{.header = ""},
                                        {.header = "7E"},
                                        {.header = "7E00"},
                                        {.header = "7G0"},
                                        {.header = "7E0", .reply = "7Y8"},
                                        {.header = "7E0", .extended = "G7"},
                                        {.header = "7E0", .extended = "07", .tester = "XX"},
                                        {.header = "7E0", .flowHeader = "7X0"},
                                        {.header = "7E0", .flowHeader = "7E0", .flowData = "30000X"}}) {
        EXPECT_THAT(changesOf(wrong, can11), testing::IsEmpty())
            << wrong.header << wrong.reply << wrong.extended << wrong.flowHeader;
    }
    for (char const* header : {"7E0", "DA10F", "DA10F1F", "118DA10F1"}) {
        EXPECT_THAT(changesOf({.header = header}, standing("7")), testing::IsEmpty()) << header;
    }
    AdapterState const kwp = standing("5");
    for (RequestAddress const& wrong : {RequestAddress{.header = "8110F"},
                                        {.header = "8110F1F"},
                                        {.header = "8110F1", .reply = "80F110"},
                                        {.header = "8110F1", .extended = "07"},
                                        {.header = "8110F1", .flowHeader = "7E0"},
                                        {.header = "81X0F1"}}) {
        EXPECT_THAT(changesOf(wrong, kwp), testing::IsEmpty()) << wrong.header << wrong.reply;
    }
    AdapterState headersOff;
    headersOff.observe(ElmCommand("ATTP6"), "OK");
    EXPECT_THAT(changesOf({.header = "7E0"}, headersOff), testing::IsEmpty());
}

TEST(AddressChanges, HearAnyAnswerByFilterAndMask)
{
    EXPECT_THAT(changesOf({.header = "700", .reply = "7X8"}, standing("6")),
                ElementsAre("ATSH700<ATSH7DF", "ATCF708<ATCRA|ATAR", "ATCM70F<"));
    EXPECT_THAT(changesOf({.header = "700", .reply = "X08"}, standing("6")),
                ElementsAre("ATSH700<ATSH7DF", "ATCF008<ATCRA|ATAR", "ATCM0FF<"));
    EXPECT_THAT(changesOf({.header = "DBFFF1", .reply = "18DAF1XX"}, standing("7")),
                ElementsAre("ATSHDBFFF1<ATSHDB33F1", "ATCF18DAF100<ATCRA|ATAR", "ATCM1FFFFF00<"));
}

TEST(AddressChanges, WaitAsLongAsTheyAreTold)
{
    AdapterState const state = standing("6", {"ATST64"});
    auto const waitOf = [&state](unsigned int waitMs, bool stays, std::string const& inForce) {
        RequestAddress address{.header = "7E0"};
        address.waitMs = waitMs;
        address.stays = stays;
        auto const changes = changesOf(address, state, inForce);
        return changes.size() == 2 ? changes[1] : "none";
    };
    EXPECT_EQ(waitOf(600, false, "ATST64"), "ATST93<ATST64"); // 602 ms
    EXPECT_EQ(waitOf(5, false, "ATST64"), "ATST02<ATST64");
    EXPECT_EQ(waitOf(1040, false, "ATST64"), "ATSTFE<ATST64");
    EXPECT_EQ(waitOf(5000, false, "ATST64"), "ATSTFF<ATST64") << "the longest that there is";
    EXPECT_EQ(waitOf(600, false, "ATST93"), "none") << "it is in force";
    EXPECT_EQ(waitOf(600, false, ""), "none") << "nothing would give it back";
    EXPECT_EQ(waitOf(0, false, "ATST19"), "none");
    EXPECT_EQ(waitOf(0, true, "ATST19"), "ATST64<ATST19") << "as long as the library wants";
    EXPECT_EQ(waitOf(600, true, "ATST19"), "ATST93<ATST19");
    EXPECT_EQ(waitOf(0, true, "ATST64"), "none");
    EXPECT_THAT(changesOf({.header = "7E0", .stays = true}, standing("6"), "ATST19"), testing::SizeIs(1));
}

TEST(AddressChanges, AreTakenBackInTheirOrder)
{
    std::vector<int> places;
    for (char const* command :
         {"ATFCSM0", "ATCEA", "ATCRA7E8", "ATAR", "ATCP18", "ATSH7DF", "ATAT1", "ATST64", "ATE0"}) {
        places.push_back(restoreOrder(command));
    }
    EXPECT_THAT(places, ElementsAre(0, 1, 2, 3, 4, 5, 6, 7, 8));
    std::string words;
    for (char const* command : {"ATFCSH7E0", "ATFCSM1", "ATFCSD300000", "ATCEA07", "ATCRA7E8", "ATSH7E0", "ATCP18",
                                "ATCF700", "ATTAF1", "ATST64", "ATAT0"}) {
        words += addressWord(command) + " ";
    }
    EXPECT_EQ(words, "ATFCSH ATFCSM ATFCSD ATCEA ATCRA ATSH ATCP ATCF ATTA ATST ATAT ");
}

TEST(PhysicalAddress, IsThatOfAModuleOfTheStandard)
{
    auto const headerOf = [](BusKind bus, unsigned int module) {
        std::optional<RequestAddress> const address = physicalAddress(bus, module);
        return address ? address->header : "none";
    };
    EXPECT_EQ(headerOf(BusKind::Can11, 0x7E7), "none");
    EXPECT_EQ(headerOf(BusKind::Can11, 0x7E8), "7E0");
    EXPECT_EQ(headerOf(BusKind::Can11, 0x7EF), "7E7");
    EXPECT_EQ(headerOf(BusKind::Can11, 0x7F0), "none");
    EXPECT_EQ(headerOf(BusKind::Can29, 0x18DAF110), "DA10F1");
    EXPECT_EQ(headerOf(BusKind::Can29, 0x18DAF1FE), "DAFEF1");
    EXPECT_EQ(headerOf(BusKind::Can29, 0x18DAF010), "none");
    EXPECT_EQ(headerOf(BusKind::Can29, 0x7E8), "none");
    EXPECT_EQ(headerOf(BusKind::Can11, 0x18DAF110), "none");
    EXPECT_EQ(headerOf(BusKind::Kwp, 0x10), "none");
    EXPECT_EQ(physicalAddress(BusKind::Can11, 0x7E8)->waitMs, 0U);
}

} // namespace

} // namespace velmora
