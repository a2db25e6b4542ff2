#include "libvelmora/output/eventkinds.h"
#include "libvelmora/watch/watchengine.h"
#include "tests/support/driventime.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <functional>

namespace {

using namespace std::chrono_literals;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using velmora::Error;
using velmora::ErrorKind;
using velmora::Record;

// A car on a driven clock that gives one reading of speed and engine speed a second while it is asked.
class DrivenCar : public velmora::IWatchedCar
{
public:
    explicit DrivenCar(testsupport::DrivenTime const& time) : m_time(time) {}

    bool plugged = true;
    bool answers = true;
    bool engineless = false; // tells no engine speed
    double rpm = 0.0;
    double kmh = 0.0;
    double battery = 12.6;
    std::optional<bool> lamp = false;
    std::uint64_t asked = 0;
    int connects = 0;
    int voltLooks = 0;
    std::string number = "VIN-1";
    bool canNap = true;
    bool woken = false;
    int naps = 0;
    int given = 0; // readings
    std::function<void()> onAttempt = [] {};
    std::function<void()> onConnect = [] {};
    std::function<void()> onCodes = [] {};

    void connect() override
    {
        ++connects;
        onAttempt();
        needLink();
        asked += 10;
        if (!answers) {
            throw Error(ErrorKind::VehicleSilent, "no module answers");
        }
        onConnect();
        m_up = true;
    }
    void disconnect() override
    {
        m_up = false;
        m_asking = false;
    }
    std::vector<velmora::ModuleInfo> modules() override { return {{m_time.now.wall, "van", 0x7E8, "ECM", "", ""}}; }
    velmora::SensorList sensors() override { return {m_time.now.wall, "van", {}}; }
    void startAsking() override
    {
        EXPECT_TRUE(m_up);
        m_asking = true;
        m_next = m_time.steady();
    }
    void stopAsking() override { m_asking = false; }
    std::vector<velmora::Reading> readings() override
    {
        std::vector<velmora::Reading> result;
        for (; m_asking && plugged && m_next <= m_time.steady(); m_next += 1s) {
            asked += 2;
            if (answers) {
                if (!engineless) {
                    result.push_back(reading("RPM", rpm));
                }
                result.push_back(reading("SPEED", kmh));
            }
        }
        given += static_cast<int>(result.size());
        return result;
    }
    std::vector<velmora::CodeLook> lookAtCodes() override
    {
        needLink();
        asked += 3;
        ++codeLooks;
        onCodes();
        return {{0x7E8, lamp, {}, {}}};
    }
    void check() override { needLink(); }
    std::optional<double> volts() override
    {
        needLink();
        ++voltLooks;
        return battery;
    }
    bool probe() override
    {
        needLink();
        ++asked;
        return answers;
    }
    std::string vin() const override { return number; }
    bool startNap() override
    {
        needLink();
        disconnect();
        ++naps;
        return canNap;
    }
    bool napIsOver() override { return woken; }
    std::uint64_t requests() const override { return asked; }
    std::uint64_t errors() const override { return 0; }

    int codeLooks = 0;

private:
    void needLink() const
    {
        if (!plugged) {
            throw Error(ErrorKind::PortFailed, "no such device");
        }
    }
    velmora::Reading reading(std::string const& sensor, double value) const
    {
        velmora::Reading result;
        result.time = m_time.now.wall;
        result.sensor = sensor;
        result.value = value;
        return result;
    }

    testsupport::DrivenTime const& m_time;
    bool m_up = false;
    bool m_asking = false;
    velmora::SteadyTime m_next;
};

struct Watch
{
    testsupport::DrivenTime time;
    DrivenCar car{time};
    std::vector<std::string> events;
    std::vector<velmora::Trip> trips;
    int readings = 0;
    velmora::WatchEngine engine;

    explicit Watch(velmora::WatchRules rules = {})
        : engine(
              car, std::move(rules), [this](Record const& record) { take(record); }, time.now)
    {}

