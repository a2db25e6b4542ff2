#include "libobd/parameters/cleartroublecodes.h"
#include "tests/libobd/parameters/diagnosticsrig.h"
#include "tests/support/logcapture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using support::FakeEcu;
using support::LogCapture;
using testing::ElementsAre;
using testing::IsEmpty;

class ClearTroubleCodes : public testing::Test
{
protected:
    bool offer(std::string const& reply) { return diagnosticsrig::offer(m_clearing, m_ecu, reply); }

    std::shared_ptr<obd::IEcu> m_ecu = std::make_shared<FakeEcu>(0x7E8U);
    obd::ClearTroubleCodes m_clearing;
};

TEST_F(ClearTroubleCodes, RequestIsTheServiceAlone)
{
    EXPECT_EQ(diagnosticsrig::requestOf(m_clearing), std::vector<unsigned char>{0x04});
    EXPECT_EQ(m_clearing.timeout(), 1500U);
}

TEST_F(ClearTroubleCodes, AnAnswerOfOneByteIsEnough)
{
    LogCapture const log;
    EXPECT_TRUE(offer("44"));
    EXPECT_TRUE(m_clearing.isCleared(*m_ecu));
    EXPECT_THAT(log.lines(), IsEmpty());
}

TEST_F(ClearTroubleCodes, BytesBehindTheServiceDoNotMatter)
{
    EXPECT_TRUE(offer("44 AA AA"));
    EXPECT_TRUE(m_clearing.isCleared(*m_ecu));
}

TEST_F(ClearTroubleCodes, AModuleThatDidNotAnswerHasClearedNothingAndIsLoggedOnce)
{
    offer("44");
    FakeEcu const silent(0x7E9U);
    LogCapture const log;
    EXPECT_FALSE(m_clearing.isCleared(silent));
    EXPECT_THAT(log.lines(), ElementsAre("ERROR invalid ECU id 2025"));
}

TEST_F(ClearTroubleCodes, ARefusalClearsNothing)
{
    EXPECT_FALSE(offer("7F 04 22"));
    EXPECT_EQ(m_clearing.nack(), 0x22);
    EXPECT_FALSE(m_clearing.isCleared(*m_ecu));
}

TEST_F(ClearTroubleCodes, ClearForgetsTheAnswers)
{
    offer("44");
    m_clearing.clear();
    EXPECT_FALSE(m_clearing.isCleared(*m_ecu));
}

// The service byte is checked before, so only a derived class can hand it an empty reply.
class OpenedClearing : public obd::ClearTroubleCodes
{
public:
    using obd::ClearTroubleCodes::fromBytes;
};

TEST_F(ClearTroubleCodes, AnEmptyReplyTakesTheAnswerBack)
{
    OpenedClearing clearing;
    EXPECT_TRUE(clearing.fromBytes(m_ecu, {0x44}));
    EXPECT_FALSE(clearing.fromBytes(m_ecu, {}));
    LogCapture const log;
    EXPECT_FALSE(clearing.isCleared(*m_ecu));
    EXPECT_THAT(log.lines(), IsEmpty());
}

} // namespace
