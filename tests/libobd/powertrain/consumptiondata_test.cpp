#include "libobd/powertrain/consumptiondata.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace {

using Input = obd::ConsumptionInput;
using obd::DieselConsumptionData;
using obd::GasConsumptionDataMaf;
using obd::GasConsumptionDataMap;

void addAir(obd::ConsumptionData& data, double value, std::uint32_t time = 2000)
{
    data.add(Input::Air, {time, value});
}

// Two readings of an input that reads the same at any time from then on. (With one it is on its way from its start at
// time 0.)
void hold(obd::ConsumptionData& data, Input input, double value)
{
    data.add(input, {1000, value});
    data.add(input, {2000, value});
}

// The mean once all results are those of an unchanging drive.
double settled(obd::ConsumptionData& data, double speed)
{
    hold(data, Input::Speed, speed);
    for (std::uint32_t time = 3000; time < 8000; time += 1000) {
        data.add(Input::Speed, {time, speed});
    }
    return data.mean();
}

double maf(double air, double speed)
{
    GasConsumptionDataMaf data;
    addAir(data, air);
    return settled(data, speed);
}

double map(double pressure, double rpm, double celsius, double speed)
{
    GasConsumptionDataMap data;
    data.setEngine(85.0, 2.0);
    addAir(data, pressure);
    hold(data, Input::IntakeTemperature, celsius);
    hold(data, Input::Rpm, rpm);
    return settled(data, speed);
}

double diesel(double air, double load, double speed)
{
    DieselConsumptionData data;
    addAir(data, air);
    hold(data, Input::Load, load);
    return settled(data, speed);
}

TEST(GasConsumptionDataMaf, WorkedExample)
{
    EXPECT_NEAR(maf(10.0, 50.0), 6.574441857279826, 1e-12);
}

TEST(GasConsumptionDataMap, WorkedExample)
{
    EXPECT_NEAR(map(60.0, 2400.0, 25.0, 80.0), 9.79464338632937, 1e-12);
}

TEST(DieselConsumptionData, WorkedExample)
{
    EXPECT_NEAR(diesel(20.0, 40.0, 90.0), 2.6525198938992043, 1e-12);
}

TEST(ConsumptionData, StandingStillReadsHalfALitreForAnyAirFlow)
{
    for (double const speed : {0.0, 1.0, 1.9}) {
        for (double const air : {0.0, 2.5, 655.35}) {
            EXPECT_EQ(maf(air, speed), 0.5);
            EXPECT_EQ(map(air, 800.0, 25.0, speed), 0.5);
            EXPECT_EQ(diesel(air, 25.0, speed), 0.5);
        }
    }
}

TEST(ConsumptionData, DieselWithoutLoadReadsNothingStandingOrMoving)
{
    for (double const load : {0.0, 0.39, 0.99}) {
        EXPECT_EQ(diesel(20.0, load, 0.0), 0.0);
        EXPECT_EQ(diesel(20.0, load, 90.0), 0.0);
    }
}

TEST(ConsumptionData, DieselWithALowLoadReadsHalfALitre)
{
    EXPECT_EQ(diesel(20.0, 1.0, 90.0), 0.5);
    EXPECT_EQ(diesel(20.0, 1.99, 90.0), 0.5);
    EXPECT_NE(diesel(20.0, 2.0, 90.0), 0.5);
}

TEST(ConsumptionData, SpeedOfThreeDividesByFive)
{
    EXPECT_NEAR(maf(10.0, 3.0), 65.74441857279825, 1e-12);
    EXPECT_DOUBLE_EQ(maf(10.0, 3.0), maf(10.0, 5.0));
    EXPECT_DOUBLE_EQ(map(60.0, 2400.0, 25.0, 3.0), map(60.0, 2400.0, 25.0, 5.0));
    EXPECT_DOUBLE_EQ(diesel(20.0, 40.0, 3.0), diesel(20.0, 40.0, 5.0));
}

