#include "libobd/powertrain/boostpressure.h"
#include "tests/libobd/powertrain/derivedrig.h"

namespace {

using derived::Status;
using derived::UnitSystem;

class BoostPressure : public derived::Rig
{
protected:
    BoostPressure()
    {
        parameter.clear(); // what it keeps outlives objects, and so tests
        support({0x0B});
        answer("01 0B", "41 0B 50"); // 80 kPa
        answer("01 33", "41 33 5A"); // 90 kPa
    }

    double pressure() { return parameter.pressure(*ecu, UnitSystem::Metric); }

    // An update that many milliseconds after the one before.
    Status updateAfter(unsigned int ms)
    {
        clock.advance(ms);
        return parameter.update(proxy);
    }

    obd::BoostPressure parameter;
};

TEST_F(BoostPressure, NeedsTheManifoldPressure)
{
    EXPECT_TRUE(obd::BoostPressure::isValid(*ecu));
    support({0x33, 0x0C});
    EXPECT_FALSE(obd::BoostPressure::isValid(*ecu));
}

TEST_F(BoostPressure, WithoutABarometerItIsAboveTheStandardAtmosphere)
{
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_NEAR(pressure(), -21.325, 1e-9) << "a vacuum reads negative";
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Metric), "-21.3");
    EXPECT_EQ(proxy->requests(), requests({"01 0B"})) << "what the module hasn't is not asked for";
}

TEST_F(BoostPressure, ImperialIsInPsi)
{
    answer("01 0B", "41 0B C8");
    parameter.update(proxy);
    EXPECT_NEAR(parameter.pressure(*ecu, UnitSystem::Imperial), (200.0 - 101.325) * 0.1450377, 1e-9);
}

TEST_F(BoostPressure, BarometerIsReadBehindTheManifoldPressureAndCountsFromThenOn)
{
    support({0x0B, 0x33});
    parameter.update(proxy);
    EXPECT_EQ(proxy->requests(), requests({"01 0B", "01 33"}));
    EXPECT_NEAR(pressure(), -21.325, 1e-9);
    updateAfter(1000);
    EXPECT_NEAR(pressure(), -10.0, 1e-9);
}

TEST_F(BoostPressure, BarometerIsReadAgainAfterMoreThanFiveSeconds)
{
    support({0x0B, 0x33});
    parameter.update(proxy);
    updateAfter(5000);
    EXPECT_EQ(proxy->count("01 33"), 1);
    updateAfter(1);
    EXPECT_EQ(proxy->count("01 33"), 2);
    updateAfter(5000);
    EXPECT_EQ(proxy->count("01 33"), 2);
    EXPECT_EQ(proxy->count("01 0B"), 4);
}

TEST_F(BoostPressure, BarometerThatFailsIsTriedAgainAtOnce)
{
    support({0x0B, 0x33});
    proxy->failOnce("01 33", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(updateAfter(10), Status::UpdateOk);
    EXPECT_EQ(proxy->count("01 33"), 2);
    updateAfter(10);
    EXPECT_EQ(proxy->count("01 33"), 2);
}

TEST_F(BoostPressure, BarometerOfOneModuleLeavesTheOtherAtTheStandardAtmosphere)
{
    auto const second = std::make_shared<support::FakeEcu>(0x7E9);
    second->setSupported(derived::ObdMode::CurrentData, {0x0B, 0x33});
    proxy->addEcu(second);
    proxy->answer("01 0B", {{0x7E8, "41 0B 50"}, {0x7E9, "41 0B 50"}});
    proxy->answer("01 33", {{0x7E9, "41 33 5A"}});
    parameter.update(proxy);
    updateAfter(1000);
    EXPECT_NEAR(pressure(), -21.325, 1e-9);
    EXPECT_NEAR(parameter.pressure(*second, UnitSystem::Metric), -10.0, 1e-9);
}

TEST_F(BoostPressure, IsTheMeanOfThreeQuartersOfASecond)
{
    parameter.update(proxy);
    answer("01 0B", "41 0B 64"); // 100 kPa
    updateAfter(750);
    EXPECT_NEAR(pressure(), 90.0 - 101.325, 1e-9);
    updateAfter(1);
    EXPECT_NEAR(pressure(), 100.0 - 101.325, 1e-9) << "a sample of 751 ms is dropped";
}

TEST_F(BoostPressure, FailsWithTheManifoldPressureAndKeepsItsValue)
{
    support({0x0B, 0x33});
    parameter.update(proxy);
    proxy->fail("01 0B", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(updateAfter(6000), Status::UpdateFailed);
    EXPECT_EQ(proxy->count("01 33"), 2) << "the barometer is read all the same";
    EXPECT_NEAR(pressure(), -21.325, 1e-9);
}

TEST_F(BoostPressure, SamplesOutliveTheParameter)
{
    obd::BoostPressure().update(proxy);
    EXPECT_NEAR(pressure(), -21.325, 1e-9);
}

TEST_F(BoostPressure, ClearBringsBackTheStandardAtmosphere)
{
    support({0x0B, 0x33});
    parameter.update(proxy);
    parameter.clear();
    EXPECT_EQ(pressure(), 0.0);
    proxy->fail("01 33", obd::IDevice::Status::NoResponse);
    updateAfter(10);
    EXPECT_NEAR(pressure(), -21.325, 1e-9);
    EXPECT_EQ(proxy->count("01 33"), 2) << "asked anew";
}

TEST_F(BoostPressure, ModuleWithoutTheInputIsSkipped)
{
    support({0x0C});
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(pressure(), 0.0);
}

} // namespace
