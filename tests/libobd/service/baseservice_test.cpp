#include "libobd/service/baseservice.h"
#include "tests/support/servicerig.h"

#include <obd/ivelmorasettings.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace {

using obd::UnitSystem;
using testing::ElementsAre;
using testing::IsEmpty;

// A service that writes down its hooks.
class Service : public obd::BaseService
{
public:
    using BaseService::BaseService;
    using BaseService::ecu;
    using BaseService::unitSystem;

    std::vector<std::string> hooks;
    std::thread::id hookThread;

private:
    void onServiceConnected() override { note("connected"); }
    void onServiceDisconnected() override { note("disconnected"); }
    void onEcuChanged() override { note("ecu"); }
    void onUnitSystemChanged() override { note("units"); }

    void note(char const* hook)
    {
        hooks.emplace_back(hook);
        hookThread = std::this_thread::get_id();
    }
};

class BaseService : public testing::Test
{
protected:
    BaseService() { m_rig.rig.proxy->addEcu(std::make_shared<support::FakeEcu>(0x7E9U)); }

    // As the connection manager does, without a dispatch afterwards.
    void connect()
    {
        m_rig.rig.proxy->setConnected(true);
        m_rig.notifier.onPhaseChanged(obd::Connected);
    }
    void disconnect()
    {
        m_rig.rig.proxy->setConnected(false);
        m_rig.notifier.onPhaseChanged(obd::Closed);
    }

    support::ServiceRig m_rig;
};

TEST_F(BaseService, BeforeAConnectionItIsEmpty)
{
    Service const service(&m_rig);
    EXPECT_FALSE(service.isConnected());
    EXPECT_EQ(service.ecu(), nullptr);
    EXPECT_EQ(service.unitSystem(), UnitSystem::Metric);
    EXPECT_THAT(service.hooks, IsEmpty());
}

TEST_F(BaseService, BuiltOnAConnectionItIsCompleteAtOnceWithoutAHook)
{
    m_rig.open();
    Service const service(&m_rig);
    EXPECT_TRUE(service.isConnected());
    ASSERT_NE(service.ecu(), nullptr);
    EXPECT_EQ(service.ecu()->id(), 0x7E8U);
    m_rig.rig.loop.runPending();
    EXPECT_THAT(service.hooks, IsEmpty());
}

// As after an opening that failed at the search for modules: the proxy holds the adapter.
TEST_F(BaseService, BuiltOnALinkWithoutModulesItIsConnectedWithoutOne)
{
    m_rig.rig.proxy->setConnected(true);
    Service const service(&m_rig);
    EXPECT_TRUE(service.isConnected());
    EXPECT_EQ(service.ecu(), nullptr);
}

TEST_F(BaseService, TheConnectedHookComesOnlyWithADispatch)
{
    Service service(&m_rig);
    std::thread([this] { connect(); }).join();
    EXPECT_TRUE(service.isConnected());
    EXPECT_EQ(service.ecu()->id(), 0x7E8U) << "the control modules are told first";
    EXPECT_THAT(service.hooks, IsEmpty());
    m_rig.rig.loop.runPending();
    EXPECT_THAT(service.hooks, ElementsAre("connected"));
    EXPECT_EQ(service.hookThread, std::this_thread::get_id());
}

TEST_F(BaseService, TheDisconnectedHookComesOnlyWithADispatch)
{
    Service service(&m_rig);
    m_rig.open();
    service.hooks.clear();
    std::thread([this] { disconnect(); }).join();
    EXPECT_FALSE(service.isConnected());
    EXPECT_EQ(service.ecu(), nullptr);
    m_rig.rig.loop.runPending();
    EXPECT_THAT(service.hooks, ElementsAre("ecu", "disconnected"));
}

// The module is selected while the flag is still clear, and taken away while it is still set.
TEST_F(BaseService, AnOpeningTellsNoModuleChangeAClosingDoes)
{
    Service service(&m_rig);
    m_rig.open();
    EXPECT_THAT(service.hooks, ElementsAre("connected"));
    service.hooks.clear();
    m_rig.close();
    EXPECT_THAT(service.hooks, ElementsAre("ecu", "disconnected"));
}

TEST_F(BaseService, AClosingSurvivesTheCancelOfAllOtherWork)
{
    Service service(&m_rig);
    m_rig.open();
    service.hooks.clear();
    disconnect();
    m_rig.rig.dispatcher.cancel();
    m_rig.rig.loop.runPending();
    EXPECT_THAT(service.hooks, ElementsAre("ecu", "disconnected"));
}

TEST_F(BaseService, AnOpeningAndAClosingBeforeADispatchAreBothTold)
{
    Service service(&m_rig);
    connect();
    disconnect();
    EXPECT_FALSE(service.isConnected());
    m_rig.rig.loop.runPending();
    EXPECT_THAT(service.hooks, ElementsAre("ecu", "connected", "disconnected"));
}