// The results of air flows of 10, 20, 30 ... g/s, of which the last ones make the mean.
template <typename Data>
double meanOfLast(int results)
{
    double sum = 0.0;
    for (int i = 0; i < results; ++i) {
        Data data;
        addAir(data, 10.0 * (8 - i));
        hold(data, Input::Load, 50.0);
        hold(data, Input::IntakeTemperature, 25.0);
        hold(data, Input::Rpm, 2400.0);
        sum += settled(data, 60.0);
    }
    return sum / results;
}

// The mean after eight rounds of readings in which only the air and the speed are read, so that each makes one result.
template <typename Data>
double meanAfterEightRounds(std::uint32_t lambdaTime)
{
    Data data;
    data.add(Input::Lambda, {lambdaTime, 0.9});
    hold(data, Input::Load, 50.0);
    hold(data, Input::IntakeTemperature, 25.0);
    hold(data, Input::Rpm, 2400.0);
    data.add(Input::Speed, {2000, 60.0});
    for (int i = 1; i <= 8; ++i) {
        addAir(data, 10.0 * i, 3000);
        data.add(Input::Speed, {3000 + static_cast<std::uint32_t>(i), 60.0});
    }
    return data.mean();
}

TEST(ConsumptionData, WithoutLambdaTheWindowIsOneResultOfAirFlowAndTwoOfDiesel)
{
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<GasConsumptionDataMaf>(0), meanOfLast<GasConsumptionDataMaf>(1));
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<DieselConsumptionData>(0), meanOfLast<DieselConsumptionData>(2));
}

// The engine of the window tests.
class ProbeMap : public GasConsumptionDataMap
{
public:
    ProbeMap() { setEngine(85.0, 2.0); }
};

TEST(ConsumptionData, WithoutLambdaTheWindowIsThreeResultsOfManifoldPressure)
{
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<ProbeMap>(0), meanOfLast<ProbeMap>(3));
}

TEST(ConsumptionData, LambdaMakesTheWindowOneLonger)
{
    // From 1.0 at time 0 to 0.9 at 3000, the time of the air.
    double const richer = 1.0 / 0.9;
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<GasConsumptionDataMaf>(3000), meanOfLast<GasConsumptionDataMaf>(2) * richer);
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<ProbeMap>(3000), meanOfLast<ProbeMap>(4) * richer);
    EXPECT_DOUBLE_EQ(meanAfterEightRounds<DieselConsumptionData>(3000), meanOfLast<DieselConsumptionData>(3) * richer);
}

TEST(ConsumptionData, WindowThatHasGrownStaysSoWhenLambdaComesToOne)
{
    GasConsumptionDataMaf data;
    data.add(Input::Lambda, {2000, 0.8});
    addAir(data, 10.0, 2000);
    data.add(Input::Speed, {2000, 60.0});
    data.add(Input::Speed, {3000, 60.0});
    data.add(Input::Lambda, {3000, 1.0});
    data.add(Input::Lambda, {4000, 1.0});
    addAir(data, 40.0, 4000);
    data.add(Input::Speed, {4000, 60.0});
    addAir(data, 20.0, 5000);
    data.add(Input::Speed, {5000, 60.0});
    EXPECT_NEAR(data.mean(), (maf(40.0, 60.0) + maf(20.0, 60.0)) / 2.0, 1e-12);
}

TEST(ConsumptionData, AirAloneMakesNoResult)
{
    GasConsumptionDataMaf data;
    addAir(data, 10.0);
    hold(data, Input::Speed, 50.0);
    double const before = data.mean();
    addAir(data, 100.0, 3000);
    EXPECT_EQ(data.mean(), before);
    data.add(Input::Lambda, {3000, 1.0});
    EXPECT_NEAR(data.mean(), before * 10.0, 1e-12);
}

TEST(ConsumptionData, OtherInputsAreReadAtTheTimeOfTheAir)
{
    GasConsumptionDataMaf data;
    data.add(Input::Speed, {1000, 40.0});
    addAir(data, 10.0, 1500);
    data.add(Input::Speed, {2000, 60.0});
    EXPECT_DOUBLE_EQ(data.mean(), maf(10.0, 50.0));
    addAir(data, 10.0, 2500); // beyond both
    data.add(Input::Lambda, {2500, 1.0});
    EXPECT_DOUBLE_EQ(data.mean(), maf(10.0, 70.0));
}

