// The life of connections of the whole library, on simulated cars in virtual time, with the worker running.

#include "libobd/dispatch/callback.h"
#include "libobd/dispatch/fetcher.h"
#include "libobd/query/freezeframeconfigurationquery.h"
#include "simulator/simulation.h"
#include "tests/support/dispatchloop.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"
#include "tests/support/process/failingallocation.h"
#include "tests/support/wire/peerconnection.h"
#include "tests/support/workerclock.h"

#include <obd/databridge.h>
#include <obd/iconnectionmanager.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iconnectionservice.h>
#include <obd/idataconnection.h>
#include <obd/iecumanager.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <obd/itroublecodeservice.h>
#include <obd/obdvelmorabuilder.h>
#include <tervex/observer.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

namespace {

using testing::ElementsAre;

constexpr auto automatic = obd::VehicleProtocol::Automatic;

std::shared_ptr<PeerConnection> car(std::string const& vehicle = "petrol-can11",
                                    std::vector<std::string> const& faults = {})
{
    return std::make_shared<PeerConnection>(obdsim::simulate({vehicle, "elm327-v1.5", faults}));
}

class Observer : public tervex::Observer<obd::IConnectionServiceObserver>
{
public:
    void onConnectionOpened() override { note("opened"); }
    void onActiveEcuChanged() override {}
    void onConnectionClosed() override { note("closed"); }

    std::vector<std::string> calls;
    std::thread::id thread;

private:
    void note(char const* call)
    {
        calls.emplace_back(call);
        thread = std::this_thread::get_id();
    }
};

// An application with one connection service, whose main thread is the test's.
class Connection : public testing::Test
{
protected:
    Connection() { m_service->attach(&m_observer); }
    ~Connection() override { m_service->detach(&m_observer); }

    obd::IConnectionManager& manager() { return *m_obd->getConnectionManager(); }
    bool open(std::shared_ptr<obd::IDataConnection> const& channel)
    {
        return manager().openConnection(channel, automatic, false);
    }
    // As an application does: on another thread, while this one dispatches.
    bool openOnThread(std::shared_ptr<obd::IDataConnection> const& channel)
    {
        bool opened = false;
        std::atomic<bool> done{false};
        std::thread opener([&] {
            opened = open(channel);
            done = true;
        });
        EXPECT_TRUE(m_loop.runUntil([&done] { return done.load(); }));
        opener.join();
        m_loop.runPending();
        return opened;
    }

