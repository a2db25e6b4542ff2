#include "tests/support/connectionrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <utility>

namespace {

using obd::Closed;
using obd::Connected;
using obd::DeviceReady;
using obd::VehicleProtocol;
using support::ConnectionManager;
using support::PhaseRecorder;
using support::SilentChannel;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr VehicleProtocol automatic = VehicleProtocol::Automatic;

TEST_F(ConnectionManager, AnOpeningGoesThroughDeviceReadyAndConnected)
{
    auto const channel = workingChannel();
    EXPECT_TRUE(open(channel));
    EXPECT_THAT(m_phases.phases, ElementsAre(DeviceReady, Connected));
    EXPECT_TRUE(m_manager.isBusy());
    EXPECT_TRUE(m_manager.getAdapter()->isEnabled());
    EXPECT_TRUE(m_manager.getProxy()->isConnected());
    EXPECT_EQ(m_manager.getProxy()->firstEcu()->id(), 0x7E8U);
    EXPECT_EQ(channel->delimiter(), '>');
    EXPECT_THAT(infoLines(), ElementsAre("openConnection enter", "-got lock (open)", "openConnection exit:success"));
    m_manager.getProxy()->setDevice(nullptr);
}

TEST_F(ConnectionManager, TheAdapterIsThereFromDeviceReadyOnTheConnectionOnlyAtConnected)
{
    auto const channel = workingChannel();
    std::vector<std::pair<bool, bool>> adapterAndBusy;
    std::vector<bool> linked;
    m_phases.onPhase = [&](int) {
        adapterAndBusy.emplace_back(m_manager.getAdapter() != nullptr, m_manager.isBusy());
        linked.push_back(m_manager.getProxy()->isConnected());
    };
    EXPECT_TRUE(open(channel));
    EXPECT_THAT(adapterAndBusy, ElementsAre(std::pair(true, false), std::pair(true, true)));
    EXPECT_THAT(linked, ElementsAre(false, true));
}

TEST_F(ConnectionManager, AfterEachPhaseTheListenersAreGivenTenMilliseconds)
{
    auto const channel = workingChannel();
    PhaseRecorder last;
    m_manager.addPhaseListener(&last);
    std::vector<unsigned int> times;
    m_phases.onPhase = [&](int) { times.push_back(channel->now()); };
    last.onPhase = [&](int) { times.push_back(channel->now()); };
    EXPECT_TRUE(open(channel));
    ASSERT_EQ(times.size(), 4U);
    EXPECT_EQ(times[0], times[1]) << "the pause comes after the last listener";
    EXPECT_EQ(times[2], times[3]);
    EXPECT_EQ(channel->now(), times[3] + 10);
    auto const firstAfter = [&] {
        for (auto const& event : channel->log()) {
            if (event.kind == support::ChannelEvent::Kind::Sent && event.text == "ATTP0\r") {
                return event.atMs;
            }
        }
        return 0U;
    }();
    EXPECT_EQ(firstAfter, times[0] + 10);
}

TEST_F(ConnectionManager, RestoringTheAdapterComesFirstAndItsResultDoesNotMatter)
{
    auto const channel = newChannel();
    channel->expect("ATD").reply("?\r\r>");
    channel->expect("ATZ");
    support::expectOpening(*channel);
    EXPECT_TRUE(m_manager.openConnection(channel, automatic, true));
}

TEST_F(ConnectionManager, AnEmptyPointerIsNoConnectionAlsoWithLoggers)
{
    m_manager.addLogger(&m_tap);
    EXPECT_FALSE(open(nullptr));
    EXPECT_THAT(m_phases.phases, IsEmpty());
    EXPECT_THAT(m_log.lines(), ElementsAre("INFO openConnection enter", "INFO -got lock (open)",
                                           "FATAL No connection set", "INFO openConnection exit:failure"));
    EXPECT_EQ(m_manager.getAdapter(), nullptr);
    EXPECT_TRUE(open(workingChannel())) << "nothing is left behind";
}

TEST_F(ConnectionManager, ASilentAdapterIsToldByNoPhase)
{
    EXPECT_FALSE(open(std::make_shared<SilentChannel>()));
    EXPECT_TRUE(m_log.contains("FATAL Failed to init device"));
    EXPECT_TRUE(m_log.contains("INFO openConnection exit:failure"));
    EXPECT_THAT(m_phases.phases, IsEmpty());
    EXPECT_EQ(m_manager.getAdapter(), nullptr);
    EXPECT_FALSE(m_manager.isBusy());
}

TEST_F(ConnectionManager, AdapterPresentVehicleAbsentLeavesTheAdapter)
{
    EXPECT_FALSE(failAtVehicle(newChannel()));
    EXPECT_TRUE(m_log.contains("FATAL Failed to detect vehicle/working protocol"));
    EXPECT_THAT(m_phases.phases, ElementsAre(DeviceReady));
    EXPECT_NE(m_manager.getAdapter(), nullptr);
    EXPECT_FALSE(m_manager.isBusy());
    EXPECT_FALSE(m_manager.getProxy()->isConnected());
}

TEST_F(ConnectionManager, AProxyThatFindsNoModuleLeavesTheAdapterAndHoldsIt)
{
    auto const channel = newChannel();
    support::expectInitialize(*channel);
    support::expectDetectVehicle(*channel);
    channel->expect("0100").reply("NO DATA\r\r>");
    EXPECT_FALSE(open(channel));
    EXPECT_TRUE(m_log.contains("FATAL Failed to initialize proxy"));
    EXPECT_THAT(m_phases.phases, ElementsAre(DeviceReady));
    EXPECT_NE(m_manager.getAdapter(), nullptr);
    EXPECT_FALSE(m_manager.isBusy());
    EXPECT_TRUE(m_manager.getProxy()->isConnected());
    support::expectClose(*channel);
    m_manager.closeConnection();
    EXPECT_EQ(m_manager.getAdapter(), nullptr);
    EXPECT_FALSE(m_manager.getProxy()->isConnected());
}

TEST_F(ConnectionManager, ClosingAnIdleManagerTellsClosedAndDoesNoHarm)
{
    m_manager.closeConnection();
    m_manager.closeConnection();
    EXPECT_THAT(m_phases.phases, ElementsAre(Closed, Closed));
    EXPECT_THAT(m_log.lines(),
                ElementsAre("INFO closeConnection enter", "INFO -got lock (close)", "INFO closeConnection exit",
                            "INFO closeConnection enter", "INFO -got lock (close)", "INFO closeConnection exit"));
    EXPECT_TRUE(open(workingChannel()));
}

TEST_F(ConnectionManager, ClosingTakesTheAdapterDownThenTellsThenLetsGo)
{
    auto const channel = workingChannel();
    ASSERT_TRUE(open(channel));
    auto const device = m_manager.getAdapter();
    support::expectClose(*channel);
    m_phases.onPhase = [&](int) {
        EXPECT_EQ(channel->sentBytes().back(), "ATLP\r");
        EXPECT_FALSE(device->isEnabled());
        EXPECT_EQ(m_manager.getAdapter(), device);
        EXPECT_TRUE(m_manager.isBusy());
    };
    m_manager.closeConnection();
    EXPECT_THAT(m_phases.phases, ElementsAre(DeviceReady, Connected, Closed));
    EXPECT_EQ(m_manager.getAdapter(), nullptr);
    EXPECT_FALSE(m_manager.isBusy());
    EXPECT_EQ(device.use_count(), 1);
    m_phases.onPhase = [](int) {};
    m_manager.closeConnection();
    EXPECT_EQ(channel->sentBytes().back(), "ATLP\r") << "closing twice sends nothing more";
}

TEST_F(ConnectionManager, AClosedChannelIsReleased)
{
    auto const channel = workingChannel();
    ASSERT_TRUE(open(channel));
    support::expectClose(*channel);
    m_manager.closeConnection();
    EXPECT_EQ(channel.use_count(), 1);
}

TEST_F(ConnectionManager, AFailedOpeningIsTakenDownByClose)
{
    auto const channel = newChannel();
    EXPECT_FALSE(failAtVehicle(channel));
    m_manager.closeConnection();
    EXPECT_EQ(m_manager.getAdapter(), nullptr);
    EXPECT_EQ(channel.use_count(), 1);
    EXPECT_TRUE(open(workingChannel()));
}

TEST_F(ConnectionManager, OpeningTwiceReplacesTheConnectionWithoutClosingIt)
{
    auto const first = workingChannel();
    ASSERT_TRUE(open(first));
    auto const sent = first->sentBytes();
    auto const second = workingChannel();
    EXPECT_TRUE(open(second));
    EXPECT_THAT(m_phases.phases, ElementsAre(DeviceReady, Connected, DeviceReady, Connected));
    EXPECT_EQ(first->sentBytes(), sent);
    EXPECT_EQ(first.use_count(), 1);
    EXPECT_TRUE(m_manager.isBusy());
}

TEST_F(ConnectionManager, AnOpeningThatFailsOverAnOpenOneLeavesThatOne)
{
    ASSERT_TRUE(open(workingChannel()));
    EXPECT_FALSE(open(std::make_shared<SilentChannel>()));
    EXPECT_TRUE(m_manager.isBusy());
    EXPECT_TRUE(m_manager.getProxy()->isConnected());
}

TEST_F(ConnectionManager, InvalidatingAChannelEndsAnOpeningWithin250Milliseconds)
{
    for (unsigned int const after : {1U, 100U, 249U, 250U, 251U, 700U, 3000U}) {
        auto const channel = newChannel();
        support::expectInitialize(*channel);
        channel->expect("ATTP0").reply("OK\r\r>");
        channel->whenever("0100"); // a search that doesn't end
        unsigned int begin = 0;
        m_phases.onPhase = [&](int phase) {
            if (phase == DeviceReady) {
                begin = channel->now() + 10;
                channel->invalidateAfter(10 + after);
            }
        };
        EXPECT_FALSE(open(channel)) << after;
        EXPECT_LE(channel->now(), begin + after + 250) << after;
        m_manager.closeConnection();
    }
}

TEST_F(ConnectionManager, WhatTheDriverThrowsReachesTheCallerAndFreesTheLock)
{
    auto const channel = std::make_shared<SilentChannel>();
    channel->throws = true;
    EXPECT_THROW(open(channel), std::runtime_error);
    EXPECT_FALSE(m_log.contains("INFO openConnection exit:failure"));
    m_manager.closeConnection();
    EXPECT_TRUE(open(workingChannel()));
}

TEST_F(ConnectionManager, AListenerAddedTwiceIsRemovedOneEntryAtATime)
{
    m_manager.addPhaseListener(&m_phases);
    m_manager.closeConnection();
    EXPECT_THAT(m_phases.phases, ElementsAre(Closed, Closed));
    m_manager.removePhaseListener(&m_phases);
    m_manager.closeConnection();
    EXPECT_THAT(m_phases.phases, ElementsAre(Closed, Closed, Closed));
    m_manager.removePhaseListener(&m_phases);
    m_manager.removePhaseListener(&m_phases);
    m_manager.closeConnection();
    EXPECT_EQ(m_phases.phases.size(), 3U);
}

TEST_F(ConnectionManager, TheProxyStaysTheSameForLife)
{
    auto const proxy = m_manager.getProxy();
    ASSERT_NE(proxy, nullptr);
    auto const channel = workingChannel();
    ASSERT_TRUE(open(channel));
    support::expectClose(*channel);
    m_manager.closeConnection();
    EXPECT_EQ(m_manager.getProxy(), proxy);
}

} // namespace
