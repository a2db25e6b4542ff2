#include "libobd/parameters/testroutine.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;

struct ExposedTestRoutine : TestRoutine
{
    using TestRoutine::fromBytes;
    using TestRoutine::TestRoutine;
};

TEST(TestRoutine, RequestIsFilledUpOnTheBusesBeforeCan)
{
    for (ObdProtocol const protocol : {ObdProtocolIso9141, ObdProtocolIso14230, ObdProtocolJ1850}) {
        EXPECT_EQ(requestOf(TestRoutine(1, protocol)), (Bytes{0x08, 0x01, 0, 0, 0, 0, 0}));
    }
    for (ObdProtocol const protocol : {ObdProtocolCan11, ObdProtocolCan29, ObdProtocolUnknown}) {
        EXPECT_EQ(requestOf(TestRoutine(1, protocol)), (Bytes{0x08, 0x01}));
    }
}

TEST(TestRoutine, CanReply4801IsAccepted)
{
    TestRoutine routine(1, ObdProtocolCan11);
    ASSERT_TRUE(offer(routine, canEcu, "48 01"));
    EXPECT_EQ(routine.result(*canEcu), TestRoutine::Accepted);
    EXPECT_FALSE(offer(routine, canEcu, "48 02")) << "of another routine";
}

TEST(TestRoutine, OlderBusReplyTellsByItsThirdByte)
{
    TestRoutine routine(1, ObdProtocolIso9141);
    ASSERT_TRUE(offer(routine, isoEcu, "48 01 00 00 00 00 00"));
    EXPECT_EQ(routine.result(*isoEcu), TestRoutine::Accepted);
    for (char const* const refusal : {"48 01 01 00 00 00 00", "48 01 80 00 00 00 00", "48 01 FF 00 00 00 00 C8"}) {
        routine.clear();
        ASSERT_TRUE(offer(routine, isoEcu, refusal));
        EXPECT_EQ(routine.result(*isoEcu), TestRoutine::Refused);
    }
}

TEST(TestRoutine, OlderBusReplyOf6BytesStoresNothing)
{
    support::LogCapture log;
    TestRoutine routine(1, ObdProtocolIso9141);
    EXPECT_FALSE(offer(routine, isoEcu, "48 01 00 00 00 00"));
    EXPECT_EQ(routine.result(*isoEcu), TestRoutine::NoAnswer);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR invalid ECU id 16"});
}

TEST(TestRoutine, CanReplyOf1ByteStoresNothing)
{
    ExposedTestRoutine routine(1, ObdProtocolCan11);
    EXPECT_FALSE(routine.fromBytes(canEcu, Bytes{0x48}));
    EXPECT_EQ(routine.result(*canEcu), TestRoutine::NoAnswer);
}

TEST(TestRoutine, ANegativeReplyLeavesTheResponseCode)
{
    TestRoutine routine(1, ObdProtocolCan11);
    EXPECT_FALSE(offer(routine, canEcu, "7F 08 22"));
    EXPECT_EQ(routine.nack(), 0x22);
    EXPECT_EQ(routine.result(*canEcu), TestRoutine::NoAnswer);
}

TEST(TestRoutine, ClearForgets)
{
    TestRoutine routine(1, ObdProtocolCan11);
    ASSERT_TRUE(offer(routine, canEcu, "48 01"));
    routine.clear();
    EXPECT_EQ(routine.result(*canEcu), TestRoutine::NoAnswer);
}

TEST(TestRoutine, ResultNumbersStandFirm)
{
    EXPECT_EQ(TestRoutine::Accepted, 0);
    EXPECT_EQ(TestRoutine::Refused, 1);
    EXPECT_EQ(TestRoutine::NoAnswer, 2);
}

TEST(TestRoutine, RandomRepliesAreReadOrRefusedWithoutChange)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x48, 0x01}, [&ecu, protocol](Bytes const& data) {
            TestRoutine routine(1, protocol);
            bool const taken = routine.setResponseData(ecu, data);
            EXPECT_EQ(routine.result(*ecu) != TestRoutine::NoAnswer, taken);
        });
    }
}

} // namespace