    support::LogCapture m_log;
    support::WorkerClock m_clock;
    support::DispatchLoop m_loop;
    std::shared_ptr<obd::IObdVelmora> m_obd =
        obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
    std::shared_ptr<obd::IConnectionService> m_service = obd::ConnectionServiceBuilder::createConnectionService();
    Observer m_observer;
};

TEST_F(Connection, EveryCarOpensIsReadAndCloses)
{
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    for (char const* vehicle : {"petrol-pwm", "petrol-vpw", "petrol-iso9141", "petrol-kwp-slow", "petrol-kwp-fast",
                                "petrol-can11", "diesel-can29"}) {
        ASSERT_TRUE(openOnThread(car(vehicle))) << vehicle;
        EXPECT_TRUE(m_service->isConnected());
        EXPECT_NE(m_obd->getEcuManager()->getCurrentEcu(), nullptr) << vehicle;
        EXPECT_NE(codes->fetchMilStatus(), nullptr) << vehicle;
        manager().closeConnection();
        m_loop.runPending();
        EXPECT_EQ(codes->fetchMilStatus(), nullptr);
        EXPECT_THAT(m_observer.calls, ElementsAre("opened", "closed")) << vehicle;
        m_observer.calls.clear();
    }
}

TEST_F(Connection, HooksComeOnTheThreadThatDispatches)
{
    std::thread([this] { EXPECT_TRUE(open(car())); }).join();
    EXPECT_TRUE(m_service->isConnected());
    EXPECT_THAT(m_observer.calls, testing::IsEmpty());
    m_loop.runPending();
    EXPECT_THAT(m_observer.calls, ElementsAre("opened"));
    EXPECT_EQ(m_observer.thread, std::this_thread::get_id());
}

TEST_F(Connection, AnObserverMayCloseFromInsideADispatch)
{
    ASSERT_TRUE(open(car()));
    auto const callback = std::make_shared<obd::Callback>();
    callback->post([this] { manager().closeConnection(); });
    m_loop.runPending();
    EXPECT_FALSE(manager().isBusy());
    EXPECT_THAT(m_observer.calls, ElementsAre("opened", "closed"));
}

// Both sides may end it: here the adapter goes first.
TEST_F(Connection, ALinkThatBreaksIsClosedByTheApplication)
{
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    auto const channel = car();
    ASSERT_TRUE(openOnThread(channel));
    channel->breakLink();
    EXPECT_EQ(codes->fetchMilStatus(), nullptr);
    EXPECT_FALSE(manager().getProxy()->isConnected()) << "the driver has given the channel up";
    EXPECT_TRUE(m_service->isConnected()) << "until the application closes";
    manager().closeConnection();
    m_loop.runPending();
    EXPECT_FALSE(m_service->isConnected());
    EXPECT_THAT(m_observer.calls, ElementsAre("opened", "closed"));
}

TEST_F(Connection, ALinkLostInTheMiddleOfAnyStepFailsTheOpeningAndLeavesItReusable)
{
    auto const whole = car("petrol-can11-250");
    ASSERT_TRUE(open(whole));
    std::size_t const bytes = whole->bytesReceived();
    manager().closeConnection();
    ASSERT_GT(bytes, 200U);
    m_loop.runPending();
    m_observer.calls.clear();
    int failed = 0;
    for (std::size_t at = 1; at <= bytes; at += 3) {
        auto const channel = car("petrol-can11-250", {"loss@" + std::to_string(at)});
        m_log.clear();
        bool const opened = open(channel);
        failed += opened ? 0 : 1;
        EXPECT_EQ(m_log.contains("INFO openConnection exit:success"), opened);
        EXPECT_EQ(manager().isBusy(), opened);
        EXPECT_EQ(m_service->isConnected(), opened) << at;
        manager().closeConnection();
        EXPECT_EQ(manager().getAdapter(), nullptr);
        EXPECT_EQ(channel.use_count(), 1) << at;
    }
    EXPECT_GE(failed, static_cast<int>(bytes / 3) - 1);
    EXPECT_TRUE(open(car()));
}

TEST_F(Connection, AClosingWaitsForAnOpeningThatInvalidateEnds)
{
    auto const bridge = std::make_shared<obd::DataBridge>(); // nobody at its far end
    std::atomic<bool> opened{true};
    std::thread opener([&] { opened = open(bridge); });
    std::vector<unsigned char> bytes;
    while (!bridge->get(bytes)) { // the opening has begun to speak
    }
    EXPECT_TRUE(bridge->invalidate());
    auto const begin = std::chrono::steady_clock::now();
    manager().closeConnection();
    opener.join();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(2)); // 250 ms, and a slow machine
    EXPECT_FALSE(opened);
    EXPECT_EQ(manager().getAdapter(), nullptr);
    EXPECT_EQ(bridge.use_count(), 1);
}

TEST_F(Connection, QueuedWorkOfAClosedConnectionDoesNotRunOnTheNext)
{
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    ASSERT_TRUE(openOnThread(car()));
    ASSERT_NE(codes->fetchMilStatus(), nullptr);
    manager().closeConnection();
    auto const before = m_log.lines().size();
    auto const query = std::make_shared<obd::FreezeFrameConfigurationQuery>(0x7E8U, static_cast<unsigned char>(0));
    EXPECT_FALSE(obd::fetch(query));
    EXPECT_GT(m_log.lines().size(), before) << "the refusal is logged";
    ASSERT_TRUE(openOnThread(car()));
    EXPECT_NE(codes->fetchMilStatus(), nullptr);
}

TEST_F(Connection, EightThreadsFetchWhileTheConnectionCloses)
{
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    ASSERT_TRUE(openOnThread(car()));
    std::atomic<int> answered{0};
    std::atomic<bool> stop{false};
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&] {
            while (!stop) {
                answered += codes->fetchMilStatus() != nullptr ? 1 : 0;
                std::this_thread::yield();
            }
        });
    }
    EXPECT_TRUE(m_loop.runUntil([&answered] { return answered >= 40; }));
    manager().closeConnection();
    stop = true;
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(codes->fetchMilStatus(), nullptr);
    m_loop.runPending();
}

