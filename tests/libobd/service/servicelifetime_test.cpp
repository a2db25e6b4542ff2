// Services that come and go in the midst of events, as the builders make them.

#include "tests/support/logcapture.h"
#include "tests/support/servicerig.h"

#include <obd/iconnectionservice.h>
#include <obd/idiagnosticsservice.h>
#include <obd/iecuservice.h>
#include <obd/iroutineservice.h>
#include <obd/isensorservice.h>
#include <obd/itroublecodeservice.h>
#include <obd/itroubleshootingservice.h>
#include <obd/ivelmorasettings.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <thread>

namespace {

using obd::UnitSystem;

struct ConnectionActor : tervex::Observer<obd::IConnectionServiceObserver>
{
    std::function<void()> opened = [] {};
    std::function<void()> changed = [] {};
    std::function<void()> closed = [] {};
    void onConnectionOpened() override { opened(); }
    void onActiveEcuChanged() override { changed(); }
    void onConnectionClosed() override { closed(); }
};

struct SensorActor : tervex::Observer<obd::ISensorServiceObserver>
{
    std::function<void()> act = [] {};
    void onInvalidated() override { act(); }
    void onSensorUpdated(bool /*success*/, std::shared_ptr<obd::ParameterDescriptor> const& /*descriptor*/,
                         std::vector<std::shared_ptr<obd::SensorValueDataModel>> const& /*values*/) override
    {
        act();
    }
};

// One of each kind; the connection service is shared, so it lives only if nobody else holds it.
struct AllServices
{
    std::shared_ptr<obd::ISensorService> sensors = obd::SensorServiceBuilder::createSensorService();
    std::shared_ptr<obd::IConnectionService> connection = obd::ConnectionServiceBuilder::createConnectionService();
    std::shared_ptr<obd::ITroubleCodeService> codes = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    std::shared_ptr<obd::IDiagnosticsService> diagnostics = obd::DiagnosticsServiceBuilder::create();
    std::shared_ptr<obd::IEcuService> ecu = obd::EcuServiceBuilder::createEcuService();
    std::shared_ptr<obd::IRoutineService> routines = obd::RoutineServiceBuilder::createRoutineService();
    std::shared_ptr<obd::ITroubleshootingService> raw =
        obd::TroubleshootingServiceBuilder::createTroubleshootingService();
};

class ServiceLifetime : public testing::Test
{
protected:
    ServiceLifetime()
    {
        auto engine = std::make_shared<support::FakeEcu>(0x7E8U);
        engine->setSupported(obd::ObdMode::CurrentData, {0x00, 0x05, 0x0C, 0x0D});
        rig.rig.proxy->setEcus({engine, std::make_shared<support::FakeEcu>(0x7E9U)});
        rig.rig.proxy->answer("01 0C", "41 0C 1A F8");
    }

    obd::IEcuManager& modules() { return *rig.getEcuManager(); }
    obd::IVelmoraSettings& settings() { return *rig.getSettings(); }

