#include "libobd/connection/connectionnotifier.h"
#include "libobd/connection/ecumanager.h"
#include "libobd/connection/velmorasettings.h"
#include "tests/support/fakeproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"

#include <obd/parameterdescriptor.h>
#include <obd/powertrainparameter.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

namespace {

using obd::EcuManagerEvent;
using obd::ObdMode;
using obd::UnitSystem;
using support::FakeEcu;
using testing::ElementsAre;
using testing::IsEmpty;

class EventRecorder : public tervex::IEventListener<EcuManagerEvent>
{
public:
    void onEvent(EcuManagerEvent const& event) override
    {
        events.push_back(static_cast<int>(event));
        onEach(event);
    }

    std::vector<int> events;
    std::function<void(EcuManagerEvent)> onEach = [](EcuManagerEvent) {};
};

class EcuManager : public testing::Test
{
protected:
    EcuManager()
    {
        m_proxy.setEcus({m_gearbox, m_engine});
        m_manager.attach(&m_events);
    }

    void open() { m_notifier.onPhaseChanged(obd::Connected); }
    void close() { m_notifier.onPhaseChanged(obd::Closed); }

    std::vector<int> pids()
    {
        std::vector<int> found;
        for (auto const& descriptor : m_manager.getParameters(0x7E8)) {
            found.push_back(descriptor->pid());
        }
        return found;
    }

    support::LogCapture m_log;
    std::shared_ptr<FakeEcu> m_engine = std::make_shared<FakeEcu>(0x7E8U);
    std::shared_ptr<FakeEcu> m_gearbox = std::make_shared<FakeEcu>(0x7E9U);
    support::FakeProxy m_proxy;
    obd::ConnectionNotifier m_notifier;
    std::shared_ptr<support::MemorySettings> m_store = std::make_shared<support::MemorySettings>();
    obd::VelmoraSettings m_settings{m_store};
    EventRecorder m_events;
    obd::EcuManager m_manager{m_notifier, &m_proxy, &m_settings};
};

TEST_F(EcuManager, KnowsNothingBeforeAConnection)
{
    std::vector<unsigned int> ids;
    m_manager.getEcuIds(ids);
    EXPECT_THAT(ids, IsEmpty());
    EXPECT_THAT(m_manager.getEcus(), IsEmpty());
    EXPECT_EQ(m_manager.getCurrentEcu(), nullptr);
    EXPECT_THAT(m_manager.getParameters(0x7E8), IsEmpty());
    EXPECT_THAT(m_events.events, IsEmpty());
}

TEST_F(EcuManager, AConnectionBringsTheListAndSelectsTheLowestId)
{
    std::vector<unsigned int> seen;
    m_events.onEach = [&](EcuManagerEvent) { seen.push_back(m_manager.getCurrentEcu()->id()); };
    open();
    EXPECT_THAT(m_manager.getEcus(), ElementsAre(m_engine, m_gearbox));
    EXPECT_EQ(m_manager.getCurrentEcu(), m_engine);
    EXPECT_THAT(m_events.events, ElementsAre(0, 1));
    EXPECT_THAT(seen, ElementsAre(0x7E8U, 0x7E8U)) << "both are in place before the first event";
}

TEST_F(EcuManager, ADisconnectionEmptiesTheListAndFiresBothEvents)
{
    open();
    m_events.events.clear();
    close();
    EXPECT_THAT(m_manager.getEcus(), IsEmpty());
    EXPECT_EQ(m_manager.getCurrentEcu(), nullptr);
    EXPECT_THAT(m_events.events, ElementsAre(0, 1));
}

TEST_F(EcuManager, SelectingTheSecondOfTwoFiresOnceAndReturnsIt)
{
    open();
    m_events.events.clear();
    m_manager.setCurrentEcu(0x7E9);
    EXPECT_THAT(m_events.events, ElementsAre(1));
    EXPECT_EQ(m_manager.getCurrentEcu(), m_gearbox);
}

TEST_F(EcuManager, SelectingTheSameAgainFiresAgain)
{
    open();
    m_events.events.clear();
    m_manager.setCurrentEcu(0x7E8);
    m_manager.setCurrentEcu(0x7E8);
    EXPECT_THAT(m_events.events, ElementsAre(1, 1));
}

TEST_F(EcuManager, SelectingAnUnknownIdLeavesNoneAndStillFires)
{
    open();
    m_events.events.clear();
    m_manager.setCurrentEcu(0x123);
    EXPECT_EQ(m_manager.getCurrentEcu(), nullptr);
    EXPECT_THAT(m_events.events, ElementsAre(1));
    EXPECT_EQ(m_manager.getEcus().size(), 2U);
}

TEST_F(EcuManager, SelectingWithoutAConnectionFires)
{
    m_manager.setCurrentEcu(0x7E8);
    EXPECT_EQ(m_manager.getCurrentEcu(), nullptr);
    EXPECT_THAT(m_events.events, ElementsAre(1));
}

TEST_F(EcuManager, ANewConnectionSelectsTheFirstAgain)
{
    open();
    m_manager.setCurrentEcu(0x7E9);
    open();
    EXPECT_EQ(m_manager.getCurrentEcu(), m_engine);
}

TEST_F(EcuManager, NamesAreThoseOfTheModuleAndEmptyForAnUnknownId)
{
    m_gearbox->setName("TCM").setDescription("Transmission Control");
    open();
    EXPECT_EQ(m_manager.getEcuName(0x7E9), "TCM");
    EXPECT_EQ(m_manager.getEcuDescription(0x7E9), "Transmission Control");
    EXPECT_EQ(m_manager.getEcuName(0x123), "");
    EXPECT_EQ(m_manager.getEcuDescription(0x123), "");
}

TEST_F(EcuManager, IdsAreAppendedToWhatTheVectorHolds)
{
    open();
    std::vector<unsigned int> ids{5, 6};
    m_manager.getEcuIds(ids);
    EXPECT_THAT(ids, ElementsAre(5U, 6U, 0x7E8U, 0x7E9U));
}

TEST_F(EcuManager, ModulesLiveOnWithTheirHolders)
{
    open();
    auto const held = m_manager.getCurrentEcu();
    close();
    m_proxy.setEcus({});
    EXPECT_EQ(held->id(), 0x7E8U);
}

TEST_F(EcuManager, ParametersAreThoseOfService01WithoutTheSupportMasks)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x04, 0x0C, 0x20, 0x21, 0x40, 0x42});
    open();
    EXPECT_THAT(pids(), ElementsAre(0x04, 0x0C, 0x21, 0x42));
    EXPECT_EQ(m_proxy.count(), 0) << "no request on the bus";
    EXPECT_THAT(m_manager.getParameters(0x123), IsEmpty());
}

