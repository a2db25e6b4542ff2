#include "libobd/powertrain/fuelconsumption.h"
#include "tests/libobd/powertrain/derivedrig.h"

#include <thread>

namespace {

using derived::Status;
using derived::UnitSystem;

class FuelConsumption : public derived::Rig
{
protected:
    FuelConsumption()
    {
        obd::GasConsumption(*ecu).clear(); // what it keeps outlives objects, and so tests
        obd::GasConsumptionMap(*ecu).clear();
        obd::DieselConsumption(*ecu).clear();
        log.clear();
        answer("01 10", "41 10 03 E8"); // 10 g/s
        answer("01 0B", "41 0B 3C");    // 60 kPa
        answer("01 0F", "41 0F 41");    // 25 degrees
        answer("01 0C", "41 0C 25 80"); // 2400 rpm
        answer("01 04", "41 04 66");    // 40 %
        drive(50);
    }
};

class GasConsumption : public FuelConsumption
{
protected:
    GasConsumption() { support({0x10, 0x0D}); }
};
class GasConsumptionMap : public FuelConsumption
{
protected:
    GasConsumptionMap() { support({0x0B, 0x0C, 0x0D, 0x0F}); }
};
class DieselConsumption : public FuelConsumption
{
protected:
    DieselConsumption() { support({0x04, 0x0D, 0x10}); }
};

TEST_F(GasConsumption, NeedsAirFlowAndSpeed)
{
    EXPECT_TRUE(obd::GasConsumption::isValid(*ecu));
    support({0x10});
    EXPECT_FALSE(obd::GasConsumption::isValid(*ecu));
    support({0x0D, 0x0B, 0x0C, 0x0F});
    EXPECT_FALSE(obd::GasConsumption::isValid(*ecu));
}

TEST_F(GasConsumption, IsDeliveredOnlyIfTheModulesOwnInputsCame)
{
    using obd::OutcomeKind;
    support({0x10, 0x0D, 0x44}); // with the lambda that is commanded
    auto const other = std::make_shared<support::FakeEcu>(0x7E9U);
    other->setSupported(derived::ObdMode::CurrentData, {0x10, 0x0D});
    proxy->addEcu(other);
    obd::GasConsumption parameter(*ecu);
    answer("01 44", "41 44 80 00");
    parameter.update(proxy);
    EXPECT_TRUE(parameter.delivered(*ecu));
    EXPECT_EQ(parameter.verdict(*other).kind, OutcomeKind::ModuleSilent);
    answer("01 44", "7F 01 22");
    parameter.update(proxy);
    EXPECT_EQ(parameter.verdict(*ecu), (obd::Verdict{OutcomeKind::Refused, 0x22}));
    answer("01 44", "41 44 80 00");
    proxy->answer("01 10", {{0x7E9, "41 10 03 E8"}});
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(parameter.verdict(*ecu).kind, OutcomeKind::ModuleSilent) << "the air that came is another module's";
    other->setSupported(derived::ObdMode::CurrentData, {0x0D});
    parameter.update(proxy);
    EXPECT_EQ(parameter.verdict(*other).kind, OutcomeKind::NotOffered) << "the model does not suit it";
}

TEST_F(GasConsumptionMap, NeedsPressureEngineSpeedTemperatureAndSpeed)
{
    std::vector<unsigned char> const needed{0x0F, 0x0D, 0x0C, 0x0B};
    EXPECT_TRUE(obd::GasConsumptionMap::isValid(*ecu));
    for (std::size_t i = 0; i < needed.size(); ++i) {
        std::vector<unsigned char> others = needed;
        others.erase(others.begin() + static_cast<std::ptrdiff_t>(i));
        support(others);
        EXPECT_FALSE(obd::GasConsumptionMap::isValid(*ecu)) << i;
    }
}

TEST_F(DieselConsumption, NeedsAirFlowLoadAndSpeed)
{
    EXPECT_TRUE(obd::DieselConsumption::isValid(*ecu));
    support({0x10, 0x0D});
    EXPECT_FALSE(obd::DieselConsumption::isValid(*ecu));
}

TEST_F(GasConsumption, ReadsTheAirThenTheSpeed)
{
    obd::GasConsumption parameter(*ecu);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(proxy->requests(), requests({"01 10", "01 0D"}));
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 6.574441857279826, 1e-9);
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Metric), "6.6");
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Imperial), "35.8");
}

TEST_F(GasConsumptionMap, ReadsThePressureThenTheOthersTheSpeedLast)
{
    obd::GasConsumptionMap parameter(*ecu);
    parameter.setVolumetricEfficiency(85.0);
    parameter.setEngineDisplacement(2.0);
    drive(80);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(proxy->requests(), requests({"01 0B", "01 0F", "01 0C", "01 0D"}));
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 9.79464338632937, 1e-9);
}

