#include "libobd/service/baseservice.h"
#include "libobd/service/velmorainstance.h"
#include "tests/support/dialogue/elmdialogue.h"
#include "tests/support/dispatchloop.h"
#include "tests/support/fakeclock.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iconnectionservice.h>
#include <obd/iecumanager.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <obd/itroublecodeservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <stdexcept>

namespace {

using obd::ObdVelmoraBuilder::createObdVelmora;
using support::MemorySettings;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr auto automaticProtocol = obd::VehicleProtocol::Automatic;

// A store whose disk is gone.
class BrokenSettings : public MemorySettings
{
public:
    bool getInt(std::string const& key, int& value) override
    {
        if (broken) {
            throw std::runtime_error("the disk is gone");
        }
        return MemorySettings::getInt(key, value);
    }

    bool broken = true;
};

class ConnectionRecorder : public obd::IConnectionPhaseListener, public obd::IConnectionNotifierListener
{
public:
    void onPhaseChanged(int phase) override { calls.push_back(std::to_string(phase)); }
    void onConnectionOpened() override { calls.emplace_back("opened"); }
    void onConnectionClosed() override { calls.emplace_back("closed"); }

    std::vector<std::string> calls;
};

class ObdVelmora : public testing::Test
{
protected:
    ~ObdVelmora() override
    {
        obd::VelmoraInstance::set(nullptr);
        m_loop.runPending(); // the Dispatcher is the process's, and so is what waits in it
    }

    std::shared_ptr<obd::IObdVelmora> create() { return createObdVelmora(1, 2, 3, m_store); }
    std::shared_ptr<support::ScriptedChannel> workingChannel()
    {
        auto channel = std::make_shared<support::ScriptedChannel>(m_clock);
        support::expectOpening(*channel);
        support::expectClose(*channel);
        return channel;
    }

