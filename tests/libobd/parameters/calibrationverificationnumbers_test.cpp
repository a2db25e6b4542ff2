#include "libobd/parameters/calibrationverificationnumbers.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Texts = std::vector<std::string>;

TEST(CalibrationVerificationNumbers, AsksForInfoType06)
{
    EXPECT_EQ(requestOf(CalibrationVerificationNumbers()), (Bytes{0x09, 0x06}));
    EXPECT_EQ(CalibrationVerificationNumbers().timeout(), 1500U);
}

TEST(CalibrationVerificationNumbers, ReadsAListOnCan)
{
    support::LogCapture log;
    CalibrationVerificationNumbers parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 06 02 AD 34 3D 35 00 00 0A 0F"));
    EXPECT_EQ(parameter.verificationNumbers(canEcu), (Texts{"AD343D35", "00000A0F"}));
    EXPECT_EQ(log.lines(), Texts{"INFO Number of verification items: 2"});
}

TEST(CalibrationVerificationNumbers, AListThatIsCutIsRefusedAsAWhole)
{
    support::LogCapture log;
    CalibrationVerificationNumbers parameter;
    EXPECT_FALSE(offer(parameter, canEcu, "49 06 02 AD 34 3D 35 00 00 0A"));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 10"));
    EXPECT_FALSE(offer(parameter, canEcu, "49 06 01 AD 34 3D"));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 6"));
    EXPECT_TRUE(parameter.verificationNumbers(canEcu).empty());
}

TEST(CalibrationVerificationNumbers, BytesBehindTheCountedItemsAreIgnored)
{
    CalibrationVerificationNumbers parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 06 01 AD 34 3D 35 AA AA AA AA"));
    EXPECT_EQ(parameter.verificationNumbers(canEcu), Texts{"AD343D35"});
}

// The eight calibrations of a GM engine module on J1850 VPW, check bytes and all.
TEST(CalibrationVerificationNumbers, ReadsEightLinesOfARealCarWithChecksums)
{
    CalibrationVerificationNumbers parameter;
    ASSERT_TRUE(offer(parameter, vpwEcu,
                      "49 06 01 00 00 FA 22 A6 49 06 02 00 00 E7 65 D7 49 06 03 00 00 6E 62 31 "
                      "49 06 04 00 00 35 CF CA 49 06 05 00 00 77 39 E3 49 06 06 00 00 BD FA AE "
                      "49 06 07 00 00 7F A8 9B 49 06 08 00 00 63 B0 01"));
    EXPECT_EQ(parameter.verificationNumbers(vpwEcu),
              (Texts{"0000FA22", "0000E765", "00006E62", "000035CF", "00007739", "0000BDFA", "00007FA8", "000063B0"}));
}

TEST(CalibrationVerificationNumbers, ReadsLinesWithoutChecksums)
{
    CalibrationVerificationNumbers parameter;
    ASSERT_TRUE(offer(parameter, kwpEcu, "49 06 01 00 00 FA 22 49 06 02 00 00 E7 65"));
    EXPECT_EQ(parameter.verificationNumbers(kwpEcu), (Texts{"0000FA22", "0000E765"}));
}

TEST(CalibrationVerificationNumbers, RepliesThatAreNoWholeLinesAreRefused)
{
    support::LogCapture log;
    CalibrationVerificationNumbers parameter;
    EXPECT_FALSE(offer(parameter, vpwEcu, "49 06 01 00 00 FA"));
    EXPECT_FALSE(offer(parameter, vpwEcu, "49 06 01 00 00 FA 22 49 06 02"));
    EXPECT_EQ(log.lines(), (Texts{"ERROR Invalid number of data bytes: 6", "ERROR Invalid data received"}));
    EXPECT_TRUE(parameter.verificationNumbers(vpwEcu).empty());
}

TEST(CalibrationVerificationNumbers, AFurtherReplyIsAppendedAndClearForgets)
{
    CalibrationVerificationNumbers parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 06 01 AD 34 3D 35"));
    ASSERT_TRUE(offer(parameter, canEcu, "49 06 01 A9 C9 EF 55"));
    EXPECT_EQ(parameter.verificationNumbers(canEcu), (Texts{"AD343D35", "A9C9EF55"}));
    parameter.clear();
    EXPECT_TRUE(parameter.verificationNumbers(canEcu).empty());
}

TEST(CalibrationVerificationNumbers, RandomRepliesNeverAddMoreThanTheyHold)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x49, 0x06}, [&ecu](Bytes const& data) {
            CalibrationVerificationNumbers parameter;
            bool const taken = parameter.setResponseData(ecu, data);
            std::size_t const count = parameter.verificationNumbers(ecu).size();
            EXPECT_LE(count, taken ? data.size() / 4 : 0U);
        });
    }
}

} // namespace
