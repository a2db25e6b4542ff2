#include "tests/support/servicerig.h"

#include <obd/iconnectionservice.h>
#include <obd/ivelmorasettings.h>
#include <tervex/observer.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <thread>

namespace {

using obd::ConnectionServiceBuilder::createConnectionService;
using testing::ElementsAre;
using testing::IsEmpty;

class Observer : public tervex::Observer<obd::IConnectionServiceObserver>
{
public:
    explicit Observer(obd::IConnectionService& service) : m_service(service) {}

    void onConnectionOpened() override { note("opened"); }
    void onActiveEcuChanged() override { note("ecu"); }
    void onConnectionClosed() override { note("closed"); }

    std::vector<std::string> calls;

private:
    void note(std::string const& call) { calls.push_back(call + (m_service.isConnected() ? " up" : " down")); }

    obd::IConnectionService& m_service;
};

class ConnectionService : public testing::Test
{
protected:
    ConnectionService() { m_service->attach(&m_observer); }
    ~ConnectionService() override { m_service->detach(&m_observer); }

    support::ServiceRig m_rig;
    std::shared_ptr<obd::IConnectionService> m_service = createConnectionService();
    Observer m_observer{*m_service};
};

TEST_F(ConnectionService, BeforeAnyConnectionItIsEmpty)
{
    EXPECT_FALSE(m_service->isConnected());
    EXPECT_EQ(m_service->standardDescription(), "");
    EXPECT_EQ(m_service->adapter(), nullptr);
    EXPECT_EQ(m_service->connectionOptions(), m_rig.getSettings()->connectionOptions());
    EXPECT_THAT(m_observer.calls, IsEmpty());
}

TEST_F(ConnectionService, TellsTheStandardOfTheCurrentModule)
{
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8U);
    ecu->setStandardDescription("EOBD (Europe)");
    m_rig.rig.proxy->addEcu(ecu);
    m_rig.open();
    EXPECT_EQ(m_service->standardDescription(), "EOBD (Europe)");
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    EXPECT_EQ(m_service->standardDescription(), "");
}

TEST_F(ConnectionService, TheFlagIsSetAtOnceTheObserversAreToldByTheDispatch)
{
    m_rig.rig.proxy->setConnected(true);
    std::thread([this] { m_rig.notifier.onPhaseChanged(obd::Connected); }).join();
    EXPECT_TRUE(m_service->isConnected());
    EXPECT_THAT(m_observer.calls, IsEmpty());
    m_rig.rig.loop.runPending();
    EXPECT_THAT(m_observer.calls, ElementsAre("opened up"));
}

// The control modules go first, while the service still counts as connected.
TEST_F(ConnectionService, AClosingTellsTheModuleThenTheClose)
{
    m_rig.open();
    m_observer.calls.clear();
    m_rig.close();
    EXPECT_THAT(m_observer.calls, ElementsAre("ecu up", "closed down"));
}

TEST_F(ConnectionService, AFailedOpeningTellsNothing)
{
    m_rig.notifier.onPhaseChanged(obd::DeviceReady);
    m_rig.notifier.onPhaseChanged(obd::Closed);
    m_rig.rig.loop.runPending();
    EXPECT_FALSE(m_service->isConnected());
    EXPECT_THAT(m_observer.calls, IsEmpty());
}

TEST_F(ConnectionService, AModuleEventWhileDisconnectedIsStoredAndTellsNoObserver)
{
    m_rig.getEcuManager()->setCurrentEcu(0x7E8);
    EXPECT_THAT(m_observer.calls, IsEmpty());
    m_rig.open();
    m_observer.calls.clear();
    m_rig.getEcuManager()->setCurrentEcu(0x7E8);
    EXPECT_THAT(m_observer.calls, ElementsAre("ecu up"));
}

TEST_F(ConnectionService, TellsItsObserversInTheOrderOfTheirAttachment)
{
    std::vector<int> order;
    class Numbered : public tervex::Observer<obd::IConnectionServiceObserver>
    {
    public:
        Numbered(std::vector<int>& all, int number) : m_all(all), m_number(number) {}
        void onConnectionOpened() override { m_all.push_back(m_number); }
        void onActiveEcuChanged() override {}
        void onConnectionClosed() override {}

    private:
        std::vector<int>& m_all;
        int m_number;
    };
    Numbered second(order, 2);
    Numbered first(order, 1);
    m_service->attach(&first);
    m_service->attach(&second);
    m_rig.open();
    EXPECT_THAT(order, ElementsAre(1, 2));
    m_service->detach(&first);
    m_service->detach(&second);
}

TEST_F(ConnectionService, TwoCallsWhileTheFirstIsHeldGiveTheSame)
{
    EXPECT_EQ(createConnectionService(), m_service);
    std::weak_ptr<obd::IConnectionService> const old = m_service;
    m_service->detach(&m_observer);
    m_service = nullptr;
    EXPECT_TRUE(old.expired()) << "it dies with its last holder";
    m_service = createConnectionService();
    EXPECT_TRUE(old.expired());
    m_rig.open();
    EXPECT_TRUE(m_service->isConnected());
}

TEST_F(ConnectionService, EightThreadsGetTheSame)
{
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([this] {
            for (int k = 0; k < 100; ++k) {
                EXPECT_EQ(createConnectionService(), m_service);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

TEST_F(ConnectionService, OneThatIsHeldStaysWithItsTopLevelObject)
{
    support::ServiceRig later;
    EXPECT_EQ(createConnectionService(), m_service);
    EXPECT_EQ(m_service->connectionOptions(), m_rig.getSettings()->connectionOptions());
}

} // namespace
