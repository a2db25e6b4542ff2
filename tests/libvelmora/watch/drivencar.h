#pragma once

#include "libvelmora/output/eventkinds.h"
#include "libvelmora/watch/watchengine.h"
#include "tests/support/driventime.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

namespace velmora::test {

// A car on a driven clock that gives one reading of speed and engine speed a second while it is asked.
class DrivenCar : public IWatchedCar
{
public:
    explicit DrivenCar(testsupport::DrivenTime const& time) : m_time(time) {}

    bool plugged = true;
    bool answers = true;
    bool engineless = false; // tells no engine speed
    bool voltless = false;   // nor does the adapter tell the voltage
    std::optional<double> odometer;
    std::optional<double> moduleVolts;
    std::optional<double> fuelRate;
    std::optional<double> coolant;
    double rpm = 0.0;
    double kmh = 0.0;
    double battery = 12.6;
    std::optional<bool> lamp = false;
    std::uint64_t asked = 0;
    int connects = 0;
    int voltLooks = 0;
    int stops = 0;
    int disconnects = 0;
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
        ++disconnects;
        m_up = false;
        m_asking = false;
    }
    std::vector<ModuleInfo> modules() override { return {{m_time.now.wall, "van", 0x7E8, "ECM", "", ""}}; }
    SensorList sensors() override { return {m_time.now.wall, "van", {}}; }
    void startAsking() override
    {
        EXPECT_TRUE(m_up);
        m_asking = true;
        m_next = m_time.steady();
    }
    void stopAsking() override
    {
        m_asking = false;
        ++stops;
    }
    std::vector<Reading> readings() override
    {
        std::vector<Reading> result;
        for (; m_asking && plugged && m_next <= m_time.steady(); m_next += std::chrono::seconds(1)) {
            asked += 2;
            if (answers) {
                addReadings(result);
            }
        }
        given += static_cast<int>(result.size());
        return result;
    }
    std::vector<CodeLook> lookAtCodes() override
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
        return voltless ? std::nullopt : std::optional(battery);
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
    void addReadings(std::vector<Reading>& result) const
    {
        auto const add = [&](std::string const& sensor, std::optional<double> const& value, char const* unit = "") {
            if (value) {
                result.push_back(reading(sensor, *value));
                result.back().unit = unit;
            }
        };
        add("RPM", engineless ? std::nullopt : std::optional(rpm));
        add("SPEED", kmh);
        add("CLEAR_DISTANCE", odometer);
        add("MODULE_VOLTAGE", moduleVolts);
        add("FUEL_RATE", fuelRate, "l/h");
        add("COOLANT_TEMP", coolant);
    }
    Reading reading(std::string const& sensor, double value) const
    {
        Reading result;
        result.time = m_time.now.wall;
        result.sensor = sensor;
        result.value = value;
        return result;
    }

    testsupport::DrivenTime const& m_time;
    bool m_up = false;
    bool m_asking = false;
    SteadyTime m_next;
};

// A watch of it, with what it has told.
struct DrivenWatch
{
    testsupport::DrivenTime time;
    DrivenCar car{time};
    std::vector<std::string> events;
    std::vector<Trip> trips;
    int modules = 0;
    int sensorLists = 0;
    int readings = 0;
    WatchEngine engine;

    explicit DrivenWatch(WatchRules rules = {})
        : engine(
              car, std::move(rules), [this](Record const& record) { take(record); }, time.now)
    {}

    void take(Record const& record)
    {
        if (auto const* const event = std::get_if<Event>(&record)) {
            EXPECT_THAT(eventKinds, testing::Contains(event->kind));
            events.push_back(event->kind);
        } else if (auto const* const trip = std::get_if<Trip>(&record)) {
            trips.push_back(*trip);
        } else if (std::holds_alternative<Reading>(record)) {
            ++readings;
        }
        modules += std::holds_alternative<ModuleInfo>(record) ? 1 : 0;
        sensorLists += std::holds_alternative<SensorList>(record) ? 1 : 0;
    }
    void run(std::chrono::milliseconds duration)
    {
        SteadyTime const end = time.steady() + duration;
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
        WatchTime const now = time.now;
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

} // namespace velmora::test
