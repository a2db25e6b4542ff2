#include "libobd/parameters/identificationnumber.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;

std::string vin(VehicleIdentificationNumber const& parameter, std::shared_ptr<IEcu> const& ecu)
{
    return parameter.vehicleIdentificationNumber(ecu);
}

constexpr char const* canVin = "49 02 01 31 4E 34 41 4C 33 41 50 37 44 43 30 30 30 30 30 30";
constexpr char const* vinLines[] = {"49 02 01 00 00 00 57", "49 02 02 41 55 5A 5A", "49 02 03 5A 38 50 34",
                                    "49 02 04 36 41 30 30", "49 02 05 30 30 30 30"};

Bytes lines(std::vector<int> const& order)
{
    Bytes data;
    for (int const number : order) {
        Bytes const line = support::hexBytes(vinLines[number - 1]);
        data.insert(data.end(), line.begin(), line.end());
    }
    return data;
}

TEST(VehicleIdentificationNumber, AsksAndWaitsTwiceAsLong)
{
    VehicleIdentificationNumber parameter;
    EXPECT_EQ(requestOf(parameter), (Bytes{0x09, 0x02}));
    EXPECT_EQ(parameter.timeout(), 3000U);
    EXPECT_EQ(requestOf(EngineSerialNumber()), (Bytes{0x09, 0x0D}));
    EXPECT_EQ(EngineSerialNumber().timeout(), 3000U);
    EXPECT_EQ(requestOf(Erotan()), (Bytes{0x09, 0x0F}));
    EXPECT_EQ(Erotan().timeout(), 3000U);
}

TEST(VehicleIdentificationNumber, ReadsAReplyOfCan)
{
    support::LogCapture log;
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, canVin));
    EXPECT_EQ(vin(parameter, canEcu), "1N4AL3AP7DC000000");
    EXPECT_EQ(log.lines(), std::vector<std::string>{"INFO Number of items: 1"});
}

TEST(VehicleIdentificationNumber, PaddedWithZeroBytesInFrontThePaddingVanishes)
{
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 02 01 00 00 00 41 42 00 43 00 00 00 00 00 00 00 00 00 00"));
    EXPECT_EQ(vin(parameter, canEcu), std::string("AB\0C", 4));
    ASSERT_TRUE(offer(parameter, canEcu, "49 02 01 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00 00"));
    EXPECT_EQ(vin(parameter, canEcu), "");
}

TEST(VehicleIdentificationNumber, BytesBehindTheNumberAreIgnoredOnCan)
{
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, std::string(canVin) + " 41 41"));
    EXPECT_EQ(vin(parameter, canEcu), "1N4AL3AP7DC000000");
}

TEST(VehicleIdentificationNumber, ShortRepliesAreRefusedAndTheOldNumberStays)
{
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, canVin));
    support::LogCapture log;
    EXPECT_FALSE(offer(parameter, canEcu, "49 02 01 31 4E 34 41 4C 33 41 50 37 44 43 30 30 30 30 30"));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid number of data bytes: 19"});
    EXPECT_EQ(vin(parameter, canEcu), "1N4AL3AP7DC000000");

    Bytes legacy = lines({1, 2, 3, 4, 5});
    legacy.pop_back();
    EXPECT_FALSE(parameter.setResponseData(isoEcu, legacy));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 34"));
    EXPECT_EQ(vin(parameter, isoEcu), "");
}

TEST(VehicleIdentificationNumber, FramesInTheOrder31254GiveTheSameTextAsInOrder)
{
    VehicleIdentificationNumber inOrder;
    ASSERT_TRUE(inOrder.setResponseData(isoEcu, lines({1, 2, 3, 4, 5})));
    VehicleIdentificationNumber mixed;
    ASSERT_TRUE(mixed.setResponseData(isoEcu, lines({3, 1, 2, 5, 4})));
    EXPECT_EQ(vin(inOrder, isoEcu), "WAUZZZ8P46A000000");
    EXPECT_EQ(vin(mixed, isoEcu), "WAUZZZ8P46A000000");
}

TEST(VehicleIdentificationNumber, ReadsLinesWithChecksumsAndWithout)
{
    for (ObdProtocol const protocol : {ObdProtocolIso9141, ObdProtocolJ1850}) {
        auto const ecu = makeEcu(protocol, 0x10);
        VehicleIdentificationNumber parameter;
        ASSERT_TRUE(parameter.setResponseData(ecu, withChecksums(lines({2, 1, 3, 5, 4}))));
        EXPECT_EQ(vin(parameter, ecu), "WAUZZZ8P46A000000");
    }
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(parameter.setResponseData(kwpEcu, lines({1, 2, 3, 4, 5})));
    EXPECT_EQ(vin(parameter, kwpEcu), "WAUZZZ8P46A000000");
}