    support::FakeClock m_clock;
    support::LogCapture m_log;
    support::DispatchLoop m_loop;
    std::shared_ptr<MemorySettings> m_store = std::make_shared<MemorySettings>();
};

TEST_F(ObdVelmora, HandsBackTheHostsValues)
{
    auto const obd = createObdVelmora(7, 0xFFFFFFFF, 0, m_store);
    EXPECT_EQ(obd->getHostValue1(), 7U);
    EXPECT_EQ(obd->getHostValue2(), 0xFFFFFFFFU);
    EXPECT_EQ(obd->getHostValue3(), 0U);
}

TEST_F(ObdVelmora, WithoutSettingsThereIsNoneAndTheLatestStays)
{
    auto const obd = create();
    EXPECT_EQ(createObdVelmora(1, 2, 3, nullptr), nullptr);
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL No settings to build a top-level object on"));
    EXPECT_EQ(obd::VelmoraInstance::get(), obd.get());
}

TEST_F(ObdVelmora, HandsOutItsPartsAlwaysTheSame)
{
    auto const obd = create();
    EXPECT_NE(obd->getConnectionManager()->getProxy(), nullptr);
    EXPECT_EQ(obd->getConnectionManager(), obd->getConnectionManager());
    EXPECT_EQ(obd->getEcuManager(), obd->getEcuManager());
    EXPECT_EQ(obd->getSettings(), obd->getSettings());
    EXPECT_EQ(obd->getConfiguration(), obd->getConfiguration());
    EXPECT_NE(obd->getConfiguration(), nullptr);
    EXPECT_FALSE(obd->getConnectionNotifier()->isConnected());
}

TEST_F(ObdVelmora, TheLatestIsTheInstanceAndStaysIt)
{
    auto const first = create();
    EXPECT_EQ(obd::VelmoraInstance::get(), first.get());
    auto second = create();
    auto* const latest = second.get();
    EXPECT_EQ(obd::VelmoraInstance::get(), latest);
    second.reset();
    EXPECT_EQ(obd::VelmoraInstance::get(), latest) << "nothing clears it";
}

TEST_F(ObdVelmora, OfTwoTheLaterGetsTheLaterServices)
{
    auto const first = create();
    auto const second = create();
    auto const service = obd::ConnectionServiceBuilder::createConnectionService();
    EXPECT_EQ(service->connectionOptions(), second->getSettings()->connectionOptions());
    EXPECT_NE(service->connectionOptions(), first->getSettings()->connectionOptions());
}

TEST_F(ObdVelmora, HoldsItsSettingsStoreAndLetsItGo)
{
    auto obd = create();
    EXPECT_GT(m_store.use_count(), 1);
    obd.reset();
    EXPECT_EQ(m_store.use_count(), 1);
}

TEST_F(ObdVelmora, AnOpeningReachesModulesThenServicesThenTheApplication)
{
    auto const obd = create();
    auto const service = obd::ConnectionServiceBuilder::createConnectionService();
    obd::BaseService const plain(obd.get());
    ASSERT_TRUE(obd->getConnectionManager()->openConnection(workingChannel(), automaticProtocol, false));
    EXPECT_TRUE(obd->getConnectionNotifier()->isConnected());
    EXPECT_EQ(obd->getEcuManager()->getCurrentEcu()->id(), 0x7E8U);
    EXPECT_TRUE(plain.isConnected());
    EXPECT_TRUE(service->isConnected());
    EXPECT_NE(service->adapter(), nullptr);
    obd->getConnectionManager()->closeConnection();
    EXPECT_FALSE(obd->getConnectionNotifier()->isConnected());
    EXPECT_EQ(obd->getEcuManager()->getCurrentEcu(), nullptr);
    EXPECT_FALSE(plain.isConnected());
    EXPECT_FALSE(service->isConnected());
    EXPECT_EQ(service->adapter(), nullptr);
}

TEST_F(ObdVelmora, TheAdapterIsThereWithoutAVehicleThoughNotConnected)
{
    auto const obd = create();
    auto const service = obd::ConnectionServiceBuilder::createConnectionService();
    auto const channel = std::make_shared<support::ScriptedChannel>(m_clock);
    support::expectInitialize(*channel);
    channel->expect("ATTP0").reply("OK\r\r>");
    channel->expect("0100").loseLink();
    ConnectionRecorder recorder;
    obd->getConnectionNotifier()->attach(0, &recorder);
    EXPECT_FALSE(obd->getConnectionManager()->openConnection(channel, automaticProtocol, false));
    EXPECT_FALSE(service->isConnected());
    EXPECT_EQ(service->adapter(), obd->getConnectionManager()->getAdapter());
    EXPECT_NE(service->adapter(), nullptr);
    obd->getConnectionManager()->closeConnection();
    EXPECT_THAT(recorder.calls, IsEmpty()) << "no close for what was never open";
    EXPECT_EQ(service->adapter(), nullptr);
}

TEST_F(ObdVelmora, DestroyingItClosesTheConnectionWithoutTellingServices)
{
    auto obd = create();
    ConnectionRecorder recorder;
    auto const manager = obd->getConnectionManager();
    manager->addPhaseListener(&recorder);
    obd->getConnectionNotifier()->attach(1, &recorder);
    auto const channel = workingChannel();
    ASSERT_TRUE(manager->openConnection(channel, automaticProtocol, false));
    recorder.calls.clear();
    obd.reset();
    EXPECT_THAT(recorder.calls, ElementsAre("0"));
    EXPECT_FALSE(manager->isBusy());
    EXPECT_EQ(channel.use_count(), 1);
}

TEST_F(ObdVelmora, AManagerThatIsHeldLongerStaysUsable)
{
    auto obd = create();
    auto const manager = obd->getConnectionManager();
    obd.reset();
    EXPECT_TRUE(manager->openConnection(workingChannel(), automaticProtocol, false));
    manager->closeConnection();
}

TEST_F(ObdVelmora, ServicesMayComeAndGoOnAConnectionInAnyOrder)
{
    auto const obd = create();
    auto first = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    ASSERT_TRUE(obd->getConnectionManager()->openConnection(workingChannel(), automaticProtocol, false));
    auto second = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    EXPECT_NE(first, second);
    first.reset();
    m_loop.runPending();
    obd->getConnectionManager()->closeConnection();
    second.reset();
    m_loop.runPending();
}

TEST_F(ObdVelmora, AStoreThatFailsReachesTheCallerAndLeavesNothingBehind)
{
    auto const broken = std::make_shared<BrokenSettings>();
    auto const standing = create();
    EXPECT_THROW(createObdVelmora(0, 0, 0, broken), std::runtime_error);
    EXPECT_EQ(broken.use_count(), 1);
    EXPECT_EQ(obd::VelmoraInstance::get(), standing.get());
}

TEST_F(ObdVelmora, AServiceWhoseStoreFailsIsNotLeftInAnyList)
{
    auto const store = std::make_shared<BrokenSettings>();
    store->broken = false;
    auto const obd = createObdVelmora(0, 0, 0, store);
    store->broken = true;
    EXPECT_THROW(obd::BaseService service(obd.get()), std::runtime_error);
    store->broken = false;
    ASSERT_TRUE(obd->getConnectionManager()->openConnection(workingChannel(), automaticProtocol, false));
    obd->getSettings()->setUnitSystem(obd::UnitSystem::Imperial);
    obd->getConnectionManager()->closeConnection();
    m_loop.runPending();
}

TEST_F(ObdVelmora, AStoreWithoutValuesGivesDefaults)
{
    m_store->failReads(true);
    auto const obd = create();
    EXPECT_EQ(obd->getSettings()->unitSystem(), obd::UnitSystem::Metric);
    EXPECT_TRUE(obd->getConnectionManager()->openConnection(workingChannel(), automaticProtocol, false));
    obd->getConnectionManager()->closeConnection();
}

} // namespace
