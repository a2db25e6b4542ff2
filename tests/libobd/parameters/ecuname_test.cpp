#include "libobd/parameters/ecuname.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

namespace {

using namespace obd;
using namespace diagnosticsrig;
using Texts = std::vector<std::string>;

constexpr char const* engineControl = "49 0A 01 45 43 4D 00 2D 45 6E 67 69 6E 65 43 6F 6E 74 72 6F 6C 00 00";
constexpr char const* engineLines =
    "49 0A 01 45 43 4D 31 49 0A 02 2D 45 6E 67 49 0A 03 69 6E 65 43 49 0A 04 6F 6E 74 72 49 0A 05 6F 6C 00 00";

struct ExposedEcuName : EcuName
{
    using EcuName::fromBytes;
};

// A reply on CAN with this acronym and no name.
Bytes named(std::string const& acronym)
{
    Bytes data(23);
    data[0] = 0x49;
    data[1] = 0x0A;
    data[2] = 1;
    std::copy(acronym.begin(), acronym.end(), data.begin() + 3);
    data[7] = '-';
    return data;
}

TEST(EcuName, AsksForInfoType0A)
{
    EXPECT_EQ(requestOf(EcuName()), (Bytes{0x09, 0x0A}));
    EXPECT_EQ(EcuName().timeout(), 2500U);
}

TEST(EcuName, ReadsAcronymAndNameOnCan)
{
    support::LogCapture log;
    EcuName parameter;
    ASSERT_TRUE(offer(parameter, canEcu, engineControl));
    EXPECT_EQ(parameter.ecuAcronym(*canEcu), "ECM");
    EXPECT_EQ(parameter.description(*canEcu), "EngineControl");
    EXPECT_EQ(parameter.fullDescription(*canEcu), "Engine Control Module");
    EXPECT_TRUE(log.lines().empty());
}

TEST(EcuName, ANameWithNoDashAtItsFifthPlaceStillStoresBothStrings)
{
    support::LogCapture log;
    EcuName parameter;
    ASSERT_TRUE(offer(parameter, canEcu, "49 0A 01 45 43 4D 31 00 45 6E 67 00 6E 65 00 00 00 00 00 00 00 00 00"));
    EXPECT_EQ(log.lines(), Texts{"ERROR No delimeter found!"});
    EXPECT_EQ(parameter.ecuAcronym(*canEcu), "ECM1");
    EXPECT_EQ(parameter.description(*canEcu), "Engne");
}

TEST(EcuName, AnAcronymTcm2IsSpelledOut)
{
    EcuName parameter;
    ASSERT_TRUE(parameter.setResponseData(canEcu, named("TCM2")));
    EXPECT_EQ(parameter.fullDescription(*canEcu), "Transmission Control Module2");
    ASSERT_TRUE(parameter.setResponseData(canEcu, named("ECM1")));
    EXPECT_EQ(parameter.fullDescription(*canEcu), "Engine Control Module1");
    ASSERT_TRUE(parameter.setResponseData(canEcu, named("1ABS")));
    EXPECT_EQ(parameter.fullDescription(*canEcu), "1Anti-Lock Brake System (ABS) Control Module");
    ASSERT_TRUE(parameter.setResponseData(canEcu, named("XYZ")));
    EXPECT_EQ(parameter.fullDescription(*canEcu), "XYZ");
}

TEST(EcuName, TableOfAcronymsAgreesRowByRow)
{
    auto const rows = support::readTable("tests/libobd/parameters/ecunames.txt");
    ASSERT_EQ(rows.size(), 33U);
    for (auto const& row : rows) {
        EcuName parameter;
        ASSERT_TRUE(parameter.setResponseData(canEcu, named(row.at(0))));
        EXPECT_EQ(parameter.fullDescription(*canEcu), row.at(1));
    }
}

TEST(EcuName, ReadsFiveLinesWithAndWithoutChecksums)
{
    support::LogCapture log;
    EcuName parameter;
    ASSERT_TRUE(offer(parameter, isoEcu, engineLines));
    EXPECT_EQ(parameter.ecuAcronym(*isoEcu), "ECM1");
    EXPECT_EQ(parameter.description(*isoEcu), "EngineControl");
    EXPECT_EQ(log.lines(), Texts{"DEBUG No checksum in use"});
    parameter.clear();
    log.clear();
    ASSERT_TRUE(parameter.setResponseData(isoEcu, withChecksums(support::hexBytes(engineLines))));
    EXPECT_EQ(parameter.ecuAcronym(*isoEcu), "ECM1");
    EXPECT_EQ(parameter.description(*isoEcu), "EngineControl");
    EXPECT_EQ(log.lines(), Texts{"DEBUG Checksum in use"});
}

TEST(EcuName, ASequenceNumberAbove5IsRefused)
{
    support::LogCapture log;
    EcuName parameter;
    Bytes data = support::hexBytes(engineLines);
    data[4 * 7 + 2] = 6;
    EXPECT_FALSE(parameter.setResponseData(isoEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid data received; too large sequence number (5)"));
    EXPECT_EQ(parameter.ecuAcronym(*isoEcu), "");
}

TEST(EcuName, ShortRepliesAreRefusedAndTheOldNameStays)
{
    EcuName parameter;
    ASSERT_TRUE(offer(parameter, canEcu, engineControl));
    ASSERT_TRUE(offer(parameter, isoEcu, engineLines));
    support::LogCapture log;
    Bytes data = support::hexBytes(engineControl);
    data.pop_back();
    EXPECT_FALSE(parameter.setResponseData(canEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 22"));
    data = support::hexBytes(engineLines);
    data.pop_back();
    EXPECT_FALSE(parameter.setResponseData(isoEcu, data));
    EXPECT_TRUE(log.contains("ERROR Invalid number of data bytes: 34"));
    EXPECT_EQ(parameter.description(*canEcu), "EngineControl");
    EXPECT_EQ(parameter.description(*isoEcu), "EngineControl");
}

TEST(EcuName, RefusesAnotherSignature)
{
    support::LogCapture log;
    ExposedEcuName parameter;
    EXPECT_FALSE(parameter.fromBytes(isoEcu, Bytes(35, 0x49)));
    EXPECT_TRUE(log.contains("ERROR Invalid data received; signature mismatch"));
}

TEST(EcuName, AModuleThatDidNotAnswerHasNoNameAndALogLine)
{
    support::LogCapture log;
    EcuName const parameter;
    EXPECT_EQ(parameter.ecuAcronym(*canEcu), "");
    EXPECT_EQ(parameter.description(*canEcu), "");
    EXPECT_EQ(parameter.fullDescription(*canEcu), "");
    EXPECT_EQ(log.lines(), Texts(3, "ERROR invalid ECU id 2024"));
}

TEST(EcuName, RandomRepliesAreReadOrRefusedWithoutChange)
{
    for (ObdProtocol const protocol : allProtocols) {
        auto const ecu = makeEcu(protocol, 0x10);
        bool const can = protocol == ObdProtocolCan11 || protocol == ObdProtocolCan29;
        forRandomReplies({0x49, 0x0A}, [&ecu, can](Bytes const& data) {
            EcuName parameter;
            ASSERT_TRUE(offer(parameter, ecu, can ? engineControl : engineLines));
            std::string const before = parameter.ecuAcronym(*ecu);
            if (parameter.setResponseData(ecu, data)) {
                EXPECT_LE(parameter.ecuAcronym(*ecu).size(), 4U);
                EXPECT_LE(parameter.description(*ecu).size(), 15U);
            } else {
                EXPECT_EQ(parameter.ecuAcronym(*ecu), before);
                EXPECT_EQ(parameter.description(*ecu), "EngineControl");
            }
        });
    }
}

} // namespace