TEST(ConsumptionData, LambdaIsReadAtTheTimeOfTheAir)
{
    GasConsumptionDataMaf data;
    hold(data, Input::Speed, 50.0);
    data.add(Input::Lambda, {1000, 0.7});
    addAir(data, 10.0, 1500);
    data.add(Input::Lambda, {2000, 0.9});
    data.add(Input::Speed, {3000, 50.0});
    EXPECT_NEAR(data.mean(), 8.21805232159978, 1e-12);
}

TEST(ConsumptionData, InputWithoutTwoTimesMakesNoResult)
{
    GasConsumptionDataMap data;
    data.setEngine(85.0, 2.0);
    addAir(data, 60.0);
    hold(data, Input::Rpm, 2400.0);
    hold(data, Input::Speed, 80.0);
    EXPECT_EQ(data.mean(), 0.0) << "no temperature was read";
    data.add(Input::IntakeTemperature, {2000, 25.0});
    EXPECT_GT(data.mean(), 0.0) << "it has begun at time 0";

    GasConsumptionDataMaf twice;
    addAir(twice, 10.0);
    twice.add(Input::Speed, {2000, 50.0});
    double const before = twice.mean();
    addAir(twice, 20.0);
    twice.add(Input::Speed, {2000, 50.0}); // at the same time
    EXPECT_EQ(twice.mean(), before);
    twice.add(Input::Speed, {1990, 50.0}); // earlier
    EXPECT_EQ(twice.mean(), before);
}

TEST(ConsumptionData, LambdaWithoutTwoTimesStandsAtOne)
{
    GasConsumptionDataMaf data;
    addAir(data, 10.0);
    hold(data, Input::Speed, 50.0);
    data.add(Input::Lambda, {2000, 0.5});
    data.add(Input::Lambda, {2000, 0.5});
    EXPECT_NE(data.mean(), maf(10.0, 50.0)) << "the mean of two, as the first lambda had begun at time 0";
    data.add(Input::Speed, {3000, 50.0});
    EXPECT_DOUBLE_EQ(data.mean(), maf(10.0, 50.0));
}

TEST(ConsumptionData, NegativeResultBecomesZero)
{
    GasConsumptionDataMaf data;
    hold(data, Input::Speed, 50.0);
    data.add(Input::Lambda, {1000, 2.0});
    data.add(Input::Lambda, {1100, 1.0});
    addAir(data, 10.0, 1300); // the line comes to -1
    data.add(Input::Speed, {3000, 50.0});
    data.add(Input::Speed, {4000, 50.0});
    EXPECT_EQ(data.mean(), 0.0);
}

TEST(ConsumptionData, LambdaOfZeroIsEndlessWithAirAndNothingWithout)
{
    GasConsumptionDataMaf data;
    hold(data, Input::Speed, 50.0);
    addAir(data, 10.0);
    hold(data, Input::Lambda, 0.0);
    EXPECT_EQ(data.mean(), std::numeric_limits<double>::infinity());
    addAir(data, 0.0, 3000);
    data.add(Input::Speed, {3000, 50.0});
    data.add(Input::Speed, {4000, 50.0});
    EXPECT_EQ(data.mean(), 0.0);
}

TEST(ConsumptionData, TimesMayWrap)
{
    GasConsumptionDataMaf data;
    data.add(Input::Speed, {0xFFFFFE0CU, 40.0}); // 500 ms before the wrap
    addAir(data, 10.0, 0);
    data.add(Input::Speed, {500, 60.0});
    EXPECT_DOUBLE_EQ(data.mean(), maf(10.0, 50.0));
}

TEST(ConsumptionData, WithoutResultsTheMeanIsZero)
{
    EXPECT_EQ(GasConsumptionDataMaf().mean(), 0.0);
}

} // namespace
