#include "libobd/service/consolequery.h"
#include "tests/support/bytes.h"
#include "tests/support/servicetest.h"

#include <obd/databridge.h>
#include <obd/idiagnosticsservice.h>
#include <obd/itroubleshootingservice.h>

#include <gmock/gmock.h>

#include <mutex>
#include <thread>

namespace {

using support::bytes;
using testing::ElementsAre;
using testing::IsEmpty;
using Lines = std::vector<std::string>;
using DeviceStatus = obd::IDevice::Status;

// Keeps the entries as ">> ATI". Safe from any thread, as every such observer has to be.
class Reader : public tervex::Observer<obd::ITroubleshootingServiceObserver>
{
public:
    void onLogEntryAdded(std::shared_ptr<obd::MessageDataModel> const& entry) override
    {
        std::lock_guard const lock(m_mutex);
        m_lines.push_back(entry->getDirectionStr() + " " + entry->data);
        m_times.push_back(entry->time);
        m_thread = std::this_thread::get_id();
    }

    Lines lines() const
    {
        std::lock_guard const lock(m_mutex);
        return m_lines;
    }
    Lines times() const
    {
        std::lock_guard const lock(m_mutex);
        return m_times;
    }
    std::thread::id thread() const
    {
        std::lock_guard const lock(m_mutex);
        return m_thread;
    }

private:
    mutable std::mutex m_mutex;
    Lines m_lines;
    Lines m_times;
    std::thread::id m_thread;
};

class TroubleshootingService : public support::ServiceTest
{
protected:
    TroubleshootingService() { m_service->attach(&m_reader); }
    ~TroubleshootingService() override { m_service->detach(&m_reader); }

    // Each exchange passes over a real data bridge, to which the manager's loggers are given as to any connection's.
    void tapBridge()
    {
        for (obd::IConnectionLogger* logger : m_rig.manager->loggers) {
            m_bridge.addLogger(logger);
        }
        m_bridge.setDelimiter('>');
        proxy().during([this] {
            std::vector<unsigned char> taken;
            m_bridge.send(bytes("ATI\r"));
            m_bridge.get(taken);
            m_bridge.set(bytes("ELM327 v1.5\r\r>"));
            m_bridge.receive(taken, 0);
        });
    }

    Reader m_reader;
    obd::DataBridge m_bridge;
    std::shared_ptr<obd::ITroubleshootingService> m_service =
        obd::TroubleshootingServiceBuilder::createTroubleshootingService();
};

TEST_F(TroubleshootingService, AQueryOfATIReturnsTheAdaptersText)
{
    open();
    proxy().answerCommand("ATI", "ELM327 v1.5");
    EXPECT_EQ(m_service->query("ATI", 1000), "ELM327 v1.5");
    EXPECT_EQ(proxy().lastTimeout(), 1000U);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleshootingService, WithNoConnectionAQueryReturnsAnEmptyStringAndIsLogged)
{
    EXPECT_EQ(m_service->query("ATI", 1000), "");
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Proxy not connected", "ERROR Failed to query request: ATI"));
    EXPECT_THAT(proxy().commands(), IsEmpty());
}

TEST_F(TroubleshootingService, AQueryThatTheAdapterRefusesReturnsAnEmptyStringAndIsLogged)
{
    open();
    for (DeviceStatus const status :
         {DeviceStatus::NotSent, DeviceStatus::NotEnabled, DeviceStatus::NoResponse, DeviceStatus::Unparsed}) {
        proxy().failCommand("AT@2", status);
        m_log.clear();
        EXPECT_EQ(m_service->query("AT@2", 1000), "");
        EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Fetch done with failure", "ERROR Failed to query request: AT@2"));
    }
}

TEST_F(TroubleshootingService, ACommandReachesTheAdapterWordForWord)
{
    open();
    for (std::string const command : {" at i ", "", "01 0c", "\xC3\xA4?>"}) {
        proxy().answerCommand(command, "?");
        EXPECT_EQ(m_service->query(command, 1000), "?");
        EXPECT_EQ(proxy().commands().back(), command);
    }
}

TEST_F(TroubleshootingService, AQueryNeedsNoControlModule)
{
    open();
    m_rig.getEcuManager()->setCurrentEcu(0x123);
    proxy().answerCommand("ATRV", "12.4V");
    EXPECT_EQ(m_service->query("ATRV", 1000), "12.4V");
}

TEST_F(TroubleshootingService, AQueryWithTimeout0GivesUpAfter50MillisecondsAlthoughTheProxyWasTold0)
{
    open();
    proxy().hold();
    auto const start = std::chrono::steady_clock::now();
    EXPECT_EQ(m_service->query("ATZ", 0), "");
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(50));
    EXPECT_TRUE(proxy().awaitHeld());
    proxy().release();
    EXPECT_EQ(proxy().lastTimeout(), 0U);
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Future not ready", "ERROR Failed to query request: ATZ"));
}

