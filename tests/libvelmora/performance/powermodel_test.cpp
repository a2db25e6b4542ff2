#include "libobd/connection/velmorasettings.h"
#include "libvelmora/performance/powermodel.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeecu.h"
#include "tests/support/memorysettings.h"

#include <velmora/performance.h>

#include <gtest/gtest.h>

namespace {

using velmora::PowerModel;

class PowerModelTest : public testing::Test
{
protected:
    std::optional<PowerModel::Output> tell(std::vector<unsigned char> const& raw, unsigned int afterMs)
    {
        m_clock.advance(afterMs);
        m_time += std::chrono::milliseconds(afterMs);
        velmora::Reading reading;
        reading.time = m_time;
        reading.module = 0x7E8;
        reading.raw = raw;
        return m_model.take(reading);
    }

    support::FakeClock m_clock;
    std::chrono::system_clock::time_point m_time{std::chrono::seconds(1709802302)};
    std::shared_ptr<support::FakeEcu> m_ecu = [] {
        auto ecu = std::make_shared<support::FakeEcu>(0x7E8);
        ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
        return ecu;
    }();
    obd::VelmoraSettings m_settings{std::make_shared<support::MemorySettings>()};
    PowerModel m_model{m_ecu, m_settings};
};

TEST_F(PowerModelTest, WorksWithWhatWasReadAndAsksNothing)
{
    std::optional<PowerModel::Output> last;
    int told = 0;
    for (unsigned char kmh = 36; kmh < 80; ++kmh) { // 10 km/h a second
        tell({0x41, 0x0C, 0x2E, 0xE0}, 50);         // 3000 rpm
        if (auto const output = tell({0x41, 0x0D, kmh}, 50)) {
            last = output;
            ++told;
        }
    }
    ASSERT_TRUE(last);
    EXPECT_EQ(told, 9) << "twice a second at most";
    EXPECT_EQ(last->rpm, 3000.0);
    // 1500 kg x 2.78 m/s2 at some 19.4 m/s, in the mean of the last second's three values, and 1.2 kW against the air.
    EXPECT_NEAR(last->kilowatt, 82.0, 0.5);
    EXPECT_NEAR(last->newtonMetre, last->kilowatt * 1000.0 / (3000.0 / 60.0 * 2.0 * 3.14159265), 5.0);
}

TEST_F(PowerModelTest, TellsNothingWithoutBothSpeeds)
{
    EXPECT_FALSE(tell({0x41, 0x0D, 50}, 1000));
    EXPECT_FALSE(tell({0x41, 0x0D}, 1000)) << "a reply that is cut off";
    EXPECT_FALSE(tell({0x41, 0x05, 0x50}, 1000));
    EXPECT_FALSE(tell({}, 1000));
}

TEST(PowerModelReadings, AreInTheirOwnUnitsWhateverIsShown)
{
    velmora::Reading reading;
    reading.value = 31.07;
    reading.unit = "mph";
    reading.raw = {0x41, 0x0D, 50};
    EXPECT_EQ(velmora::speedIn(reading), 50.0);
    EXPECT_FALSE(velmora::engineSpeedIn(reading));
    reading.raw = {0x41, 0x0C, 0x1A, 0xF8};
    EXPECT_EQ(velmora::engineSpeedIn(reading), 1726.0);
}

TEST(PerformanceTimer, TakesTheReadingsOfItsModule)
{
    support::FakeClock clock;
    auto ecu = std::make_shared<support::FakeEcu>(0x7E8);
    ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
    obd::VelmoraSettings const settings{std::make_shared<support::MemorySettings>()};
    velmora::PerformanceTimer timer(ecu, settings);
    velmora::PerformanceTimer simple;
    velmora::Reading reading;
    auto const tell = [&](unsigned int module, std::vector<unsigned char> const& raw) {
        clock.advance(50);
        reading.time += std::chrono::milliseconds(50);
        reading.module = module;
        reading.raw = raw;
        timer.take(reading);
        simple.take(reading);
    };
    for (unsigned char kmh = 0; kmh <= 110; ++kmh) {
        tell(0x7E8, {0x41, 0x0C, 0x2E, 0xE0});
        tell(0x7E8, {0x41, 0x0D, kmh});
    }
    tell(0x7E9, {0x41, 0x0D, 0});
    velmora::PerformanceRun const run = timer.run();
    EXPECT_EQ(run.state, velmora::RunState::Running) << "another module's speed is none of this run";
    EXPECT_EQ(run.kilograms, 1500);
    EXPECT_FALSE(run.powers.empty());
    std::optional<velmora::SprintTime> const time =
        velmora::timeOf(velmora::sprintGoals(false)[0], run.speeds, run.interval);
    ASSERT_TRUE(time);
    EXPECT_NEAR(time->seconds, 10.0, 0.2);
    velmora::PerformanceRun const plain = simple.run();
    EXPECT_EQ(plain.state, velmora::RunState::Stopped) << "without a module each speed counts";
    EXPECT_TRUE(plain.powers.empty());
    EXPECT_EQ(plain.kilograms, 0);
}

} // namespace
