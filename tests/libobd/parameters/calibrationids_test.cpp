#include "libobd/parameters/calibrationids.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Texts = std::vector<std::string>;

auto const can29Ecu = makeEcu(ObdProtocolCan29, 0x18DAF110);

struct ExposedCalibrationIds : CalibrationIds
{
    using CalibrationIds::fromBytes;
};

// `items` calibrations of four lines each, named "CAL1" and so on in their first line, the rest zero bytes.
Bytes lines(int items)
{
    Bytes data;
    for (unsigned char line = 0; line < items * 4; ++line) {
        Bytes const first{0x43, 0x41, 0x4C, static_cast<unsigned char>('1' + line / 4)};
        Bytes const text = line % 4 == 0 ? first : Bytes{0, 0, 0, 0};
        data.insert(data.end(), {0x49, 0x04, static_cast<unsigned char>(line + 1)});
        data.insert(data.end(), text.begin(), text.end());
    }
    return data;
}

TEST(CalibrationIds, AsksForInfoType04)
{
    EXPECT_EQ(requestOf(CalibrationIds()), (Bytes{0x09, 0x04}));
    EXPECT_EQ(CalibrationIds().timeout(), 1500U);
}

TEST(CalibrationIds, ReadsAListOnCanWithoutZeroBytes)
{
    support::LogCapture log;
    CalibrationIds parameter;
    ASSERT_TRUE(offer(parameter, can29Ecu,
                      "49 04 02 30 35 45 30 31 39 45 42 34 31 38 30 42 45 41 4A "
                      "00 35 36 30 32 00 38 39 34 39 41 43 00 00 00 00 00"));
    EXPECT_EQ(parameter.calibrationIds(can29Ecu), (Texts{"05E019EB4180BEAJ", "56028949AC"}));
    EXPECT_EQ(log.lines(), Texts{"INFO Number of CALID items: 2"});
}

TEST(CalibrationIds, AnItemThatIsNotWholeStopsTheListAndKeepsWhatCameBefore)
{
    support::LogCapture log;
    CalibrationIds parameter;
    EXPECT_FALSE(
        offer(parameter, can29Ecu, "49 04 02 30 35 45 30 31 39 45 42 34 31 38 30 42 45 41 4A 35 36 30 32 38 39 34 39"));
    EXPECT_EQ(parameter.calibrationIds(can29Ecu), Texts{"05E019EB4180BEAJ"});
    EXPECT_EQ(log.lines(), (Texts{"INFO Number of CALID items: 2", "ERROR Invalid number of data bytes: 27"}));
}

TEST(CalibrationIds, ReplyWithoutAWholeItemIsRefused)
{
    support::LogCapture log;
    CalibrationIds parameter;
    EXPECT_FALSE(offer(parameter, can29Ecu, "49 04 01 30 35 45 30 31 39 45 42 34 31 38 30 42 45 41"));
    EXPECT_EQ(log.lines(), Texts{"ERROR Invalid number of data bytes: 18"});
    EXPECT_TRUE(parameter.calibrationIds(can29Ecu).empty());
}

TEST(CalibrationIds, ACountOfZeroIsAnEmptyList)
{
    CalibrationIds parameter;
    EXPECT_TRUE(parameter.setResponseData(
        can29Ecu, Bytes{0x49, 0x04, 0x00, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16}));
    EXPECT_TRUE(parameter.calibrationIds(can29Ecu).empty());
}

TEST(CalibrationIds, AFurtherReplyIsAppendedAndClearForgets)
{
    CalibrationIds parameter;
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, lines(1)));
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, lines(2)));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu), (Texts{"CAL1", "CAL1", "CAL2"}));
    parameter.clear();
    EXPECT_TRUE(parameter.calibrationIds(vpwEcu).empty());
}

TEST(CalibrationIds, ReadsLinesWithoutChecksums)
{
    support::LogCapture log;
    CalibrationIds parameter;
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, lines(2)));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu), (Texts{"CAL1", "CAL2"}));
    EXPECT_EQ(log.lines(), (Texts{"DEBUG No checksum in use", "INFO Number of CalID items: 2"}));
}

TEST(CalibrationIds, ReadsLinesWithChecksums)
{
    support::LogCapture log;
    CalibrationIds parameter;
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, withChecksums(lines(3))));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu), (Texts{"CAL1", "CAL2", "CAL3"}));
    EXPECT_EQ(log.lines(), (Texts{"DEBUG Checksum in use", "INFO Number of CalID items: 3"}));
}

