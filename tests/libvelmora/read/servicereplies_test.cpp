#include "libvelmora/read/codereader.h"
#include "libvelmora/read/servicereplies.h"

#include <gtest/gtest.h>

namespace {

using velmora::isCodeListReply;
using velmora::ServiceReplies;
using Kind = velmora::ServiceReply::Kind;

TEST(ServiceReplies, TellsWhatEachModuleSaid)
{
    ServiceReplies const replies(0x04, {{0x7E8, {0x44}},
                                        {0x7E9, {0x7F, 0x04, 0x22}},
                                        {0x7EA, {0x7F, 0x10, 0x12}},
                                        {0x7EB, {}},
                                        {0x7EC, {0x7F, 0x04, 0x31}},
                                        {0x7ED, {0x7F, 0x04}}});
    EXPECT_EQ(replies.of(0x7E8).kind, Kind::Positive);
    EXPECT_EQ(replies.of(0x7E9).kind, Kind::Refused);
    EXPECT_EQ(replies.of(0x7E9).reason, "conditions not correct (22)");
    EXPECT_EQ(replies.of(0x7EA).kind, Kind::Foreign);
    EXPECT_EQ(replies.of(0x7EB).kind, Kind::Silent);
    EXPECT_EQ(replies.of(0x7EC).reason, "response code 31");
    EXPECT_EQ(replies.of(0x7ED).kind, Kind::Foreign);
    EXPECT_EQ(replies.of(0x7E0).kind, Kind::Silent);
    EXPECT_EQ(replies.answering().size(), 6U);
}

TEST(ServiceReplies, CodeListHoldsAsManyCodesAsItSays)
{
    EXPECT_TRUE(isCodeListReply({0x43, 0x00}, obd::ObdProtocolCan11));
    EXPECT_TRUE(isCodeListReply({0x43, 0x01, 0x01, 0x33}, obd::ObdProtocolCan29));
    EXPECT_FALSE(isCodeListReply({0x43}, obd::ObdProtocolCan11));
    EXPECT_FALSE(isCodeListReply({0x43, 0x02, 0x01, 0x33}, obd::ObdProtocolCan11));
    EXPECT_TRUE(isCodeListReply({0x43, 0, 0, 0, 0, 0, 0}, obd::ObdProtocolIso9141));
    EXPECT_TRUE(isCodeListReply({0x43, 0, 0, 0, 0, 0, 0, 0x12}, obd::ObdProtocolJ1850));
    EXPECT_FALSE(isCodeListReply({0x43, 0x00}, obd::ObdProtocolIso14230));
    EXPECT_FALSE(isCodeListReply({}, obd::ObdProtocolIso14230));
}

} // namespace