// The order of the locks: connection, phase listeners, a list of the notifier. ThreadSanitizer tells if it is turned.
TEST_F(Connection, EverythingAtOnceTakesItsLocksInOneOrder)
{
    class Tap : public obd::IConnectionLogger
    {
    public:
        void onDataSent(std::vector<unsigned char> const& /*data*/) override { ++calls; }
        void onDataReceived(std::vector<unsigned char> const& /*data*/) override { ++calls; }
        std::atomic<int> calls{0};
    };
    class Listener : public obd::IConnectionPhaseListener, public obd::IConnectionNotifierListener
    {
    public:
        void onPhaseChanged(int /*phase*/) override {}
        void onConnectionOpened() override {}
        void onConnectionClosed() override {}
    };
    std::atomic<int> running{0};
    std::atomic<bool> stop{false};
    std::vector<std::thread> threads;
    auto const spawn = [&](auto step) {
        ++running;
        threads.emplace_back([&stop, &running, step] {
            while (!stop) {
                step();
                std::this_thread::yield();
            }
            --running;
        });
    };
    Tap standing;
    manager().addLogger(&standing);
    spawn([this] {
        Tap tap;
        manager().addLogger(&tap);
        manager().removeLogger(&tap);
    });
    spawn([this] {
        Listener listener;
        manager().addPhaseListener(&listener);
        manager().removePhaseListener(&listener);
    });
    spawn([this] {
        Listener listener;
        m_obd->getConnectionNotifier()->attach(1, &listener);
        m_obd->getConnectionNotifier()->detach(1, &listener);
    });
    spawn([this] {
        (void)manager().isBusy();
        (void)m_service->adapter();
        (void)m_service->standardDescription();
        (void)manager().getProxy()->isConnected();
        (void)m_obd->getEcuManager()->getEcus();
    });
    spawn([this] { manager().closeConnection(); });
    for (int i = 0; i < 10; ++i) {
        open(car());
        m_loop.runPending();
    }
    stop = true;
    EXPECT_TRUE(m_loop.runUntil([&running] { return running == 0; }));
    for (std::thread& thread : threads) {
        thread.join();
    }
    manager().removeLogger(&standing);
    EXPECT_GT(standing.calls, 0);
    manager().closeConnection();
}

TEST_F(Connection, TwoHundredCyclesLeaveNothingBehind)
{
    auto const codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    auto const cycle = [&] {
        std::weak_ptr<PeerConnection> channel;
        std::weak_ptr<obd::IDevice> device;
        std::weak_ptr<obd::IEcu> ecu;
        {
            auto const fresh = car("petrol-can11-250");
            channel = fresh;
            ASSERT_TRUE(open(fresh));
        }
        device = manager().getAdapter();
        ecu = m_obd->getEcuManager()->getCurrentEcu();
        ASSERT_FALSE(ecu.expired());
        m_loop.runPending();
        manager().closeConnection();
        m_loop.runPending();
        m_log.clear();
        EXPECT_TRUE(channel.expired());
        EXPECT_TRUE(device.expired());
        EXPECT_LE(ecu.use_count(), 1) << "the proxy's list alone";
    };
    cycle();
    cycle();
    long const before = support::liveAllocations();
    for (int i = 0; i < 200; ++i) {
        cycle();
    }
    m_observer.calls.clear();
    EXPECT_LE(support::liveAllocations() - before, 20) << "nothing grows from cycle to cycle";
}

TEST_F(Connection, AHundredTopLevelObjectsComeAndGo)
{
    m_service->detach(&m_observer);
    m_service = nullptr;
    for (int i = 0; i < 100; ++i) {
        m_obd = nullptr;
        m_obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
        if (i % 10 == 0) {
            ASSERT_TRUE(open(car("petrol-can11-250")));
        }
        m_loop.runPending();
    }
    m_service = obd::ConnectionServiceBuilder::createConnectionService();
    m_service->attach(&m_observer);
    EXPECT_FALSE(m_service->isConnected());
}

} // namespace