TEST(CalibrationIds, SevenWithChecksumsAndEightWithoutAreOfOneSizeAndBothRead)
{
    Bytes const seven = withChecksums(lines(7));
    Bytes const eight = lines(8);
    ASSERT_EQ(seven.size(), eight.size());
    CalibrationIds parameter;
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, seven));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu).size(), 7U);
    parameter.clear();
    ASSERT_TRUE(parameter.setResponseData(vpwEcu, eight));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu).size(), 8U);
}

TEST(CalibrationIds, LinesOfAnItemMayComeInAnyOrder)
{
    CalibrationIds parameter;
    ASSERT_TRUE(offer(parameter, vpwEcu,
                      "49 04 03 49 4A 4B 4C 49 04 01 41 42 43 44 49 04 04 4D 00 00 00 49 04 02 45 46 47 48"));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu), Texts{"ABCDEFGHIJKLM"});
}

TEST(CalibrationIds, ASequenceNumberOfAnotherItemIsRefused)
{
    support::LogCapture log;
    CalibrationIds parameter;
    Bytes data = lines(2);
    data[5 * 7 + 2] = 9; // the fourth place counted from the second item's first line, whose places are 0 to 3
    EXPECT_FALSE(parameter.setResponseData(vpwEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid data received; too large sequence number (4)"));
    EXPECT_EQ(parameter.calibrationIds(vpwEcu), Texts{"CAL1"});
    log.clear();
    data = lines(1);
    data[2] = 0;
    EXPECT_FALSE(parameter.setResponseData(vpwEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid data received; too large sequence number (4294967295)"));
}

// Every way to lose one line of two or three items, on buses with and without checksums behind the lines.
TEST(CalibrationIds, ItemsThatCameWholeAreReadWhenALineWasLost)
{
    for (int const items : {2, 3}) {
        for (std::size_t const step : {7U, 8U}) {
            for (int lost = 0; lost < items * 4; ++lost) {
                Bytes data = step == 7 ? lines(items) : withChecksums(lines(items));
                auto const at = data.begin() + lost * static_cast<std::ptrdiff_t>(step);
                data.erase(at, at + static_cast<std::ptrdiff_t>(step));
                Texts expected{"CAL1", "CAL2"};
                if (items == 3) {
                    expected.emplace_back("CAL3");
                }
                auto const broken = static_cast<std::size_t>(lost / 4);
                expected[broken] = ""; // keeps the place of the others
                if (broken + 1 == expected.size()) {
                    expected.pop_back();
                }
                CalibrationIds parameter;
                EXPECT_TRUE(parameter.setResponseData(isoEcu, data)) << items << ' ' << step << ' ' << lost;
                EXPECT_EQ(parameter.calibrationIds(isoEcu), expected) << items << ' ' << step << ' ' << lost;
            }
        }
    }
}

TEST(CalibrationIds, WithoutAnyWholeItemAReplyThatLostALineIsRefused)
{
    support::LogCapture log;
    CalibrationIds parameter;
    Bytes data = lines(2);
    data.erase(data.begin() + 5 * 7, data.begin() + 6 * 7);
    data[2] = 0;
    EXPECT_FALSE(parameter.setResponseData(vpwEcu, data)) << "a sequence number of 0 belongs nowhere";
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 49"));
    EXPECT_TRUE(parameter.calibrationIds(vpwEcu).empty());
    data[2] = 2;
    EXPECT_FALSE(parameter.setResponseData(vpwEcu, data)) << "nor does one that came twice stand for another";
}

TEST(CalibrationIds, TooFewLinesAreRefused)
{
    support::LogCapture log;
    CalibrationIds parameter;
    Bytes data = lines(1);
    data.resize(21);
    EXPECT_FALSE(parameter.setResponseData(vpwEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 21"));
}

TEST(CalibrationIds, RefusesAnotherSignature)
{
    support::LogCapture log;
    ExposedCalibrationIds parameter;
    EXPECT_FALSE(parameter.fromBytes(vpwEcu, Bytes(28, 0x49)));
    EXPECT_TRUE(log.contains("ERROR Invalid data received; signature mismatch"));
}

TEST(CalibrationIds, RandomRepliesNeverAddMoreThanTheyHold)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x49, 0x04}, [&ecu](Bytes const& data) {
            CalibrationIds parameter;
            parameter.setResponseData(ecu, data);
            EXPECT_LE(parameter.calibrationIds(ecu).size(), data.size() / 16);
        });
    }
}

} // namespace