TEST_F(GasConsumptionMap, EngineWithoutDisplacementBurnsNothing)
{
    obd::GasConsumptionMap parameter(*ecu);
    parameter.setEngineDisplacement(0.0);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(parameter.consumption(*ecu, UnitSystem::Metric), 0.0);
}

TEST_F(DieselConsumption, ReadsTheAirThenTheLoadTheSpeedLast)
{
    obd::DieselConsumption parameter(*ecu);
    answer("01 10", "41 10 07 D0"); // 20 g/s
    drive(90);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(proxy->requests(), requests({"01 10", "01 04", "01 0D"}));
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 2.6525198938992043, 1e-9);
}

TEST_F(FuelConsumption, ReadsTheLambdaBehindTheAirAndTheLoad)
{
    support({0x04, 0x0B, 0x0C, 0x0D, 0x0F, 0x10, 0x44});
    obd::GasConsumption(*ecu).update(proxy);
    EXPECT_EQ(proxy->requests(), requests({"01 10", "01 44", "01 0D"}));
    proxy->forgetRequests();
    obd::GasConsumptionMap(*ecu).update(proxy);
    EXPECT_EQ(proxy->requests(), requests({"01 0B", "01 44", "01 0F", "01 0C", "01 0D"}));
    proxy->forgetRequests();
    obd::DieselConsumption(*ecu).update(proxy);
    EXPECT_EQ(proxy->requests(), requests({"01 10", "01 04", "01 44", "01 0D"}));
}

TEST_F(FuelConsumption, TakesTheBestLambdaSourceAndSaysWhich)
{
    struct
    {
        std::vector<unsigned char> pids;
        char const* line;
        char const* request;
    } const cases[] = {
        {{0x10, 0x0D, 0x34, 0x24, 0x44}, "INFO Using Commanded FA ratio as lambda source", "01 44"},
        {{0x10, 0x0D, 0x34, 0x24}, "INFO Using O2S ER-V as lambda source", "01 24"},
        {{0x10, 0x0D, 0x34}, "INFO Using O2S ER-C as lambda source", "01 34"},
    };
    for (auto const& each : cases) {
        support(each.pids);
        log.clear();
        obd::GasConsumption parameter(*ecu);
        EXPECT_EQ(log.lines(), std::vector<std::string>{each.line});
        proxy->forgetRequests();
        parameter.update(proxy);
        EXPECT_EQ(proxy->requests(), requests({"01 10", each.request, "01 0D"}));
    }
    support({0x10, 0x0D});
    log.clear();
    obd::GasConsumption const parameter(*ecu);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"INFO No lambda source available"});
}

TEST_F(FuelConsumption, EveryLambdaSourceGivesItsEquivalenceRatio)
{
    struct
    {
        unsigned char pid;
        char const* request;
        char const* reply; // 0.8 of a maximum of 2
    } const cases[] = {
        {0x44, "01 44", "41 44 66 66"}, {0x24, "01 24", "41 24 66 66 00 00"}, {0x34, "01 34", "41 34 66 66 00 00"}};
    for (auto const& each : cases) {
        support({0x10, 0x0D, each.pid});
        answer(each.request, each.reply);
        obd::GasConsumption parameter(*ecu);
        parameter.clear();
        for (int i = 0; i < 4; ++i) {
            parameter.update(proxy);
            clock.advance(1000);
        }
        EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 8.21805232159978, 1e-3) << each.request;
    }
}

TEST_F(FuelConsumption, LambdaSensorThatDoesNotAnswerLeavesLambdaAtOne)
{
    support({0x10, 0x0D, 0x44});
    proxy->answer("01 44", {{0x7E9, "41 44 66 66"}}); // of another module, which is no gasoline engine
    proxy->addEcu(std::make_shared<support::FakeEcu>(0x7E9));
    obd::GasConsumption parameter(*ecu);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 6.574441857279826, 1e-9);
}

TEST_F(GasConsumption, HalfALitreIsNoMilesPerGallon)
{
    obd::GasConsumption parameter(*ecu);
    drive(1);
    parameter.update(proxy);
    EXPECT_EQ(parameter.consumption(*ecu, UnitSystem::Metric), 0.5);
    EXPECT_EQ(parameter.consumption(*ecu, UnitSystem::Imperial), 0.0);
}