    support::LogCapture log;
    support::ServiceRig rig;
};

// What one thread does to the connection while another builds and drops.
TEST_F(ServiceLifetime, ServicesComeAndGoWhileTheConnectionDoesOnAnotherThread)
{
    std::atomic<bool> done{false};
    std::thread opening([&] {
        for (int i = 0; !done; ++i) {
            rig.rig.proxy->setConnected(true);
            rig.notifier.onPhaseChanged(obd::Connected);
            modules().setCurrentEcu(i % 2 == 0 ? 0x7E9 : 0x7E8);
            settings().setUnitSystem(i % 2 == 0 ? UnitSystem::Imperial : UnitSystem::Metric);
            settings().setVehicleWeight(1000 + i);
            rig.rig.proxy->setConnected(false);
            rig.notifier.onPhaseChanged(obd::Closed);
        }
    });
    for (int i = 0; i < 300; ++i) {
        AllServices const services;
        rig.rig.loop.runPending();
        services.sensors->getDescriptors();
    }
    done = true;
    opening.join();
    EXPECT_THAT(log.lines(), testing::Not(testing::Contains("FATAL Listener threw an exception")));
}

// An event may come between a service's attaching and its first look at the state, or behind it; either way the latest
// state stands.
TEST_F(ServiceLifetime, WhatIsBuiltInTheMidstOfAChangeSettlesOnTheLatestState)
{
    for (int i = 0; i < 200; ++i) {
        bool const connect = i % 2 == 0;
        std::thread changing([&] {
            rig.rig.proxy->setConnected(connect);
            rig.notifier.onPhaseChanged(connect ? obd::Connected : obd::Closed);
            settings().setUnitSystem(connect ? UnitSystem::Imperial : UnitSystem::Metric);
        });
        auto const sensors = obd::SensorServiceBuilder::createSensorService();
        auto const ecu = obd::EcuServiceBuilder::createEcuService();
        changing.join();
        rig.rig.loop.runPending();
        ASSERT_EQ(sensors->isConnected(), connect);
        ASSERT_EQ(sensors->getDescriptors().empty(), !connect) << i;
        auto const speed = sensors->getParameter(support::pid(0x0D));
        ASSERT_EQ(speed != nullptr, connect);
        if (connect) {
            ASSERT_EQ(speed->sensors.front()->unit, UnitMilesPerHour);
        }
    }
}

TEST_F(ServiceLifetime, ServicesMayBeBuiltInsideAModuleChange)
{
    auto const service = obd::ConnectionServiceBuilder::createConnectionService();
    ConnectionActor actor;
    std::vector<std::unique_ptr<AllServices>> built;
    actor.changed = [&] { built.push_back(std::make_unique<AllServices>()); };
    service->attach(&actor);
    rig.open();
    modules().setCurrentEcu(0x7E9);
    ASSERT_EQ(built.size(), 1U);
    EXPECT_TRUE(built.front()->sensors->isConnected());
    rig.close();
    EXPECT_EQ(built.size(), 2U);
    EXPECT_FALSE(built.front()->sensors->isConnected());
    service->detach(&actor);
}

TEST_F(ServiceLifetime, ServicesMayBeBuiltAndDroppedInsideAnInvalidation)
{
    auto service = obd::SensorServiceBuilder::createSensorService();
    SensorActor actor;
    int calls = 0;
    // The new one has the same observer, and hears the next change first.
    actor.act = [&] {
        ++calls;
        service = obd::SensorServiceBuilder::createSensorService();
        service->attach(&actor);
    };
    service->attach(&actor);
    rig.open();
    modules().setCurrentEcu(0x7E9);
    EXPECT_EQ(calls, 1);
    settings().setUnitSystem(UnitSystem::Imperial);
    EXPECT_EQ(calls, 2);
    settings().setVehicleWeight(1200);
    EXPECT_EQ(calls, 3);
    rig.close();
    EXPECT_EQ(calls, 4);
    service->detach(&actor);
}

TEST_F(ServiceLifetime, TheLastReferenceMayGoInsideAnyOfItsCalls)
{
    enum When
    {
        Opened,
        Changed,
        Closed
    };
    for (When const when : {Opened, Changed, Closed}) {
        auto service = obd::ConnectionServiceBuilder::createConnectionService();
        std::weak_ptr<obd::IConnectionService> const watched = service;
        ConnectionActor actor;
        ConnectionActor behind;
        int calls = 0;
        auto const drop = [&] { service.reset(); };
        auto const count = [&] { ++calls; };
        (when == Opened ? actor.opened : when == Changed ? actor.changed : actor.closed) = drop;
        (when == Opened ? behind.opened : when == Changed ? behind.changed : behind.closed) = count;
        service->attach(&actor);
        service->attach(&behind);
        rig.open();
        modules().setCurrentEcu(0x7E9);
        rig.close();
        EXPECT_TRUE(watched.expired()) << when;
        EXPECT_EQ(calls, 0) << "it is over: " << when;
    }
}

TEST_F(ServiceLifetime, ASensorServiceMayGoInsideAReading)
{
    auto service = obd::SensorServiceBuilder::createSensorService();
    SensorActor actor;
    actor.act = [&] { service.reset(); };
    rig.open();
    service->attach(&actor);
    service->startUpdates({support::pid(0x0C)});
    EXPECT_TRUE(rig.rig.loop.runUntil([&] { return service == nullptr; }));
    rig.rig.loop.runPending();
}

TEST_F(ServiceLifetime, BeforeTheFirstTopLevelObjectThereAreNoServices)
{
    obd::VelmoraInstance::set(nullptr);
    AllServices const none;
    EXPECT_EQ(none.sensors, nullptr);
    EXPECT_EQ(none.connection, nullptr);
    EXPECT_EQ(none.codes, nullptr);
    EXPECT_EQ(none.diagnostics, nullptr);
    EXPECT_EQ(none.ecu, nullptr);
    EXPECT_EQ(none.routines, nullptr);
    EXPECT_EQ(none.raw, nullptr);
    EXPECT_EQ(log.lines(), std::vector<std::string>(7, "FATAL No top-level object to build a service on"));
    obd::VelmoraInstance::set(&rig);
    EXPECT_NE(obd::ConnectionServiceBuilder::createConnectionService(), nullptr) << "later there are";
}

} // namespace
