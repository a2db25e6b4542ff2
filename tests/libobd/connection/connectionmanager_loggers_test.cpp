#include "tests/support/connectionrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>

namespace {

using obd::DeviceReady;
using support::ConnectionManager;
using support::PhaseRecorder;
using support::Tap;
using testing::ElementsAre;
using testing::IsEmpty;

TEST_F(ConnectionManager, ALoggerAddedBeforeHearsTheWholeOpening)
{
    auto const channel = workingChannel();
    m_manager.addLogger(&m_tap);
    ASSERT_TRUE(open(channel));
    EXPECT_EQ(m_tap.sent, channel->sentBytes());
    EXPECT_GT(m_tap.received, 10);
}

TEST_F(ConnectionManager, ALoggerAddedOnAConnectionHearsItAndTheNext)
{
    auto const channel = workingChannel();
    ASSERT_TRUE(open(channel));
    m_manager.addLogger(&m_tap);
    support::expectClose(*channel);
    m_manager.closeConnection();
    EXPECT_THAT(m_tap.sent, ElementsAre("ATLP\r"));
    auto const next = workingChannel();
    ASSERT_TRUE(open(next));
    EXPECT_EQ(m_tap.sent.size(), 1 + next->sentBytes().size());
}

TEST_F(ConnectionManager, ALoggerAddedDuringAnOpeningHearsTheRestOfIt)
{
    auto const channel = workingChannel();
    m_phases.onPhase = [this](int phase) {
        if (phase == DeviceReady) {
            m_manager.addLogger(&m_tap);
        }
    };
    ASSERT_TRUE(open(channel));
    ASSERT_FALSE(m_tap.sent.empty());
    EXPECT_EQ(m_tap.sent.front(), "ATTP0\r");
}

TEST_F(ConnectionManager, ALoggerRemovedDuringAnOpeningHearsNothingMore)
{
    auto const channel = workingChannel();
    m_manager.addLogger(&m_tap);
    m_phases.onPhase = [this](int) { m_manager.removeLogger(&m_tap); };
    ASSERT_TRUE(open(channel));
    EXPECT_EQ(m_tap.sent.back(), "ATST64\r");
}

TEST_F(ConnectionManager, ALoggerRemovedAfterAFailedOpeningHearsNothingMore)
{
    auto const channel = newChannel();
    channel->whenever("X");
    m_manager.addLogger(&m_tap);
    EXPECT_FALSE(failAtVehicle(channel));
    m_manager.removeLogger(&m_tap);
    m_tap.sent.clear();
    channel->send({'X', '\r'});
    EXPECT_THAT(m_tap.sent, IsEmpty());
}

TEST_F(ConnectionManager, ALoggerAddedAfterAFailedOpeningIsOnTheChannel)
{
    auto const channel = newChannel();
    channel->whenever("X");
    EXPECT_FALSE(failAtVehicle(channel));
    m_manager.addLogger(&m_tap);
    channel->send({'X', '\r'});
    EXPECT_THAT(m_tap.sent, ElementsAre("X\r"));
}

TEST_F(ConnectionManager, ARetryOnTheSameChannelHearsEachLineOnce)
{
    auto const channel = newChannel();
    channel->whenever("X");
    m_manager.addLogger(&m_tap);
    EXPECT_FALSE(failAtVehicle(channel));
    EXPECT_FALSE(open(channel));
    channel->send({'X', '\r'});
    EXPECT_EQ(std::count(m_tap.sent.begin(), m_tap.sent.end(), "X\r"), 1);
    m_manager.removeLogger(&m_tap);
    channel->send({'X', '\r'});
    EXPECT_EQ(std::count(m_tap.sent.begin(), m_tap.sent.end(), "X\r"), 1) << "nothing of it is left behind";
}

TEST_F(ConnectionManager, ARemovedLoggerLeavesChannelsThatWereClosedOrReplaced)
{
    auto const first = workingChannel();
    auto const second = workingChannel();
    first->whenever("X");
    second->whenever("X");
    m_manager.addLogger(&m_tap);
    ASSERT_TRUE(open(first));
    ASSERT_TRUE(open(second));
    support::expectClose(*second);
    m_manager.closeConnection();
    m_manager.removeLogger(&m_tap);
    m_tap.sent.clear();
    first->send({'X', '\r'});
    second->send({'X', '\r'});
    EXPECT_THAT(m_tap.sent, IsEmpty());
}

TEST_F(ConnectionManager, ALoggerAddedBesideOrAfterAFailedSecondOpeningHearsBothChannels)
{
    auto const open = workingChannel();
    auto const failing = newChannel();
    open->whenever("X");
    failing->whenever("X");
    ASSERT_TRUE(this->open(open));
    m_phases.onPhase = [this](int) { m_manager.addLogger(&m_tap); };
    EXPECT_FALSE(failAtVehicle(failing));
    Tap second;
    m_manager.addLogger(&second);
    m_tap.sent.clear();
    open->send({'X', '\r'});
    EXPECT_THAT(m_tap.sent, ElementsAre("X\r"));
    EXPECT_THAT(second.sent, ElementsAre("X\r")) << "it still stands";
    failing->send({'X', '\r'});
    EXPECT_THAT(second.sent, ElementsAre("X\r", "X\r"));
    m_manager.removeLogger(&m_tap);
    m_manager.removeLogger(&second);
    open->send({'X', '\r'});
    EXPECT_EQ(second.sent.size(), 2U);
    EXPECT_EQ(m_tap.sent.size(), 2U);
}

TEST_F(ConnectionManager, ALoggerAddedAfterTheCloseIsNotOnTheOldChannel)
{
    auto const channel = workingChannel();
    channel->whenever("X");
    ASSERT_TRUE(open(channel));
    support::expectClose(*channel);
    m_manager.closeConnection();
    m_manager.addLogger(&m_tap);
    channel->send({'X', '\r'});
    EXPECT_THAT(m_tap.sent, IsEmpty());
}

TEST_F(ConnectionManager, LoggersAreCalledInTheOrderOfTheirAdding)
{
    Tap second;
    m_manager.addLogger(&m_tap);
    m_manager.addLogger(&second);
    m_manager.removeLogger(&m_tap);
    m_manager.addLogger(&m_tap);
    ASSERT_TRUE(open(workingChannel()));
    EXPECT_EQ(m_tap.sent, second.sent);
    m_manager.removeLogger(&second);
    m_manager.removeLogger(&second);
}

} // namespace