// A bench adapter's J1850 reply with its own check bytes, as the parser leaves them.
TEST(VehicleIdentificationNumber, ReadsACapturedJ1850Reply)
{
    auto const ecu = makeEcu(ObdProtocolJ1850, 0x10);
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, ecu,
                      "49 02 01 00 00 00 57 B3 49 02 02 44 58 2D 53 99 49 02 03 49 4D 30 30 11 "
                      "49 02 04 31 39 32 31 B6 49 02 05 32 33 34 35 A8"));
    EXPECT_EQ(vin(parameter, ecu), "WDX-SIM0019212345");
}

TEST(VehicleIdentificationNumber, BytesBehindTheLastLineAreIgnored)
{
    VehicleIdentificationNumber parameter;
    Bytes data = lines({1, 2, 3, 4, 5});
    data.push_back(0x55);
    ASSERT_TRUE(parameter.setResponseData(isoEcu, data));
    EXPECT_EQ(vin(parameter, isoEcu), "WAUZZZ8P46A000000");
}

TEST(VehicleIdentificationNumber, AFrameWithSequence6IsRefused)
{
    support::LogCapture log;
    VehicleIdentificationNumber parameter;
    Bytes data = lines({1, 2, 3, 4, 5});
    data[4 * 7 + 2] = 6;
    EXPECT_FALSE(parameter.setResponseData(isoEcu, data));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid sequence number: 5"});
    EXPECT_EQ(vin(parameter, isoEcu), "");
    log.clear();
    data[4 * 7 + 2] = 0;
    EXPECT_FALSE(parameter.setResponseData(isoEcu, data));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid sequence number: 4294967295"});
}

TEST(VehicleIdentificationNumber, ALineOfAnotherItemSpoilsTheReply)
{
    support::LogCapture log;
    VehicleIdentificationNumber parameter;
    Bytes data = lines({1, 2, 3, 4, 5});
    data[3 * 7 + 1] = 0x04;
    EXPECT_FALSE(parameter.setResponseData(isoEcu, data));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid data received: signature mismatch"});
    EXPECT_EQ(vin(parameter, isoEcu), "");
}

TEST(IdentificationNumberParser, RefusesAnotherSignatureOnCan)
{
    support::LogCapture log;
    IdentificationNumberParser parser({0x49, 0x02}, 20);
    EXPECT_FALSE(parser.fromCanSystem(0x7E8, Bytes(20, 0x49)));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Invalid data received: signature mismatch"});
    EXPECT_EQ(parser.number(*canEcu), "");
}

TEST(VehicleIdentificationNumber, ANewTextReplacesTheOldAndModulesStayApart)
{
    auto const other = makeEcu(ObdProtocolCan11, 0x7E9);
    support::LogCapture log;
    VehicleIdentificationNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, canVin));
    ASSERT_TRUE(offer(parameter, other, "49 02 01 4C 46 56 33 42 32 38 52 38 41 33 30 30 30 30 30 30"));
    EXPECT_EQ(vin(parameter, canEcu), "1N4AL3AP7DC000000");
    EXPECT_EQ(vin(parameter, other), "LFV3B28R8A3000000");
    ASSERT_TRUE(offer(parameter, canEcu, "49 02 01 4C 46 56 33 42 32 38 52 38 41 33 30 30 30 30 30 30"));
    EXPECT_EQ(vin(parameter, canEcu), "LFV3B28R8A3000000");
    log.clear();
    parameter.clear();
    EXPECT_EQ(vin(parameter, canEcu), "");
    EXPECT_TRUE(log.lines().empty()) << "a module need not have the item";
}

TEST(EngineSerialNumber, ReadsItsOwnItem)
{
    EngineSerialNumber parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 0D 01 00 00 00 00 00 00 00 00 00 00 00 45 4E 31 32 33 34"));
    EXPECT_EQ(parameter.engineSerialNumber(canEcu), "EN1234");
    EXPECT_FALSE(offer(parameter, canEcu, canVin));
}

TEST(Erotan, ReadsItsOwnItem)
{
    Erotan parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 0F 01 65 31 2A 37 31 35 2F 32 30 30 37 2A 30 30 30 31 00"));
    EXPECT_EQ(parameter.erotan(canEcu), "e1*715/2007*0001");
}

TEST(IdentificationNumber, RandomRepliesAreReadOrRefusedWithoutChange)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        forRandomReplies({0x49, 0x02}, [&ecu](Bytes const& data) {
            VehicleIdentificationNumber parameter;
            bool const before = parameter.setResponseData(ecu, ecu->protocol() == ObdProtocolCan11 ||
                                                                       ecu->protocol() == ObdProtocolCan29
                                                                   ? support::hexBytes(canVin)
                                                                   : lines({1, 2, 3, 4, 5}));
            ASSERT_TRUE(before);
            std::string const old = vin(parameter, ecu);
            if (!parameter.setResponseData(ecu, data)) {
                EXPECT_EQ(vin(parameter, ecu), old);
            } else {
                EXPECT_LE(vin(parameter, ecu).size(), 20U);
            }
        });
    }
}

} // namespace
