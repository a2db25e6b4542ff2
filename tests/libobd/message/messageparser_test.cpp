#include "libobd/message/messageparser.h"
#include "tests/support/hexbytes.h"
#include "tests/support/logcapture.h"
#include "tests/support/process/failingallocation.h"
#include "tests/support/sanitizer.h"

#include <gtest/gtest.h>

#include <new>

namespace {

using obd::MessageParser;
using obd::ResponseMap;
using support::hexBytes;
using support::LogCapture;
using support::replyText;
using Lines = std::vector<std::string>;

TEST(MessageParser, ProtocolsOutsideTheFiveFamiliesTouchNothing)
{
    for (int const protocol : {5, 6, -1, 255}) {
        LogCapture const log;
        ResponseMap responses = {{0x7E8, hexBytes("01")}};
        EXPECT_FALSE(MessageParser::parseResponseMessage(static_cast<obd::ObdProtocol>(protocol),
                                                         replyText("7E8 02 41 0D"), responses));
        EXPECT_EQ(responses, (ResponseMap{{0x7E8, hexBytes("01")}}));
        EXPECT_EQ(log.lines(), Lines());
    }
}

TEST(MessageParser, EachFamilyReadsItsOwnFraming)
{
    struct
    {
        obd::ObdProtocol protocol;
        char const* text;
        unsigned int id;
        char const* payload;
    } const cases[] = {
        {obd::ObdProtocolIso9141, "48 6B 10 41 0D 37 48", 0x10, "41 0D 37 48"},
        {obd::ObdProtocolIso14230, "83 F1 10 41 0D 37 09", 0x10, "41 0D 37"},
        {obd::ObdProtocolJ1850, "41 6B 10 41 0D 37 9A", 0x10, "41 0D 37 9A"},
        {obd::ObdProtocolCan11, "7E8 03 41 0D 37", 0x7E8, "41 0D 37"},
        {obd::ObdProtocolCan29, "18DAF110 03 41 0D 37", 0x18DAF110, "41 0D 37"},
    };
    for (auto const& row : cases) {
        ResponseMap responses;
        EXPECT_TRUE(MessageParser::parseResponseMessage(row.protocol, replyText(row.text), responses));
        EXPECT_EQ(responses, (ResponseMap{{row.id, hexBytes(row.payload)}})) << row.text;
    }
}

TEST(MessageParser, AFailureInsideIsLoggedWithTheTextAndThrownOn)
{
    if (testsupport::underThreadSanitizer) {
        GTEST_SKIP() << "its operator new stands in front of ours; AddressSanitizer's run has this case";
    }
    LogCapture const log;
    ResponseMap responses;
    std::vector<unsigned char> text = replyText("7E8 02 41 0D");
    text.push_back(0x0A);
    {
        support::FailingAllocation const failing;
        EXPECT_THROW(MessageParser::parseResponseMessage(obd::ObdProtocolCan11, text, responses), std::bad_alloc);
    }
    EXPECT_EQ(log.lines(),
              Lines{"FATAL Failed MessageParser::parseResponseMessage (protocol:3, 0x37, 0x45, 0x38, 0x30, "
                    "0x32, 0x34, 0x31, 0x30, 0x44, 0xa)"});
    EXPECT_EQ(responses, ResponseMap());
}

TEST(MessageParser, AFailureOnTheOlderBusesIsLoggedWithItsProtocol)
{
    if (testsupport::underThreadSanitizer) {
        GTEST_SKIP() << "its operator new stands in front of ours; AddressSanitizer's run has this case";
    }
    LogCapture const log;
    ResponseMap responses;
    std::vector<unsigned char> const text = replyText("AZ");
    {
        support::FailingAllocation const failing;
        EXPECT_THROW(MessageParser::parseResponseMessage(obd::ObdProtocolIso9141, text, responses), std::bad_alloc);
    }
    EXPECT_EQ(log.lines(), Lines{"FATAL Failed MessageParser::parseResponseMessage (protocol:0, 0x41, 0x5a)"});
}

} // namespace
