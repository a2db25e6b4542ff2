#include "tests/libobd/service/sensorservicefixture.h"

namespace {

using support::pid;
using testing::Contains;
using testing::Each;
using testing::ElementsAre;
using testing::IsEmpty;

class SensorCycle : public support::SensorServiceFixture
{
protected:
    SensorCycle() { open(); }

    ~SensorCycle() override
    {
        service.reset();
        rig.rig.dispatcher.cancel();
    }
};

TEST_F(SensorCycle, StartUpdatesWithAnEmptyListStartsNothing)
{
    service->startUpdates({});
    loop().runPending();
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(SensorCycle, StartUpdatesWithAnIdNotAmongTheQueriesSuchAsAMaskIdPassesItOver)
{
    service->updateOnce({pid(0x20), pid(0x0B), pid(0x0C)});
    awaitUpdates(1);
    settle();
    EXPECT_THAT(recorder.updates, ElementsAre("0C 1726"));
    EXPECT_EQ(proxy().count(), 1);
    EXPECT_THAT(log.lines(), IsEmpty());
}

TEST_F(SensorCycle, StartUpdatesTwiceWithTheSameIdsLeavesTheRunningQueriesAloneAndNoRequestDoubles)
{
    duringRequest({pid(0x0C), pid(0x0D)}, [this] {
        service->startUpdates({pid(0x0C), pid(0x0D)});
        service->updateOnce({});
    });
    awaitUpdates(2);
    settle();
    EXPECT_EQ(proxy().count(), 2);
    EXPECT_THAT(recorder.updates, ElementsAre("0C 1726", "0D 100"));
}

TEST_F(SensorCycle, AfterUpdateOnceOnThreeIdsExactlyThreeRequestsGoOut)
{
    service->updateOnce({pid(0x05), pid(0x0C), pid(0x0F)}); // the last one gets no response
    ASSERT_TRUE(loop().runUntil([this] { return proxy().count() == 3; }));
    settle();
    EXPECT_EQ(proxy().count(), 3);
    EXPECT_THAT(recorder.updates, ElementsAre("05 83", "0C 1726"));
}

TEST_F(SensorCycle, SelectedParametersTakeTurns)
{
    service->startUpdates({pid(0x0D), pid(0x05), pid(0x0C)});
    awaitUpdates(6);
    EXPECT_EQ(std::vector<std::string>(recorder.updates.begin(), recorder.updates.begin() + 6),
              (std::vector<std::string>{"0D 100", "05 83", "0C 1726", "0D 100", "05 83", "0C 1726"}));
}

TEST_F(SensorCycle, TheFirstValueOfASensorGivesMinimumMaximumAndMeanAllEqualToIt)
{
    service->updateOnce({pid(0x05)});
    awaitUpdates(1);
    ASSERT_EQ(recorder.last.size(), 1U);
    obd::SensorValueDataModel const& value = *recorder.last[0];
    EXPECT_EQ(value.uid, 50);
    EXPECT_EQ(value.value, "83");
    EXPECT_EQ(value.minimum, "83");
    EXPECT_EQ(value.maximum, "83");
    EXPECT_EQ(value.mean, "83");
}

TEST_F(SensorCycle, StatisticsRunOnOverTheReadings)
{
    proxy().answerOnce("01 0D", "41 0D 32"); // 50, then 100
    service->startUpdates({pid(0x0D)});
    awaitUpdates(1);
    service->updateOnce({});
    awaitUpdates(2);
    EXPECT_EQ(recorder.last.at(0)->value, "100");
    EXPECT_EQ(recorder.last.at(0)->minimum, "50");
    EXPECT_EQ(recorder.last.at(0)->maximum, "100");
    EXPECT_EQ(recorder.last.at(0)->mean, "75");
}

TEST_F(SensorCycle, ASensorThatTheReplyDoesNotTellOfIsLeftOut)
{
    service->updateOnce({pid(0x06)});
    awaitUpdates(1);
    EXPECT_THAT(recorder.updates, ElementsAre("06 0.0"));
}

TEST_F(SensorCycle, UpdateOnceTurnsARunningCycleIntoALastPass)
{
    service->startUpdates({pid(0x0C), pid(0x0D)});
    awaitUpdates(4);
    service->updateOnce({pid(0x05)});
    settle();
    EXPECT_THAT(recorder.updates, Contains("05 83"));
    int const count = proxy().count();
    settle();
    EXPECT_EQ(proxy().count(), count);
}

TEST_F(SensorCycle, AFailedRequestIsTriedAgainWithoutAWordToTheObservers)
{
    for (int i = 0; i < 3; ++i) {
        proxy().failOnce("01 0D", obd::IDevice::Status::NoResponse);
    }
    service->startUpdates({pid(0x0D)});
    awaitUpdates(1);
    EXPECT_EQ(recorder.updates.front(), "0D 100");
    EXPECT_GE(proxy().count("01 0D"), 4);
}

TEST_F(SensorCycle, ResetEndsItAndForgetsTheStatistics)
{
    proxy().answerOnce("01 0D", "41 0D 32");
    service->startUpdates({pid(0x0D)});
    awaitUpdates(2);
    service->reset();
    settle();
    int const count = proxy().count();
    settle();
    EXPECT_EQ(proxy().count(), count);
    EXPECT_EQ(recorder.invalidated, 0);

    service->updateOnce({pid(0x0D)});
    awaitUpdates(recorder.updates.size() + 1);
    EXPECT_EQ(recorder.last.at(0)->minimum, "100");
}

TEST_F(SensorCycle, AChangeOfTheUnitSystemFiresOnceAndRestartsTheStatisticsWhileTheCycleGoesOn)
{
    service->startUpdates({pid(0x0D)});
    awaitUpdates(2);
    settings().setUnitSystem(obd::UnitSystem::Imperial);
    EXPECT_EQ(recorder.invalidated, 1);
    recorder.updates.clear();
    awaitUpdates(1);
    EXPECT_EQ(recorder.updates.front(), "0D 62");
    EXPECT_EQ(recorder.last.at(0)->maximum, "62");
    settings().setUnitSystem(obd::UnitSystem::Imperial); // no change
    EXPECT_EQ(recorder.invalidated, 1);
}

TEST_F(SensorCycle, AnEcuChangeCancelsTheOldQueriesOfWhichNothingMoreComesAndFires)
{
    duringRequest({pid(0x0C), pid(0x0D)}, [this] {
        rig.getEcuManager()->setCurrentEcu(0x7E9);
        EXPECT_EQ(recorder.invalidated, 1);
    });
    settle();
    EXPECT_THAT(recorder.updates, IsEmpty());
    EXPECT_EQ(proxy().count(), 1); // the one that was on the bus

    service->updateOnce({pid(0x05), pid(0x0C)}); // the gearbox tells no temperature
    awaitUpdates(1);
    settle();
    EXPECT_THAT(recorder.updates, ElementsAre("0C 1000"));
}

TEST_F(SensorCycle, AnUnknownEcuLeavesNothingToRead)
{
    rig.getEcuManager()->setCurrentEcu(0x123);
    EXPECT_EQ(recorder.invalidated, 1);
    EXPECT_THAT(service->getDescriptors(), IsEmpty());
    service->startUpdates({pid(0x0C)});
    EXPECT_THAT(service->fetchSensors(pid(0x0C)), IsEmpty());
    EXPECT_EQ(proxy().count(), 0);
}

TEST_F(SensorCycle, AChangeOfTheVehiclesFactsEndsItAndFires)
{
    std::vector<std::function<void()>> const changes = {
        [this] { settings().setFuelCorrectionFactor(1.1F); },
        [this] { settings().setVolumetricEfficiency(80); },
        [this] { settings().setEngineDisplacement(1.6F); },
        [this] { settings().setFuelTypeOverride(true); },
        [this] { settings().setIgnitionType(obd::IgnitionType::Compression); },
        [this] { settings().setVehicleWeight(1200); },
    };
    for (std::function<void()> const& change : changes) {
        recorder.invalidated = 0;
        duringRequest({pid(0x0C)}, change);
        EXPECT_EQ(recorder.invalidated, 1);
        settle();
        int const count = proxy().count();
        settle();
        EXPECT_EQ(proxy().count(), count);
        EXPECT_FALSE(service->getDescriptors().empty());
    }
    EXPECT_THAT(recorder.updates, IsEmpty());
}

TEST_F(SensorCycle, AfterAChangeOfTheVehiclesFactsANewStartDoesNotDouble)
{
    duringRequest({pid(0x0C)}, [this] {
        settings().setVehicleWeight(1200);
        service->updateOnce({pid(0x0C)});
    });
    awaitUpdates(1);
    settle();
    EXPECT_EQ(proxy().count(), 2);
    EXPECT_EQ(recorder.updates.size(), 1U);
}

TEST_F(SensorCycle, AChangeOfTheLanguageIsNoneOfItsBusiness)
{
    settings().setLanguage(3);
    EXPECT_EQ(recorder.invalidated, 0);
}

TEST_F(SensorCycle, AChangeOfTheVehiclesFactsWithoutAConnectionFiresAndStaysEmpty)
{
    rig.close();
    recorder.invalidated = 0;
    settings().setVehicleWeight(1200);
    EXPECT_EQ(recorder.invalidated, 1);
    EXPECT_THAT(service->getDescriptors(), IsEmpty());
}

TEST_F(SensorCycle, ALostLinkGoesOnFailingUntilTheConnectionIsClosed)
{
    service->startUpdates({pid(0x0C), pid(0x0D)});
    awaitUpdates(2);
    proxy().setConnected(false);
    int const requested = loop().requested();
    ASSERT_TRUE(loop().runUntil([&] { return loop().requested() > requested + 20; }));
    std::size_t const updates = recorder.updates.size();

    rig.close();
    EXPECT_EQ(recorder.invalidated, 1);
    EXPECT_THAT(service->getDescriptors(), IsEmpty());
    settle();
    int const quiet = loop().requested();
    settle();
    EXPECT_EQ(loop().requested(), quiet);
    EXPECT_EQ(recorder.updates.size(), updates);
}

TEST_F(SensorCycle, StartsOnTheNextConnectionOnlyWhenTold)
{
    service->startUpdates({pid(0x0C)});
    awaitUpdates(1);
    rig.close();
    rig.open();
    settle();
    int const count = proxy().count();
    settle();
    EXPECT_EQ(proxy().count(), count);
    recorder.updates.clear();
    service->startUpdates({pid(0x0C)});
    awaitUpdates(2);
}

TEST_F(SensorCycle, AnObserverMayDetachItselfInsideACall)
{
    support::SensorRecorder second;
    support::SensorRecorder third;
    service->attach(&second);
    service->attach(&third);
    recorder.onUpdate = [this] { service->detach(&recorder); };
    service->startUpdates({pid(0x0C)});
    ASSERT_TRUE(loop().runUntil(second.reached(3)));
    ASSERT_TRUE(loop().runUntil(third.reached(4)));
    EXPECT_EQ(recorder.updates.size(), 1U);
    service->detach(&second);
    service->detach(&third);
}

TEST_F(SensorCycle, AnObserverMayResetTheServiceInsideACall)
{
    support::SensorRecorder second;
    service->attach(&second);
    recorder.onUpdate = [this] { service->reset(); };
    service->startUpdates({pid(0x0C), pid(0x0D)});
    awaitUpdates(1);
    settle();
    EXPECT_THAT(recorder.updates, ElementsAre("0C 1726"));
    EXPECT_EQ(second.updates, recorder.updates); // the walk went on
    EXPECT_LE(proxy().count(), 2);               // the speed may have been on the bus
    service->detach(&second);
}

TEST_F(SensorCycle, AnObserverMaySelectOtherParametersInsideACall)
{
    recorder.onUpdate = [this] {
        if (recorder.updates.size() == 1) {
            service->reset();
            service->startUpdates({pid(0x05)});
        }
    };
    service->startUpdates({pid(0x0C), pid(0x0D)});
    awaitUpdates(4);
    recorder.updates.erase(recorder.updates.begin());
    EXPECT_THAT(recorder.updates, Each("05 83"));
}

TEST_F(SensorCycle, AnObserverThatStartsTheSameParameterAgainDoublesNothing)
{
    recorder.onUpdate = [this] { service->startUpdates({pid(0x0C)}); };
    service->startUpdates({pid(0x0C)});
    awaitUpdates(5);
    service->updateOnce({});
    recorder.onUpdate = [] {};
    settle();
    EXPECT_EQ(static_cast<std::size_t>(proxy().count()), recorder.updates.size());
}

TEST_F(SensorCycle, ADroppedServiceLeavesNothingBehind)
{
    duringRequest({pid(0x0C), pid(0x0D)}, [this] { service.reset(); });
    settle();
    EXPECT_EQ(proxy().count(), 1);
    EXPECT_THAT(recorder.updates, IsEmpty());
}

TEST_F(SensorCycle, ModulesMayBeSelectedOnAnotherThreadWhileItRuns)
{
    service->detach(&recorder); // whose counters are the test thread's
    std::atomic<bool> done{false};
    std::thread selecting([&] {
        for (unsigned int i = 0; i < 200; ++i) {
            rig.getEcuManager()->setCurrentEcu(0x7E8 + i % 2);
        }
        done = true;
    });
    EXPECT_TRUE(loop().runUntil([&] {
        service->startUpdates({pid(0x0C), pid(0x0D)});
        service->getDescriptors();
        return done.load();
    }));
    selecting.join();
    service->attach(&recorder);
    service->reset();
    service->startUpdates({pid(0x0C)});
    awaitUpdates(2);
    EXPECT_EQ(recorder.updates.front(), "0C 1000");
}

} // namespace