TEST_F(TroubleshootingService, IsLoggingIsFalseOnANewServiceWhateverAnEarlierServicesStateWas)
{
    EXPECT_FALSE(m_service->isLogging());
    m_service->startLogging();
    EXPECT_TRUE(m_service->isLogging());
    EXPECT_FALSE(obd::TroubleshootingServiceBuilder::createTroubleshootingService()->isLogging());
    m_service->stopLogging();
    EXPECT_FALSE(m_service->isLogging());
}

TEST_F(TroubleshootingService, WithLoggingOffNoEntryIsMade)
{
    tapBridge();
    open();
    m_service->query("ATI", 1000);
    m_service->startLogging();
    m_service->stopLogging();
    m_service->query("ATI", 1000);
    EXPECT_THAT(m_reader.lines(), IsEmpty());
}

TEST_F(TroubleshootingService, AfterStartLoggingEachCommandGivesAnEntryInEachDirection)
{
    tapBridge();
    open();
    m_service->startLogging();
    m_service->query("ATI", 1000);
    EXPECT_THAT(m_reader.lines(), ElementsAre(">> ATI", "<< ELM327 v1.5"));
    EXPECT_THAT(m_reader.times(), testing::Each(testing::MatchesRegex("[0-2][0-9]:[0-5][0-9]:[0-5][0-9]")));
    m_service->query("ATI", 1000);
    EXPECT_EQ(m_reader.lines().size(), 4U);
}

TEST_F(TroubleshootingService, EntriesArriveOnTheWorkersThread)
{
    tapBridge();
    open();
    m_service->startLogging();
    m_service->query("ATI", 1000);
    EXPECT_NE(m_reader.thread(), std::thread::id());
    EXPECT_NE(m_reader.thread(), std::this_thread::get_id());
}

TEST_F(TroubleshootingService, OtherRequestsAreInTheLogLikeConsoleTraffic)
{
    tapBridge();
    open();
    m_service->startLogging();
    obd::DiagnosticsServiceBuilder::create()->fetchReadinessMonitors();
    EXPECT_THAT(m_reader.lines(), ElementsAre(">> ATI", "<< ELM327 v1.5"));
}

TEST_F(TroubleshootingService, LoggingStaysOnAcrossConnections)
{
    m_service->startLogging();
    open();
    m_rig.close();
    open();
    EXPECT_TRUE(m_service->isLogging());
}

TEST_F(TroubleshootingService, TheServiceTapsTheConnectionsForAsLongAsItLives)
{
    ASSERT_EQ(m_rig.manager->loggers.size(), 1U);
    {
        auto const second = obd::TroubleshootingServiceBuilder::createTroubleshootingService();
        EXPECT_NE(second, m_service);
        EXPECT_EQ(m_rig.manager->loggers.size(), 2U);
    }
    EXPECT_EQ(m_rig.manager->loggers.size(), 1U);
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(TroubleshootingService, WithoutAConnectionManagerTheServiceWorksOnWithoutTrafficLog)
{
    open();
    auto const manager = std::exchange(m_rig.manager, nullptr);
    auto lone = obd::TroubleshootingServiceBuilder::createTroubleshootingService();
    EXPECT_EQ(m_log.lines(), Lines{"FATAL No IConnectionManager"});
    EXPECT_EQ(manager->loggers.size(), 1U);

    proxy().answerCommand("ATI", "ELM327 v1.5");
    EXPECT_EQ(lone->query("ATI", 1000), "ELM327 v1.5");
    m_log.clear();
    lone.reset();
    EXPECT_EQ(m_log.lines(), Lines{"FATAL No IConnectionManager"});
    m_rig.manager = manager;
}

TEST(ConsoleQuery, KeepsTheReplyUntilCleared)
{
    auto const proxy = std::make_shared<support::FakeProxy>();
    proxy->answerCommand("ATI", "ELM327 v1.5");
    obd::ConsoleQuery query("ATI", 700);
    EXPECT_EQ(query.timeout(), 700U);
    EXPECT_EQ(query.response(), "");
    EXPECT_EQ(query.update(proxy), obd::IQuery::UpdateStatus::UpdateOk);
    EXPECT_EQ(query.response(), "ELM327 v1.5");
    query.clear();
    EXPECT_EQ(query.response(), "");
}

TEST(ConsoleQuery, EveryStatusAbove0IsAFailure)
{
    auto const proxy = std::make_shared<support::FakeProxy>();
    obd::ConsoleQuery query("ATI", 700);
    for (DeviceStatus const status :
         {DeviceStatus::NotSent, DeviceStatus::NotEnabled, DeviceStatus::NoResponse, DeviceStatus::Unparsed}) {
        proxy->failCommand("ATI", status);
        EXPECT_EQ(static_cast<int>(query.update(proxy)), 2);
    }
}

TEST(ConsoleQuery, ANegativeTimeoutIsNone)
{
    EXPECT_EQ(obd::ConsoleQuery("ATI", -1).timeout(), 0U);
}

} // namespace