TEST_F(GasConsumption, CorrectionFactorAppliesBeforeMilesPerGallon)
{
    obd::GasConsumption parameter(*ecu);
    parameter.setCorrectionFactor(1.1);
    parameter.update(proxy);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 6.574441857279826 * 1.1, 1e-9);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Imperial), 235.214583 / (6.574441857279826 * 1.1), 1e-9);
    drive(1);
    parameter.setCorrectionFactor(2.0);
    clock.advance(100);
    parameter.update(proxy);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Imperial), 235.214583, 1e-9) << "one litre is no longer none";
}

TEST_F(GasConsumption, EndlessConsumptionIsNoMilesPerGallon)
{
    support({0x10, 0x0D, 0x44});
    answer("01 44", "41 44 00 00");
    obd::GasConsumption parameter(*ecu);
    for (int i = 0; i < 3; ++i) {
        parameter.update(proxy);
        clock.advance(1000);
    }
    EXPECT_EQ(parameter.consumption(*ecu, UnitSystem::Imperial), 0.0);
}

TEST_F(GasConsumption, FailedInputIsLeftOutAndTheOthersGoOn)
{
    obd::GasConsumption parameter(*ecu);
    parameter.update(proxy);
    double const before = parameter.consumption(*ecu, UnitSystem::Metric);
    clock.advance(1000);
    proxy->fail("01 10", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), before, 1e-9) << "by the air of before";
    clock.advance(1000);
    proxy->fail("01 0D", obd::IDevice::Status::NoResponse);
    proxy->forgetRequests();
    EXPECT_EQ(parameter.update(proxy), Status::UpdateFailed);
    EXPECT_EQ(proxy->count(), 2);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), before, 1e-9);
}

TEST_F(GasConsumption, ModuleWithoutTheInputsIsSkippedWithoutAWord)
{
    auto const gearbox = std::make_shared<support::FakeEcu>(0x7E9);
    gearbox->setSupported(derived::ObdMode::CurrentData, {0x0D});
    proxy->addEcu(gearbox);
    proxy->answer("01 0D", {{0x7E8, "41 0D 32"}, {0x7E9, "41 0D 32"}});
    obd::GasConsumption parameter(*ecu);
    log.clear();
    parameter.update(proxy);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 6.574441857279826, 1e-9);
    EXPECT_EQ(parameter.consumption(*gearbox, UnitSystem::Metric), 0.0);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(GasConsumption, EachModuleHasItsOwn)
{
    auto const second = std::make_shared<support::FakeEcu>(0x7E9);
    second->setSupported(derived::ObdMode::CurrentData, {0x0D, 0x10});
    proxy->addEcu(second);
    proxy->answer("01 10", {{0x7E8, "41 10 03 E8"}, {0x7E9, "41 10 07 D0"}});
    proxy->answer("01 0D", {{0x7E8, "41 0D 32"}, {0x7E9, "41 0D 32"}});
    obd::GasConsumption parameter(*ecu);
    parameter.update(proxy);
    EXPECT_NEAR(parameter.consumption(*ecu, UnitSystem::Metric), 6.574441857279826, 1e-9);
    EXPECT_NEAR(parameter.consumption(*second, UnitSystem::Metric), 6.574441857279826 * 2, 1e-9);
}

TEST_F(GasConsumption, SamplesOutliveTheParameterAndEndWithClear)
{
    obd::GasConsumption(*ecu).update(proxy);
    obd::GasConsumption next(*ecu);
    EXPECT_NEAR(next.consumption(*ecu, UnitSystem::Metric), 6.574441857279826, 1e-9);
    obd::GasConsumption(*ecu).clear();
    EXPECT_EQ(next.consumption(*ecu, UnitSystem::Metric), 0.0);
}

TEST_F(FuelConsumption, EachModelKeepsItsOwnSamples)
{
    support({0x04, 0x0B, 0x0C, 0x0D, 0x0F, 0x10});
    obd::GasConsumption(*ecu).update(proxy);
    EXPECT_EQ(obd::GasConsumptionMap(*ecu).consumption(*ecu, UnitSystem::Metric), 0.0);
    EXPECT_EQ(obd::DieselConsumption(*ecu).consumption(*ecu, UnitSystem::Metric), 0.0);
}

TEST_F(GasConsumption, MayBeReadWhileItIsUpdated)
{
    obd::GasConsumption parameter(*ecu);
    std::thread worker([&] {
        for (int i = 0; i < 300; ++i) {
            parameter.update(proxy);
            clock.advance(10);
        }
    });
    for (int i = 0; i < 300; ++i) {
        double const read = parameter.consumption(*ecu, UnitSystem::Metric);
        EXPECT_TRUE(read == 0.0 || (read > 6.5 && read < 6.7)) << read;
        EXPECT_EQ(parameter.values(*ecu, UnitSystem::Metric).size(), 1U);
    }
    obd::GasConsumption(*ecu).clear();
    worker.join();
}

} // namespace
