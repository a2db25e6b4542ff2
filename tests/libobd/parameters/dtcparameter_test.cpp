#include "libobd/parameters/dtcparameter.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/dtcrows.h"
#include "tests/support/logcapture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using support::FakeEcu;
using support::LoadedCodes;
using support::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;

std::vector<std::string> texts(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models)
{
    std::vector<std::string> codes;
    for (auto const& model : models) {
        codes.push_back(model->code);
    }
    return codes;
}

class DtcParameter : public testing::Test
{
protected:
    bool offer(std::string const& reply) { return diagnosticsrig::offer(m_codes, m_ecu, reply); }
    std::vector<std::string> codes() const { return texts(m_codes.getTroubleCodes(*m_ecu)); }

    // Has the list P0300 before the reply that a test is about.
    void rememberP0300() { offer(m_ecu->protocol() == obd::ObdProtocolCan11 ? "43 01 03 00" : "43 03 00 00 00 00 00"); }

    std::shared_ptr<obd::IEcu> m_ecu = std::make_shared<FakeEcu>(0x7E8U, obd::ObdProtocolCan11);
    obd::ConfirmedTroubleCodes m_codes;
};

class DtcParameterOnOlderBus : public DtcParameter
{
protected:
    DtcParameterOnOlderBus() { m_ecu = std::make_shared<FakeEcu>(0x10U, obd::ObdProtocolJ1850); }
};

