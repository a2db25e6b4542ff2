#include "libobd/powertrain/enginepower.h"
#include "tests/libobd/powertrain/derivedrig.h"

namespace {

using derived::Status;
using derived::UnitSystem;

class EnginePower : public derived::Rig
{
protected:
    EnginePower()
    {
        parameter.clear(); // what it keeps outlives objects, and so tests
    }

    double power() { return parameter.power(*ecu, UnitSystem::Metric); }

    // Drives that fast from that many milliseconds after the reading before.
    Status driveAfter(unsigned int ms, unsigned int kilometresPerHour)
    {
        clock.advance(ms);
        drive(kilometresPerHour);
        return parameter.update(proxy);
    }

    obd::EnginePower parameter{1500};
};

TEST_F(EnginePower, IsThatOfTheAccelerationAndTheDrag)
{
    EXPECT_EQ(driveAfter(0, 36), Status::UpdateOk);
    EXPECT_EQ(power(), 0.0) << "one speed is no acceleration";
    EXPECT_EQ(driveAfter(1000, 45), Status::UpdateOk);
    EXPECT_NEAR(power(), 44.8145853515625, 1e-9);
    EXPECT_NEAR(parameter.power(*ecu, UnitSystem::Imperial), 60.097348856858225, 1e-9);
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Metric), "45");
}

TEST_F(EnginePower, FirstSpeedHasNoneBeforeIt)
{
    // Else the start from time 0 would count as an acceleration.
    driveAfter(0, 100);
    EXPECT_EQ(power(), 0.0);
}

TEST_F(EnginePower, GoesWithTheWeight)
{
    obd::EnginePower heavy(3000);
    drive(36);
    heavy.update(proxy);
    clock.advance(1000);
    drive(45);
    heavy.update(proxy);
    double const drag = 12.5 * 12.5 * 12.5 * 0.6121 * 0.3 * 0.79 * 0.5 * 0.001;
    EXPECT_NEAR(heavy.power(*ecu, UnitSystem::Metric) - 2.0 * drag, 2.0 * (44.8145853515625 - 2.0 * drag), 1e-9);
}

TEST_F(EnginePower, IsNothingWhenBrakingOrAtSteadySpeedButForTheSamplesOfTheLastSecond)
{
    driveAfter(0, 36);
    driveAfter(1000, 45);
    driveAfter(500, 45);
    EXPECT_NEAR(power(), 44.8145853515625, 1e-9);
    driveAfter(500, 40);
    EXPECT_NEAR(power(), 44.8145853515625, 1e-9) << "1000 ms old";
    driveAfter(1, 40);
    EXPECT_EQ(power(), 0.0) << "1001 ms old, and dropped though no new sample is made";
    driveAfter(1000, 30);
    EXPECT_EQ(power(), 0.0);
}

TEST_F(EnginePower, IsTheMeanOfASecond)
{
    driveAfter(0, 36);
    driveAfter(1000, 45);
    double const first = power();
    driveAfter(500, 60);
    double const both = power();
    driveAfter(600, 60);
    double const second = power();
    EXPECT_NEAR(both, (first + second) / 2.0, 1e-9);
    EXPECT_GT(second, first);
}

TEST_F(EnginePower, TwoSpeedsOfTheSameTimeMakeNone)
{
    driveAfter(0, 36);
    driveAfter(0, 45);
    EXPECT_EQ(power(), 0.0);
}

TEST_F(EnginePower, FailedReadingKeepsTheValue)
{
    driveAfter(0, 36);
    driveAfter(1000, 45);
    proxy->fail("01 0D", obd::IDevice::Status::NoResponse);
    clock.advance(5000);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateFailed);
    EXPECT_NEAR(power(), 44.8145853515625, 1e-9);
}

TEST_F(EnginePower, SamplesOutliveTheParameterAndEndWithClear)
{
    drive(36);
    obd::EnginePower(1500).update(proxy);
    driveAfter(1000, 45);
    EXPECT_NEAR(power(), 44.8145853515625, 1e-9);
    obd::EnginePower(1500).clear();
    EXPECT_EQ(power(), 0.0);
    driveAfter(1000, 60);
    EXPECT_EQ(power(), 0.0) << "the speed before is forgotten as well";
}

TEST_F(EnginePower, UnknownModuleHasNone)
{
    EXPECT_EQ(parameter.power(support::FakeEcu(0x123), UnitSystem::Metric), 0.0);
}

TEST_F(EnginePower, IsReadWithoutAskingWhatTheModuleSupports)
{
    support({});
    driveAfter(0, 36);
    driveAfter(1000, 45);
    EXPECT_GT(power(), 0.0);
}

} // namespace
