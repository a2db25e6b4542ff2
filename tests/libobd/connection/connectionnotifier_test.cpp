#include "libobd/connection/connectionnotifier.h"

#include <obd/iconnectionnotifier.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <thread>

namespace {

using obd::Closed;
using obd::Connected;
using obd::DeviceReady;
using testing::ElementsAre;
using testing::IsEmpty;

using Calls = std::vector<std::string>;

// Writes its name into the calls.
class Listener : public obd::IConnectionNotifierListener
{
public:
    Listener(Calls& calls, std::string name) : m_calls(calls), m_name(std::move(name)) {}

    void onConnectionOpened() override
    {
        m_calls.push_back(m_name + " opened");
        onOpened();
    }
    void onConnectionClosed() override { m_calls.push_back(m_name + " closed"); }

    std::function<void()> onOpened = [] {};

private:
    Calls& m_calls;
    std::string m_name;
};

class ConnectionNotifier : public testing::Test
{
protected:
    Calls m_calls;
    Listener m_a{m_calls, "a"};
    Listener m_b{m_calls, "b"};
    Listener m_c{m_calls, "c"};
    obd::ConnectionNotifier m_notifier;
};

TEST_F(ConnectionNotifier, TellsByPriorityWhateverTheOrderOfAttachment)
{
    m_notifier.attach(2, &m_c);
    m_notifier.attach(1, &m_b);
    m_notifier.attach(0, &m_a);
    m_notifier.onPhaseChanged(DeviceReady);
    EXPECT_THAT(m_calls, IsEmpty());
    m_notifier.onPhaseChanged(Connected);
    EXPECT_THAT(m_calls, ElementsAre("a opened", "b opened", "c opened"));
    m_calls.clear();
    m_notifier.onPhaseChanged(Closed);
    EXPECT_THAT(m_calls, ElementsAre("a closed", "b closed", "c closed"));
}

TEST_F(ConnectionNotifier, TellsInTheOrderOfAttachmentWithinAPriority)
{
    m_notifier.attach(1, &m_c);
    m_notifier.attach(1, &m_a);
    m_notifier.attach(1, &m_b);
    m_notifier.onPhaseChanged(Connected);
    EXPECT_THAT(m_calls, ElementsAre("c opened", "a opened", "b opened"));
}

TEST_F(ConnectionNotifier, AListenerAttachedWithPriority3IsNeverCalled)
{
    m_notifier.attach(3, &m_a);
    m_notifier.attach(~0U, &m_a);
    m_notifier.onPhaseChanged(Connected);
    m_notifier.onPhaseChanged(Closed);
    EXPECT_THAT(m_calls, IsEmpty());
}

TEST_F(ConnectionNotifier, DetachingAtAnotherPriorityDoesNothing)
{
    m_notifier.attach(1, &m_a);
    m_notifier.detach(0, &m_a);
    m_notifier.detach(2, &m_a);
    m_notifier.detach(3, &m_a);
    m_notifier.onPhaseChanged(Connected);
    EXPECT_THAT(m_calls, ElementsAre("a opened"));
}

TEST_F(ConnectionNotifier, DetachRemovesEveryEntryOfTheListener)
{
    m_notifier.attach(1, &m_a);
    m_notifier.attach(1, &m_b);
    m_notifier.attach(1, &m_a);
    m_notifier.onPhaseChanged(Connected);
    EXPECT_THAT(m_calls, ElementsAre("a opened", "b opened", "a opened"));
    m_notifier.detach(1, &m_a);
    m_notifier.onPhaseChanged(Closed);
    EXPECT_EQ(m_calls.back(), "b closed");
    EXPECT_EQ(m_calls.size(), 4U);
}

TEST_F(ConnectionNotifier, AFailedOpeningTellsNobody)
{
    m_notifier.attach(0, &m_a);
    m_notifier.onPhaseChanged(DeviceReady);
    m_notifier.onPhaseChanged(Closed);
    m_notifier.onPhaseChanged(Closed);
    EXPECT_THAT(m_calls, IsEmpty());
}

TEST_F(ConnectionNotifier, AConnectionThatReplacesAnotherIsToldAsOpenedAgain)
{
    m_notifier.attach(0, &m_a);
    m_notifier.onPhaseChanged(Connected);
    m_notifier.onPhaseChanged(DeviceReady);
    m_notifier.onPhaseChanged(Connected);
    EXPECT_THAT(m_calls, ElementsAre("a opened", "a opened"));
}

// An attempt over an open connection that got as far as the adapter hides the close of the one before.
TEST_F(ConnectionNotifier, ACloseAfterDeviceReadyIsSilent)
{
    m_notifier.attach(0, &m_a);
    m_notifier.onPhaseChanged(Connected);
    m_notifier.onPhaseChanged(DeviceReady);
    m_notifier.onPhaseChanged(Closed);
    EXPECT_THAT(m_calls, ElementsAre("a opened"));
}

TEST_F(ConnectionNotifier, IsConnectedInThePhaseConnectedAlone)
{
    EXPECT_FALSE(m_notifier.isConnected());
    for (int const phase : {DeviceReady + 0, 1, 2, 5, -1, Closed + 0}) {
        m_notifier.onPhaseChanged(phase);
        EXPECT_FALSE(m_notifier.isConnected()) << phase;
        m_notifier.onPhaseChanged(Connected);
        EXPECT_TRUE(m_notifier.isConnected());
    }
}

TEST_F(ConnectionNotifier, IsConnectedAlreadyWhenItTells)
{
    bool connected = false;
    m_a.onOpened = [&] { connected = m_notifier.isConnected(); };
    m_notifier.attach(0, &m_a);
    m_notifier.onPhaseChanged(Connected);
    EXPECT_TRUE(connected);
}

TEST_F(ConnectionNotifier, ListsComeAndGoWhilePhasesChange)
{
    class Counter : public obd::IConnectionNotifierListener
    {
    public:
        void onConnectionOpened() override { ++calls; }
        void onConnectionClosed() override { ++calls; }
        std::atomic<int> calls{0};
    };
    Counter standing;
    m_notifier.attach(1, &standing);
    std::vector<std::thread> threads;
    for (unsigned int priority = 0; priority < 3; ++priority) {
        threads.emplace_back([this, priority] {
            for (int i = 0; i < 200; ++i) {
                Counter passing;
                m_notifier.attach(priority, &passing);
                EXPECT_LE(passing.calls, 1000);
                m_notifier.detach(priority, &passing);
            }
        });
    }
    for (int i = 0; i < 200; ++i) {
        m_notifier.onPhaseChanged(Connected);
        m_notifier.onPhaseChanged(Closed);
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(standing.calls, 400);
}

} // namespace
