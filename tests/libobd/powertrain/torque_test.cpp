#include "libobd/powertrain/torque.h"
#include "tests/libobd/powertrain/derivedrig.h"

namespace {

using derived::Status;
using derived::UnitSystem;

class Torque : public derived::Rig
{
protected:
    Torque()
    {
        parameter.clear(); // what they keep outlives objects, and so tests
        obd::EnginePower(1500).clear();
        answer("01 0C", "41 0C 25 80"); // 2400 rpm
        drive(36);
    }

    double torque() { return parameter.torque(*ecu, UnitSystem::Metric); }

    // From 10 to 12.5 m/s within a second.
    void accelerate()
    {
        parameter.update(proxy);
        clock.advance(1000);
        drive(45);
        parameter.update(proxy);
    }

    obd::Torque parameter{1500};
};

TEST_F(Torque, ReadsTheEngineSpeedThenTheVehicleSpeed)
{
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(proxy->requests(), requests({"01 0C", "01 0D"}));
}

TEST_F(Torque, IsThePowerAtTheEngineSpeed)
{
    accelerate();
    EXPECT_NEAR(torque(), 178.3115695328704, 1e-6);
    EXPECT_EQ(parameter.torque(*ecu, UnitSystem::Imperial), torque()) << "Nm in both systems";
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Imperial), "178");
}

TEST_F(Torque, EngineSpeedIsReadAtTheTimeOfThePower)
{
    proxy->during([this] { clock.advance(100); });
    parameter.update(proxy);        // 2400 rpm at 100 ms, the power at 200
    answer("01 0C", "41 0C 28 A0"); // 2600 rpm at 1100
    clock.advance(800);
    drive(45);
    parameter.update(proxy); // the power at 1200: 2620 rpm
    double const watt = obd::EnginePower(1500).power(*ecu, UnitSystem::Metric) * 1000.0;
    EXPECT_NEAR(torque(), watt / (2620.0 / 60.0 * 6.283185307179586), 1e-6);
}

TEST_F(Torque, StandingEngineHasNone)
{
    accelerate();
    answer("01 0C", "41 0C 00 00");
    clock.advance(100);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(torque(), 0.0);
}

TEST_F(Torque, FailsUnlessBothAreRead)
{
    accelerate();
    double const before = torque();
    proxy->fail("01 0C", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateFailed);
    EXPECT_EQ(proxy->count("01 0D"), 3) << "read all the same";
    answer("01 0C", "41 0C 25 80");
    proxy->fail("01 0D", obd::IDevice::Status::NoResponse);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateFailed);
    EXPECT_EQ(torque(), before);
}

TEST_F(Torque, WithoutAnEngineSpeedThereIsNone)
{
    proxy->fail("01 0C", obd::IDevice::Status::NoResponse);
    accelerate();
    EXPECT_EQ(torque(), 0.0);
}

TEST_F(Torque, SharesThePowerWithThePowersOwnSensor)
{
    accelerate();
    EXPECT_NEAR(obd::EnginePower(1500).power(*ecu, UnitSystem::Metric), 44.8145853515625, 1e-9);
}

TEST_F(Torque, SamplesOutliveTheParameterAndEndWithClear)
{
    accelerate();
    EXPECT_NEAR(obd::Torque(1500).torque(*ecu, UnitSystem::Metric), 178.3115695328704, 1e-6);
    obd::Torque(1500).clear();
    EXPECT_EQ(torque(), 0.0);
}

} // namespace