    void take(Record const& record)
    {
        if (auto const* const event = std::get_if<velmora::Event>(&record)) {
            EXPECT_THAT(velmora::eventKinds, Contains(event->kind));
            events.push_back(event->kind);
        } else if (auto const* const trip = std::get_if<velmora::Trip>(&record)) {
            trips.push_back(*trip);
        } else if (std::holds_alternative<velmora::Reading>(record)) {
            ++readings;
        }
    }
    void run(std::chrono::milliseconds duration)
    {
        velmora::SteadyTime const end = time.steady() + duration;
        while (time.steady() < end) {
            std::chrono::milliseconds const pause = step();
            auto const left = std::chrono::ceil<std::chrono::milliseconds>(end - time.steady());
            time.pass(std::clamp(pause, std::chrono::milliseconds(0), std::max(left, std::chrono::milliseconds(0))));
        }
        step();
    }
    // What it does may take time, of which it does not know.
    std::chrono::milliseconds step()
    {
        velmora::WatchTime const now = time.now;
        return engine.step(now);
    }
    void drive(std::chrono::milliseconds duration)
    {
        car.answers = true;
        car.rpm = 2000;
        car.kmh = 60;
        car.battery = 14.2;
        run(duration);
        car.rpm = 0;
        car.kmh = 0;
        car.battery = 12.9;
    }
};

TEST(WatchEngine, ADayCostsAParkedCarNotASingleRequest)
{
    Watch watch;
    watch.drive(30min);
    EXPECT_THAT(watch.events, ElementsAre("ignition_on", "engine_start"));
    EXPECT_GT(watch.readings, 3500);
    watch.run(120s + 5s); // the ignition stays on for a while
    EXPECT_THAT(watch.events, Contains("asleep"));
    watch.car.answers = false;
    std::uint64_t const before = watch.car.asked;
    for (int hour = 0; hour < 8; ++hour) {
        watch.run(30min);
        watch.car.battery = 12.8 - hour / 20.0; // the surface charge goes
        watch.run(30min);
    }
    EXPECT_EQ(watch.car.asked, before);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_NEAR(watch.car.voltLooks, 478, 2);
    EXPECT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(watch.trips.at(0).distanceKm, 30, 0.1);
    watch.events.clear();
    watch.drive(30min);
    watch.run(10min);
    EXPECT_THAT(watch.events,
                ElementsAre("awake", "ignition_on", "engine_start", "engine_stop", "ignition_off", "asleep", "trip"));
    ASSERT_EQ(watch.trips.size(), 2U);
    EXPECT_NEAR(watch.trips.at(1).distanceKm, 30, 1.1); // noticed at the next look
    EXPECT_EQ(watch.car.connects, 1);
}

TEST(WatchEngine, SurvivesALinkLossAMinuteForADay)
{
    Watch watch;
    watch.car.rpm = 900;
    for (int i = 0; i < 1440; ++i) {
        watch.car.plugged = true;
        watch.run(50s);
        watch.car.plugged = false;
        watch.run(10s + 1ms);
    }
    EXPECT_EQ(watch.readings, watch.car.given); // none lost between, none doubled
    EXPECT_EQ(std::ranges::count(watch.events, "link_lost"), 1440);
    EXPECT_EQ(std::ranges::count(watch.events, "link_back"), 1439);
    EXPECT_EQ(watch.engine.health().linkLosses, 1440U);
    EXPECT_GT(watch.readings, 1440 * 2 * 30);
}

TEST(WatchEngine, TellsABrokenLinkAtOnceAndTriesAgain)
{
    Watch watch;
    watch.drive(1min);
    watch.car.plugged = false;
    watch.run(500ms);
    EXPECT_THAT(watch.events, Contains("link_lost")) << "not after the silence that a car may keep";
    watch.car.plugged = true;
    watch.run(2s);
    EXPECT_THAT(watch.events, Contains("link_back"));
}

TEST(WatchEngine, TriesAMissingAdapterAtGrowingPauses)
{
    Watch watch;
    watch.car.plugged = false;
    watch.run(60s);
    EXPECT_GE(watch.car.connects, 5);
    EXPECT_LE(watch.car.connects, 9);
    EXPECT_EQ(watch.engine.state(), "no link");
    EXPECT_EQ(watch.engine.trouble(), "no such device");
    watch.run(1h);
    int const before = watch.car.connects;
    watch.run(1h);
    EXPECT_GE(watch.car.connects - before, 59);
    EXPECT_LE(watch.car.connects - before, 121);
    EXPECT_THAT(watch.events, IsEmpty()); // there was no link to lose
    watch.car.plugged = true;
    watch.drive(70s);
    EXPECT_THAT(watch.events, ElementsAre("ignition_on", "engine_start"));
    EXPECT_EQ(watch.engine.trouble(), "");
}

TEST(WatchEngine, PausesBeginWhenAnAttemptHasEnded)
{
    Watch watch;
    watch.car.plugged = false;
    watch.car.onAttempt = [&watch] { watch.time.pass(20s); }; // an adapter out of reach, by its operating system
    watch.run(1h);
    EXPECT_GE(watch.car.connects, 3600 / 80);
    EXPECT_LE(watch.car.connects, 3600 / 50 + 6);
}

TEST(WatchEngine, ALinkThatComesBackInADriveIsUsedAtOnce)
{
    Watch watch;
    watch.drive(5min);
    watch.car.plugged = false;
    watch.run(30min);
    watch.car.plugged = true;
    int const before = watch.readings;
    watch.drive(2min);
    EXPECT_GT(watch.readings, before + 100);
}

// A K line takes minutes to be brought up and to tell its codes.
TEST(WatchEngine, TimeThatASlowBusTakesIsNoSilenceOfTheCar)
{
    Watch watch;
    watch.car.onConnect = [&watch] { watch.time.pass(3min); };
    watch.run(4min); // the ignition is on, the engine stands
    EXPECT_EQ(watch.engine.state(), "asking");
    watch.run(90s);
    EXPECT_THAT(watch.events, Contains("asleep"));

    Watch driving;
    driving.drive(1min);
    driving.car.onCodes = [&driving] { driving.time.pass(3min); };
    driving.drive(30min);
    EXPECT_THAT(driving.events, testing::Not(Contains("asleep")));
    EXPECT_EQ(driving.engine.state(), "running");
}

TEST(WatchEngine, ASleepingCarIsNoError)
{
    Watch watch;
    watch.car.answers = false;
    watch.run(1h);
    EXPECT_EQ(watch.car.connects, 1);
    EXPECT_EQ(watch.engine.state(), "parked");
    EXPECT_GT(watch.car.voltLooks, 50);
    watch.car.battery = 12.2;
    watch.car.answers = true;
    watch.car.rpm = 800;
    watch.run(70s);
    EXPECT_EQ(watch.engine.state(), "running");
}

TEST(WatchEngine, LooksAtCodesEveryTenMinutesAndAtEachStart)
{
    Watch watch;
    watch.car.kmh = 10; // rolls, with the ignition on
    watch.run(35min);
    EXPECT_EQ(watch.car.codeLooks, 1 + 1 + 3); // connected, started, each ten minutes
    watch.car.lamp = true;
    watch.run(10min);
    EXPECT_THAT(watch.events, Contains("lamp_on"));
}

TEST(WatchEngine, ALinkLostWhileParkedComesBackWithoutARequest)
{
    Watch watch;
    watch.drive(2min);
    watch.run(10min);
    watch.car.answers = false;
    std::uint64_t const before = watch.car.asked;
    watch.car.plugged = false;
    watch.run(1h);
    EXPECT_EQ(watch.events.back(), "link_lost");
    watch.car.plugged = true;
    watch.run(1h);
    EXPECT_EQ(watch.events.back(), "link_back");
    EXPECT_EQ(watch.car.asked, before);
    EXPECT_EQ(watch.car.connects, 1);
}

TEST(WatchEngine, ALowBatteryIsToldAndThatItHasRecovered)
{
    Watch watch;
    watch.drive(2min);
    watch.run(5min);
    watch.events.clear();
    watch.car.answers = false;
    watch.car.battery = 12.0;
    watch.run(5min);
    EXPECT_THAT(watch.events, ElementsAre("voltage_low"));
    watch.car.battery = 12.3;
    watch.run(65s);
    EXPECT_THAT(watch.events, Contains("voltage_good"));
}

// A car that tells no engine speed and no voltage runs by what the adapter measures.
TEST(WatchEngine, ACarThatTellsNeitherEngineNorVoltageIsJudgedByTheAdapters)
{
    Watch watch;
    watch.car.engineless = true;
    watch.car.battery = 14.1;
    watch.run(10min);
    EXPECT_EQ(watch.engine.state(), "running");
    EXPECT_NEAR(watch.car.voltLooks, 9, 1);
    watch.car.battery = 12.7;
    watch.run(10min);
    EXPECT_EQ(watch.engine.state(), "parked");
}

TEST(WatchEngine, AProbeIsMadeOnlyIfToldAndIsCounted)
{
    velmora::WatchRules rules;
    rules.battery.wakeEvery = 30min;
    Watch watch(rules);
    watch.car.answers = false;
    watch.run(10min);
    std::uint64_t const before = watch.car.asked;
    watch.run(3h);
    EXPECT_EQ(watch.car.asked, before + 6);
    EXPECT_EQ(watch.engine.health().wakeRequests, 6U);
    watch.car.answers = true;
    watch.run(31min);
    EXPECT_THAT(watch.events, Contains("ignition_on"));
}

TEST(WatchEngine, AnAdapterThatSleepsIsLeftAloneUntilItWakes)
{
    velmora::WatchRules rules;
    rules.battery.adapterSleep = true;
    Watch watch(rules);
    watch.drive(2min);
    watch.car.answers = false;
    watch.run(8h);
    EXPECT_EQ(watch.car.naps, 1);
    EXPECT_EQ(watch.car.voltLooks, 0);
    EXPECT_EQ(watch.events.back(), "adapter_asleep");
    watch.car.woken = true;
    watch.drive(2min);
    EXPECT_EQ(watch.engine.state(), "running");
    EXPECT_EQ(watch.car.connects, 2);
    watch.car.canNap = false;
    watch.run(1h);
    EXPECT_EQ(watch.car.naps, 2);
    EXPECT_GT(watch.car.voltLooks, 50); // one that knows no sleep is asked for the voltage
    EXPECT_THAT(watch.events, Contains("adapter_awake"));
}

TEST(WatchEngine, DoesNothingWithAnotherVehicle)
{
    velmora::WatchRules rules;
    rules.isStranger = [](std::string const& vin) { return vin == "VIN-2"; };
    Watch watch(rules);
    watch.drive(1min);
    int const before = watch.readings;
    watch.car.plugged = false;
    watch.run(10s);
    watch.car.plugged = true;
    watch.car.number = "VIN-2";
    EXPECT_FALSE(watch.engine.metStranger());
    watch.drive(2min);
    EXPECT_TRUE(watch.engine.metStranger());
    EXPECT_LE(watch.readings, before + 2);
}

TEST(WatchEngine, TellsThatTheClockWasSetAndDatesTheTripByIt)
{
    velmora::ClockLook look{0, 0, false, "boot-1"};
    velmora::WatchRules rules;
    rules.clocks = [&look] { return look; };
    Watch watch(rules);
    watch.drive(5min);
    EXPECT_THAT(watch.events, testing::Not(Contains("clock_set")));
    look = {1772353200250, 300000, true, "boot-1"};
    watch.time.now.wall += 100h;
    watch.drive(5min);
    EXPECT_THAT(watch.events, Contains("clock_set"));
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(std::chrono::duration<double>(watch.trips[0].end - watch.trips[0].begin).count(), 600, 3);

    look = {0, 300000, false, "boot-1"}; // five minutes, and nobody has set it
    Watch other(rules);
    other.run(2s);
    EXPECT_EQ(std::ranges::count(other.events, "clock_unsure"), 1);
}

TEST(WatchEngine, AnEndKeepsTheTripUnderWay)
{
    Watch watch;
    watch.drive(10min);
    watch.engine.finish(watch.time.now);
    ASSERT_EQ(watch.trips.size(), 1U);
    EXPECT_NEAR(watch.trips.at(0).distanceKm, 10, 0.1);
}

} // namespace
