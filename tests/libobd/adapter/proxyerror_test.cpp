#include "libobd/adapter/proxyerror.h"
#include "tests/support/bytes.h"

#include <gtest/gtest.h>

namespace {

using obd::ProxyError;

ProxyError errorOf(std::string_view reply)
{
    return obd::checkForErrors(support::bytes(reply));
}

TEST(CheckForErrors, EveryWordHasItsCode)
{
    struct Row
    {
        char const* reply;
        int code;
    };
    for (Row const row :
         {Row{"NO DATA", 0}, Row{"UNABLE TO CONNECT", 12}, Row{"BUFFER FULL", 2}, Row{"BUS BUSY", 3},
          Row{"BUS ERROR", 4}, Row{"CAN ERROR", 5}, Row{"<DATA ERROR", 6}, Row{"FB ERROR", 8}, Row{"LV RESET", 9},
          Row{"<RX ERROR", 10}, Row{"STOPPED", 11}, Row{"ERR94", 7}, Row{"41 00 BE 3E A8 11", 13}, Row{"", 13}}) {
        EXPECT_EQ(static_cast<int>(errorOf(row.reply)), row.code) << row.reply;
    }
}

TEST(CheckForErrors, BlanksAndLetterCaseMakeNoDifference)
{
    for (char const* reply : {"NODATA", "no data", "No Data", "N O D A T A", "7E8 no data 7E9"}) {
        EXPECT_EQ(errorOf(reply), ProxyError::NoData) << reply;
    }
    EXPECT_EQ(errorOf("BUS INIT: ...ERROR"), ProxyError::GenericError);
    EXPECT_EQ(errorOf("BUS INIT: BUS ERROR"), ProxyError::BusError);
}

TEST(CheckForErrors, SearchNoticeIsNoError)
{
    EXPECT_EQ(errorOf("SEARCHING...41 00 BE 3E A8 11"), ProxyError::None);
    EXPECT_EQ(errorOf("SEARCHING...UNABLE TO CONNECT"), ProxyError::UnableToConnect);
    EXPECT_EQ(errorOf("SEARCHING..."), ProxyError::None);
}

TEST(CheckForErrors, ErrorCutInTwoByTheSearchNoticeIsFound)
{
    EXPECT_EQ(errorOf("NO SEARCHING...DATA"), ProxyError::NoData);
}

TEST(CheckForErrors, WordsForADamagedReplyAreNotThoseForSilence)
{
    for (char const* reply : {"BUFFER FULL", "7E8 06 <DATA ERROR", "<RX ERROR", "STOPPED", "LV RESET", "ERR94"}) {
        EXPECT_TRUE(obd::isReplyLost(support::bytes(reply))) << reply;
    }
    for (char const* reply : {"NO DATA", "UNABLE TO CONNECT", "BUS BUSY", "BUS ERROR", "CAN ERROR", "FB ERROR",
                              "BUS INIT: ...ERROR", "SEARCHING...", "41 00", ""}) {
        EXPECT_FALSE(obd::isReplyLost(support::bytes(reply))) << reply;
    }
}

TEST(CheckForErrors, OrderOfSearchDecidesNotTheOrderInTheReply)
{
    EXPECT_EQ(errorOf("STOPPED NO DATA"), ProxyError::NoData);
    EXPECT_EQ(errorOf("NO DATA STOPPED"), ProxyError::NoData);
    EXPECT_EQ(errorOf("ERR93 CAN ERROR"), ProxyError::CanError);
    EXPECT_EQ(errorOf("RX ERROR FB ERROR"), ProxyError::FbError);
}

TEST(CheckForErrors, GenericErrorIsForWhatNoOtherWordNames)
{
    EXPECT_EQ(errorOf("ERROR"), ProxyError::GenericError);
    EXPECT_EQ(errorOf("BUS ERROR"), ProxyError::BusError);
    EXPECT_EQ(errorOf("Power Reader v2"), ProxyError::GenericError) << "the letters may stand in two words";
}

TEST(CheckForErrors, GoodDataBesideAnErrorDoesNotHideIt)
{
    EXPECT_EQ(errorOf("7E8 06 41 00 BE 3F A8 13 BUFFER FULL"), ProxyError::BufferFull);
}

TEST(CheckForErrors, ReplyStaysAsItIs)
{
    std::vector<unsigned char> const reply = support::bytes("SEARCHING... no data");
    std::vector<unsigned char> const before = reply;
    obd::checkForErrors(reply);
    EXPECT_EQ(reply, before);
}

} // namespace
