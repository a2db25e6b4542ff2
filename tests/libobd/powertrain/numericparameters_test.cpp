#include "libobd/powertrain/numericparameters.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

#include <thread>

namespace {

using obd::ObdMode;
using obd::UnitSystem;
using support::FakeEcu;
using support::hexBytes;
using support::reply;
using support::texts;

template <typename Parameter>
class Fixture
{
public:
    Parameter parameter{ObdMode::CurrentData, 0};
    std::shared_ptr<FakeEcu> ecu = std::make_shared<FakeEcu>();

    double metric(std::string const& payload)
    {
        EXPECT_TRUE(reply(parameter, ecu, hexBytes(payload)));
        return parameter.value(*ecu, UnitSystem::Metric);
    }

    double imperial(std::string const& payload)
    {
        EXPECT_TRUE(reply(parameter, ecu, hexBytes(payload)));
        return parameter.value(*ecu, UnitSystem::Imperial);
    }
};

TEST(NumericParameters, EngineRpmDropsTheQuartersOfARevolution)
{
    Fixture<obd::EngineRpm> f;
    EXPECT_EQ(f.metric("1A F8"), 1726.0);
    EXPECT_EQ(f.parameter.engineRpm(*f.ecu), 1726u);
    EXPECT_EQ(f.metric("00 03"), 0.0);
}

TEST(NumericParameters, RelativeFuelRailPressureEndsAboveItsDeclaredMaximum)
{
    Fixture<obd::RelativeFuelRailPressure> f;
    EXPECT_EQ(f.metric("FF FF"), 5178.0);
    EXPECT_EQ(f.parameter.sensorInfo(*f.ecu)[0]->maxValue(UnitSystem::Metric), 5177.27);
}

TEST(NumericParameters, CatalystTemperatureIsCutTowardZero)
{
    Fixture<obd::CatalystTemperatureBank1Sensor1> f;
    EXPECT_EQ(f.metric("01 95"), 0.0); // 0.5 degrees
    EXPECT_EQ(f.metric("01 8F"), 0.0); // -0.1 degrees
}

TEST(NumericParameters, BothVapourPressuresCarryTheSameDescription)
{
    FakeEcu const ecu;
    obd::VaporPressure narrow(ObdMode::CurrentData, 0);
    obd::EvapSystemVaporPressure wide(ObdMode::CurrentData, 0);
    EXPECT_EQ(narrow.description(ecu), "Evap System Vapor Pressure");
    EXPECT_EQ(wide.description(ecu), "Evap System Vapor Pressure");
}

TEST(NumericParameters, FuelPressureIsWholeInKilopascalsOnly)
{
    Fixture<obd::FuelPressure> f;
    EXPECT_EQ(f.metric("FF"), 765.0);
    EXPECT_DOUBLE_EQ(f.imperial("FF"), 110.9538405);
}

TEST(NumericParameters, TemperaturesAndSpeedsAreCutTowardZeroInImperialUnits)
{
    Fixture<obd::IntakeAirTemperature> temperature;
    EXPECT_EQ(temperature.imperial("01"), -38.0); // -39 degrees C are -38.2 degrees F
    EXPECT_EQ(temperature.imperial("17"), 1.0);   // -17 degrees C are 1.4 degrees F
    Fixture<obd::VehicleSpeed> speed;
    EXPECT_EQ(speed.imperial("FF"), 158.0);
}

// The order of the operations shows in the last bit of many words.
TEST(NumericParameters, AirFlowIsScaledFromTheMaximumOfTheModule)
{
    Fixture<obd::AirFlowRate> f;
    for (unsigned int word = 0; word <= 0xFFFF; word += 7) {
        EXPECT_TRUE(reply(f.parameter, f.ecu,
                          {static_cast<unsigned char>(word >> 8U), static_cast<unsigned char>(word & 0xFFU)}));
        ASSERT_EQ(f.parameter.value(*f.ecu, UnitSystem::Metric), word * 655.35 / 65535) << word;
    }
    f.ecu->setAirFlowRateMax(1310.7);
    EXPECT_EQ(f.metric("FF FF"), 1310.7);
    EXPECT_EQ(f.parameter.sensorInfo(*f.ecu)[0]->maxValue(UnitSystem::Metric), 1310.7);
    EXPECT_EQ(f.parameter.sensorInfo(*f.ecu)[0]->maxValue(UnitSystem::Imperial), 1310.7 * 0.132277357);
}

TEST(NumericParameters, ManifoldPressureIsScaledFromTheMaximumOfTheModule)
{
    Fixture<obd::ManifoldPressure> f;
    EXPECT_EQ(f.metric("65"), 101.0);
    f.ecu->setManifoldPressureMax(510);
    EXPECT_EQ(f.metric("65"), 202.0);
    EXPECT_EQ(f.parameter.sensorInfo(*f.ecu)[0]->maxValue(UnitSystem::Metric), 510.0);
    f.ecu->setManifoldPressureMax(10);
    EXPECT_DOUBLE_EQ(f.metric("33"), 2.0);
}

TEST(NumericParameters, EquivalenceRatioIsScaledFromTheMaximumOfTheModule)
{
    Fixture<obd::CommandedFar> f;
    EXPECT_EQ(f.metric("FF FF"), 2.0);
    EXPECT_EQ(f.metric("80 00"), 0x8000 * 2.0 / 65535.0);
    f.ecu->setEquivalenceRatioMax(4);
    EXPECT_EQ(f.metric("80 00"), 0x8000 * 4.0 / 65535.0);
    EXPECT_EQ(f.parameter.sensorInfo(*f.ecu)[0]->maxValue(UnitSystem::Imperial), 4.0);
}

TEST(NumericParameters, AMaximumToldLaterDoesNotChangeWhatWasDecoded)
{
    Fixture<obd::CommandedFar> f;
    EXPECT_EQ(f.metric("FF FF"), 2.0);
    f.ecu->setEquivalenceRatioMax(4);
    EXPECT_EQ(f.parameter.value(*f.ecu, UnitSystem::Metric), 2.0);
}

TEST(NumericParameters, AModuleThatHasNotAnsweredReadsZeroInBothSystems)
{
    Fixture<obd::EngineCoolantTemperature> f;
    EXPECT_EQ(texts(f.parameter, *f.ecu, UnitSystem::Metric), "0");
    EXPECT_EQ(texts(f.parameter, *f.ecu, UnitSystem::Imperial), "0");
    EXPECT_EQ(f.parameter.value(*f.ecu, UnitSystem::Imperial), 0.0);
    EXPECT_FALSE(f.parameter.stored(*f.ecu));
    Fixture<obd::EngineRuntime> digits;
    EXPECT_EQ(texts(digits.parameter, *digits.ecu, UnitSystem::Metric), "0");
}

TEST(NumericParameters, ASecondReplyReplacesTheFirst)
{
    Fixture<obd::VehicleSpeed> f;
    EXPECT_EQ(f.metric("10"), 16.0);
    EXPECT_EQ(f.metric("20"), 32.0);
    EXPECT_EQ(f.parameter.stored(*f.ecu), 32.0);
    f.parameter.clear();
    EXPECT_FALSE(f.parameter.stored(*f.ecu));
}

TEST(NumericParameters, TheUnitSystemOfAReadingDoesNotChangeWhatIsStored)
{
    Fixture<obd::BarometricPressure> f;
    EXPECT_EQ(f.metric("65"), 101.0);
    EXPECT_EQ(texts(f.parameter, *f.ecu, UnitSystem::Imperial), "29.8");
    EXPECT_EQ(texts(f.parameter, *f.ecu, UnitSystem::Metric), "101");
}

TEST(NumericParameters, ReadingWhileAnotherThreadStoresIsSafe)
{
    Fixture<obd::EngineRpm> f;
    std::thread worker([&f] {
        for (unsigned char i = 0; i < 200; ++i) {
            reply(f.parameter, f.ecu, {i, i});
        }
    });
    unsigned int last = 0;
    while (last != (199u * 257u) >> 2U) {
        unsigned int const now = f.parameter.engineRpm(*f.ecu);
        EXPECT_GE(now, last);
        last = now;
    }
    worker.join();
}

} // namespace