TEST_F(BaseService, AServiceThatDiedBeforeTheDispatchIsNotCalled)
{
    auto service = std::make_unique<Service>(&m_rig);
    connect();
    service.reset();
    m_rig.rig.loop.runPending();
    disconnect();
    m_rig.getEcuManager()->setCurrentEcu(0x7E9);
    m_rig.getSettings()->setUnitSystem(UnitSystem::Imperial);
}

TEST_F(BaseService, AModuleChangeWhileConnectedIsStoredAndTold)
{
    Service service(&m_rig);
    m_rig.open();
    service.hooks.clear();
    m_rig.getEcuManager()->setCurrentEcu(0x7E9);
    EXPECT_EQ(service.ecu()->id(), 0x7E9U);
    EXPECT_THAT(service.hooks, ElementsAre("ecu")) << "at once, without a dispatch";
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    EXPECT_EQ(service.ecu(), nullptr);
    EXPECT_THAT(service.hooks, ElementsAre("ecu", "ecu"));
}

TEST_F(BaseService, AModuleChangeWhileDisconnectedIsStoredAndNotTold)
{
    Service service(&m_rig);
    m_rig.open();
    service.hooks.clear();
    service.onConnectionClosed(); // the flag alone; the control modules stay
    m_rig.getEcuManager()->setCurrentEcu(0x7E9);
    EXPECT_EQ(service.ecu()->id(), 0x7E9U);
    EXPECT_THAT(service.hooks, IsEmpty());
}

TEST_F(BaseService, AChangeOfTheModuleListAloneIsIgnored)
{
    Service service(&m_rig);
    m_rig.open();
    service.hooks.clear();
    service.onEvent(obd::EcuManagerEvent::EcuListChanged);
    service.onEvent(static_cast<obd::EcuManagerEvent>(2));
    EXPECT_THAT(service.hooks, IsEmpty());
}

TEST_F(BaseService, AChangeToTheSameUnitSystemCallsNoHook)
{
    Service service(&m_rig);
    m_rig.getSettings()->setUnitSystem(UnitSystem::Metric);
    EXPECT_THAT(service.hooks, IsEmpty());
    m_rig.getSettings()->setUnitSystem(UnitSystem::Imperial);
    m_rig.getSettings()->setUnitSystem(UnitSystem::Imperial);
    EXPECT_THAT(service.hooks, ElementsAre("units"));
    EXPECT_EQ(service.unitSystem(), UnitSystem::Imperial);
}

TEST_F(BaseService, OtherSettingsAreIgnored)
{
    m_rig.getSettings()->setUnitSystem(UnitSystem::Imperial);
    Service service(&m_rig);
    EXPECT_EQ(service.unitSystem(), UnitSystem::Imperial);
    service.onEvent(obd::VelmoraSettingsEvent::LanguageChanged);
    EXPECT_THAT(service.hooks, IsEmpty());
}

TEST_F(BaseService, ServicesAreToldByPriority)
{
    Service last(&m_rig, 2);
    Service first(&m_rig);
    class Probe : public obd::IConnectionNotifierListener
    {
    public:
        Probe(Service const& a, Service const& b) : m_a(a), m_b(b) {}
        void onConnectionOpened() override { seen.emplace_back(m_a.isConnected(), m_b.isConnected()); }
        void onConnectionClosed() override { seen.emplace_back(m_a.isConnected(), m_b.isConnected()); }
        std::vector<std::pair<bool, bool>> seen;

    private:
        Service const& m_a;
        Service const& m_b;
    };
    Probe probe(first, last);
    m_rig.notifier.attach(1, &probe);
    connect();
    disconnect();
    EXPECT_THAT(probe.seen, ElementsAre(std::pair(true, false), std::pair(false, true)));
    m_rig.notifier.detach(1, &probe);
}

TEST_F(BaseService, FlagAndModuleMayBeReadFromAnyThread)
{
    Service service(&m_rig);
    std::atomic<bool> done{false};
    std::vector<std::thread> readers;
    for (int i = 0; i < 4; ++i) {
        readers.emplace_back([&] {
            while (!done) {
                if (service.isConnected()) {
                    auto const ecu = service.ecu();
                    EXPECT_TRUE(ecu == nullptr || ecu->id() == 0x7E8 || ecu->id() == 0x7E9);
                }
                std::this_thread::yield();
            }
        });
    }
    for (int i = 0; i < 200; ++i) {
        connect();
        m_rig.getEcuManager()->setCurrentEcu(0x7E9);
        disconnect();
    }
    done = true;
    for (std::thread& reader : readers) {
        reader.join();
    }
    EXPECT_FALSE(service.isConnected());
}

} // namespace