TEST_F(DtcParameter, CanReplyWithoutCodesIsTrueAndLeavesNoEntry)
{
    rememberP0300();
    EXPECT_TRUE(offer("43 00"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameter, CanReplyWithOneCodeGivesP0133)
{
    EXPECT_TRUE(offer("43 01 01 33"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
}

TEST_F(DtcParameter, CanReplyShorterThanItsCountIsRefusedAndTheOldListIsGone)
{
    rememberP0300();
    LogCapture const log;
    EXPECT_FALSE(offer("43 02 01 33"));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid length: 4"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameter, HalfAPairIsTooShort)
{
    LogCapture const log;
    EXPECT_FALSE(offer("43 01 01"));
    EXPECT_FALSE(offer("43 01"));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid length: 3", "ERROR Invalid length: 2"));
}

TEST_F(DtcParameter, CanReplyWithoutACountIsRefusedSilently)
{
    rememberP0300();
    LogCapture const log;
    EXPECT_FALSE(offer("43"));
    EXPECT_THAT(log.lines(), IsEmpty());
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameter, BytesBehindTheCountedCodesAreIgnored)
{
    EXPECT_TRUE(offer("43 01 01 33 04 20 AA"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
    EXPECT_TRUE(offer("43 00 01 33"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameter, Can29HasACountByteToo)
{
    m_ecu = std::make_shared<FakeEcu>(0x18DAF110U, obd::ObdProtocolCan29);
    EXPECT_TRUE(offer("43 02 01 33 04 20"));
    EXPECT_THAT(codes(), ElementsAre("P0133", "P0420"));
}

TEST_F(DtcParameter, AllPlacesOfTheLargestCountAreRead)
{
    std::string reply = "43 FF";
    for (int i = 0; i < 255; ++i) {
        reply += " 04 20";
    }
    EXPECT_TRUE(offer(reply));
    EXPECT_EQ(codes().size(), 255U);
    LogCapture const log;
    EXPECT_FALSE(offer(reply.substr(0, reply.size() - 3)));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid length: 511"));
}

TEST_F(DtcParameter, ThePair1000IsNoCodeWhereas1001IsP1001)
{
    EXPECT_TRUE(offer("43 02 10 00 10 01"));
    EXPECT_THAT(codes(), ElementsAre("P1001"));
}

TEST_F(DtcParameter, ACodeThatIsReportedTwiceStandsTwice)
{
    EXPECT_TRUE(offer("43 02 04 20 04 20"));
    EXPECT_THAT(codes(), ElementsAre("P0420", "P0420"));
}

TEST_F(DtcParameter, ACodeOfTwoMakersStandsTwiceInTheList)
{
    LoadedCodes const catalogue{{0, "P0133", "Slow"}, {12, "P1001", "Ford's own"}, {19, "P1001", "Jaguar's own"}};
    EXPECT_TRUE(offer("43 02 10 01 01 33"));
    std::vector<std::string> meanings;
    for (auto const& model : m_codes.getTroubleCodes(*m_ecu)) {
        meanings.push_back(model->code + " " + model->description + " " + model->manufacturer);
    }
    EXPECT_THAT(meanings, ElementsAre("P1001 Ford's own Ford", "P1001 Jaguar's own Jaguar", "P0133 Slow Generic"));
}

TEST_F(DtcParameter, ACodeThatTheCatalogueDoesNotKnowGetsItsDefaults)
{
    EXPECT_TRUE(offer("43 02 0F FF 1F FF"));
    auto const models = m_codes.getTroubleCodes(*m_ecu);
    ASSERT_EQ(models.size(), 2U);
    EXPECT_EQ(models[0]->description, "ISO/SAE Reserved");
    EXPECT_EQ(models[0]->manufacturer, "Generic");
    EXPECT_EQ(models[1]->description, "Unknown Trouble Code");
    EXPECT_EQ(models[1]->manufacturer, "Unknown");
    EXPECT_EQ(models[1]->system, "Powertrain");
}

TEST_F(DtcParameter, EveryModuleHasItsOwnList)
{
    auto const second = std::make_shared<FakeEcu>(0x7E9U, obd::ObdProtocolCan11);
    auto const silent = std::make_shared<FakeEcu>(0x7EAU, obd::ObdProtocolCan11);
    EXPECT_TRUE(offer("43 01 01 33"));
    EXPECT_TRUE(diagnosticsrig::offer(m_codes, second, "43 01 07 00"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
    EXPECT_THAT(texts(m_codes.getTroubleCodes(*second)), ElementsAre("P0700"));
    EXPECT_THAT(m_codes.getTroubleCodes(*silent), IsEmpty());
    m_codes.clear();
    EXPECT_THAT(codes(), IsEmpty());
    EXPECT_THAT(m_codes.getTroubleCodes(*second), IsEmpty());
}

TEST_F(DtcParameter, NegativeReplyKeepsTheOldList)
{
    rememberP0300();
    EXPECT_FALSE(offer("7F 03 10"));
    EXPECT_EQ(m_codes.nack(), 0x10);
    EXPECT_THAT(codes(), ElementsAre("P0300"));
}

TEST_F(DtcParameter, ReplyOfAnotherServiceKeepsTheOldList)
{
    rememberP0300();
    LogCapture const log;
    EXPECT_FALSE(offer("47 01 01 33"));
    EXPECT_FALSE(offer(""));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Signature mismatch", "ERROR Signature mismatch"));
    EXPECT_THAT(codes(), ElementsAre("P0300"));
}

TEST_F(DtcParameterOnOlderBus, SevenBytesWithoutChecksumGiveP0133)
{
    EXPECT_TRUE(offer("43 01 33 00 00 00 00"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
}

TEST_F(DtcParameterOnOlderBus, EveryBusBeforeCanHasLinesOfThreePlaces)
{
    for (obd::ObdProtocol const protocol :
         {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolJ1850, obd::ObdProtocolUnknown}) {
        m_ecu = std::make_shared<FakeEcu>(0x10U, protocol);
        EXPECT_TRUE(offer("43 01 00 02 00 03 00")) << protocol;
        EXPECT_THAT(codes(), ElementsAre("P0100", "P0200", "P0300")) << protocol;
    }
}

TEST_F(DtcParameterOnOlderBus, EmptyPlacesGiveNothingAndLeaveNoEntry)
{
    rememberP0300();
    EXPECT_TRUE(offer("43 00 00 00 00 00 00"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameterOnOlderBus, ACodeBehindPaddingCounts)
{
    EXPECT_TRUE(offer("43 00 00 01 33 00 00"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
}

TEST_F(DtcParameterOnOlderBus, TwoLinesGiveTheCodesOfBothInOrder)
{
    EXPECT_TRUE(offer("43 01 00 02 00 03 00 43 43 00 82 00 C1 00"));
    EXPECT_THAT(codes(), ElementsAre("P0100", "P0200", "P0300", "C0300", "B0200", "U0100"));
}

TEST_F(DtcParameterOnOlderBus, ChecksumsBehindTheLinesAreNoCodes)
{
    EXPECT_TRUE(offer("43 01 33 00 00 00 00 2B"));
    EXPECT_THAT(codes(), ElementsAre("P0133"));
    EXPECT_TRUE(offer("43 03 00 03 02 03 03 14 43 03 04 00 00 00 00 0D"));
    EXPECT_THAT(codes(), ElementsAre("P0300", "P0302", "P0303", "P0304"));
}

TEST_F(DtcParameterOnOlderBus, FiftySixBytesAreReadBothWays)
{
    std::string plain;
    std::string checked;
    for (int line = 0; line < 8; ++line) {
        plain += "43 01 00 02 00 03 00 ";
    }
    for (int line = 0; line < 7; ++line) {
        checked += "43 01 00 02 00 03 00 05 ";
    }
    EXPECT_TRUE(offer(plain));
    EXPECT_EQ(codes().size(), 24U);
    EXPECT_TRUE(offer(checked));
    EXPECT_EQ(codes().size(), 21U);
}

TEST_F(DtcParameterOnOlderBus, ACutLineMakesTheReplyUnusable)
{
    rememberP0300();
    LogCapture const log;
    EXPECT_FALSE(offer("43 01 00 02 00 03 00 43 43 00 82 00 C1 00 43 04 20"));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid data received"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameterOnOlderBus, ALineThatBeginsOtherwiseMakesTheReplyUnusable)
{
    LogCapture const log;
    EXPECT_FALSE(offer("43 01 00 02 00 03 00 47 43 00 82 00 C1 00"));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid data received"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST_F(DtcParameterOnOlderBus, LessThanALineIsTooShortAndTheOldListIsGone)
{
    rememberP0300();
    LogCapture const log;
    EXPECT_FALSE(offer("43 01 33 00 00 00"));
    EXPECT_FALSE(offer("43"));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR Invalid length: 6", "ERROR Invalid length: 1"));
    EXPECT_THAT(codes(), IsEmpty());
}

TEST(DtcParameterOnAnyBus, RandomRepliesAreReadOrRefused)
{
    LogCapture const log;
    for (obd::ObdProtocol const protocol : diagnosticsrig::allProtocols) {
        auto const ecu = diagnosticsrig::makeEcu(protocol);
        diagnosticsrig::forRandomReplies({0x43}, [&ecu](diagnosticsrig::Bytes const& reply) {
            obd::ConfirmedTroubleCodes codes;
            codes.setResponseData(ecu, reply);
            EXPECT_LE(codes.getTroubleCodes(*ecu).size(), reply.size() / 2);
        });
    }
}

} // namespace