TEST_F(EcuManager, ParametersKeepTheOrderOfTheSet)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x42, 0x0D, 0x0C});
    open();
    EXPECT_THAT(pids(), ElementsAre(0x42, 0x0D, 0x0C));
}

TEST_F(EcuManager, AnIdThatTheCatalogueLacksIsLoggedAndTheOthersFollow)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x0C, 0x8C, 0x0D});
    open();
    EXPECT_THAT(pids(), ElementsAre(0x0C, 0x0D));
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Failed to create sensor 0x8c"));
}

TEST_F(EcuManager, TheFreezeFrameCodeIsTriedAtItsPlaceAndNeverMade)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x01, 0x8C, 0x0C}).setFrame(0, {0x00, 0x02});
    m_engine->detectFreezeFrameConfiguration(0);
    open();
    EXPECT_THAT(pids(), ElementsAre(0x01, 0x0C));
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Failed to create sensor 0x2", "ERROR Failed to create sensor 0x8c"));
}

TEST_F(EcuManager, TheFreezeFrameCodeOfService01IsTriedOnce)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x02, 0x0C}).setFrame(0, {0x00, 0x02});
    m_engine->detectFreezeFrameConfiguration(0);
    open();
    EXPECT_THAT(pids(), ElementsAre(0x0C));
    EXPECT_THAT(m_log.lines(), ElementsAre("ERROR Failed to create sensor 0x2"));
}

TEST_F(EcuManager, WithoutAHigherIdTheFreezeFrameCodeIsNotTried)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x01}).setFrame(0, {0x00, 0x02});
    m_engine->detectFreezeFrameConfiguration(0);
    open();
    EXPECT_THAT(pids(), ElementsAre(0x01));
    EXPECT_THAT(m_log.lines(), IsEmpty());
}

TEST_F(EcuManager, TheUnitSystemFollowsTheSettingWithoutAnEvent)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x0D});
    open();
    m_events.events.clear();
    auto const unit = [this] { return m_manager.getParameters(0x7E8).at(0)->sensors().at(0)->unit(); };
    auto const metric = unit();
    m_settings.setUnitSystem(UnitSystem::Imperial);
    EXPECT_NE(unit(), metric);
    EXPECT_THAT(m_events.events, IsEmpty());
    m_settings.setUnitSystem(UnitSystem::Metric);
    EXPECT_EQ(unit(), metric);
}

TEST_F(EcuManager, OtherSettingsAreNotReadAnew)
{
    m_engine->setSupported(ObdMode::CurrentData, {0x00, 0x0D});
    open();
    auto const unit = [this] { return m_manager.getParameters(0x7E8).at(0)->sensors().at(0)->unit(); };
    auto const metric = unit();
    m_store->setInt("common/unitsystem", 1);
    m_manager.onEvent(static_cast<obd::VelmoraSettingsEvent>(1));
    EXPECT_EQ(unit(), metric);
    m_manager.onEvent(obd::VelmoraSettingsEvent::UnitSystemChanged);
    EXPECT_NE(unit(), metric);
}

TEST_F(EcuManager, AThrowingListenerIsLoggedAtEachFiring)
{
    m_events.onEach = [](EcuManagerEvent) { throw std::runtime_error("listener"); };
    open();
    EXPECT_EQ(m_manager.getCurrentEcu(), m_engine);
    EXPECT_THAT(m_log.lines(), ElementsAre("FATAL Listener threw an exception", "FATAL Listener threw an exception"));
}

TEST_F(EcuManager, DetachesFromNotifierAndSettingsWhenItDies)
{
    auto extra = std::make_unique<obd::EcuManager>(m_notifier, &m_proxy, &m_settings);
    EventRecorder late;
    extra->attach(&late);
    extra.reset();
    open();
    m_settings.setUnitSystem(UnitSystem::Imperial);
    EXPECT_THAT(late.events, IsEmpty());
}

} // namespace
