// Signals of one's own through the whole car: files, choice, adapter, simulated modules.

#include "tests/support/temporaryfolder.h"

#include <velmora/car.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <mutex>

namespace {

using testing::HasSubstr;
using velmora::Car;
using velmora::CarOptions;
using velmora::Error;
using velmora::Reading;

char const* const petrolSignals = R"toml(
[vehicle]
vin = "VELMRAS*"

[[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox oil temperature"
header = "7E1"
request = "221E1C"
formula = "(A*256+B)/16"
unit = "°C"
precision = 1

[[signal]]
id = "BODY_DISTANCE"
name = "Distance by the body module"
header = "743"
reply = "763"
request = "222801"
formula = "int16(A, B)*10"
unit = "km"
precision = 0

[[signal]]
id = "CHARGE"
name = "Battery charge"
header = "6F1"
reply = "607"
ext = "07"
request = "22DDBC"
formula = "int16(A, B)/10"
unit = "%"
length = 7

[[signal]]
id = "CHARGE_OF_ANOTHER_YEAR"
name = "Charge of another year"
header = "6F1"
reply = "607"
ext = "07"
request = "22DDBC"
formula = "A"
length = 3

[[signal]]
id = "PART"
name = "Part number of the body module"
header = "743"
reply = "763"
request = "22F187"
text = { first = 0, count = 11 }

[[signal]]
id = "TIRE"
name = "Tire temperature"
header = "7D6"
reply = "7DE"
request = "2106"
formula = "F-55"
unit = "°C"

[[signal]]
id = "TWICE_THE_TIRE"
name = "Twice the tire"
formula = "value(\"TIRE\")*2"
unit = "°C"

[[signal]]
id = "DIVISION"
name = "A division by zero"
header = "7D6"
reply = "7DE"
request = "2106"
formula = "A/(B-B)"

[[signal]]
id = "LOCKED"
name = "Locked away"
header = "7E1"
request = "221E31"
formula = "A"

[[signal]]
id = "LATE"
name = "Told after two requests for time"
header = "7E1"
request = "221E20"
formula = "A"

[[signal]]
id = "OFF"
name = "Switched off"
header = "7E1"
request = "221E20"
formula = "A"
enabled = false
reason = "needs session 03"
)toml";

class SignalCar : public testing::Test
{
protected:
    CarOptions options(std::string const& vehicle, std::string const& signals)
    {
        CarOptions result;
        result.port = "sim:" + vehicle + "?instant";
        result.settingsFile = (m_folder.path() / "settings.toml").string();
        std::filesystem::create_directories(m_folder.path() / "signals");
        std::ofstream(m_folder.path() / "signals" / "mine.toml") << signals;
        return result;
    }
    static Reading const* find(std::vector<Reading> const& readings, std::string const& sensor)
    {
        auto const found = std::find_if(readings.begin(), readings.end(),
                                        [&sensor](Reading const& each) { return each.sensor == sensor; });
        return found != readings.end() ? &*found : nullptr;
    }
    static std::string text(std::vector<Reading> const& readings, std::string const& sensor)
    {
        Reading const* const reading = find(readings, sensor);
        return reading != nullptr ? valueText(*reading) + reading->unit : "missing";
    }

    testsupport::TemporaryFolder m_folder;
};

TEST_F(SignalCar, ReadsSignalsOfAllKindsOfModulesBesideStandardSensors)
{
    Car car(options("petrol-can11-modules", petrolSignals));
    std::vector<Reading> const readings =
        car.read({"RPM", "gearbox_temp", "BODY_DISTANCE", "CHARGE", "CHARGE_OF_ANOTHER_YEAR", "PART", "TIRE",
                  "TWICE_THE_TIRE", "DIVISION", "LOCKED", "LATE", "A6"});
    EXPECT_TRUE(number(*find(readings, "RPM")));
    Reading const* const gearbox = find(readings, "GEARBOX_TEMP");
    ASSERT_NE(gearbox, nullptr);
    EXPECT_EQ(gearbox->module, 0x7E9U);
    EXPECT_EQ(gearbox->pid, "221E1C");
    EXPECT_EQ(gearbox->unit, "°C");
    ASSERT_TRUE(number(*gearbox));
    EXPECT_NEAR(*number(*gearbox), 60.0, 60.0);
    EXPECT_EQ(gearbox->raw.size(), 5U);
    EXPECT_EQ(text(readings, "BODY_DISTANCE"), "88120km");
    EXPECT_EQ(text(readings, "CHARGE"), "85.00%");
    EXPECT_EQ(text(readings, "CHARGE_OF_ANOTHER_YEAR"), "-") << "another length tells nothing";
    EXPECT_EQ(text(readings, "PART"), "28400-S1004");
    EXPECT_EQ(text(readings, "TIRE"), "17.00°C");
    EXPECT_EQ(text(readings, "TWICE_THE_TIRE"), "34.00°C");
    EXPECT_EQ(text(readings, "DIVISION"), "-");
    EXPECT_EQ(text(readings, "LOCKED"), "-");
    EXPECT_EQ(text(readings, "LATE"), "1.00");
    EXPECT_EQ(text(readings, "ODOMETER"), "88120.0km") << "PID A6, a built-in definition";
    EXPECT_TRUE(number(car.read({"RPM"}).front())) << "nothing of the modules' settings is left";
}

TEST_F(SignalCar, TellsWhyASignalCanNotBeRead)
{
    struct Row
    {
        char const* word;
        char const* why;
    };
    {
        Car car(options("petrol-can11-modules", petrolSignals));
        EXPECT_EQ(text(car.read({"tire"}), "TIRE"), "17.00°C") << "a whole id, though a name has the word, too";
        EXPECT_EQ(car.read({"gearbox"}).front().sensor, "GEARBOX_TEMP") << "the only name with that word";
        for (Row const& row : {Row{"OFF", "needs session 03"}, Row{"body module", "fits several"},
                               Row{"88", "not decoded"}, Row{"A4", "does not offer"}}) {
            try {
                car.read({row.word});
                ADD_FAILURE() << row.word;
            } catch (Error const& error) {
                EXPECT_THAT(error.what(), HasSubstr(row.why)) << row.word;
            }
        }
    }
    Car other(options("electric-can11", petrolSignals));
    try {
        other.read({"GEARBOX_TEMP"});
        FAIL() << "it is of another car";
    } catch (Error const& error) {
        EXPECT_THAT(error.what(), HasSubstr("VELMRAS*"));
    }
}

TEST_F(SignalCar, WatchesSignalsAtTheirRatesAmongStandardSensors)
{
    Car car(options("electric-can11", R"toml(
[[signal]]
id = "BATTERY_VOLTS"
name = "Battery volts"
header = "7E4"
request = "220101"
formula = "int16(E, F)/10"
unit = "V"
rate = 20

[[signal]]
id = "OUTSIDE"
name = "Outside temperature"
header = "7B3"
reply = "7BB"
request = "220100"
formula = "A/2-40"
unit = "°C"
)toml"));
    std::mutex mutex;
    std::condition_variable changed;
    int speed = 0; // protected by mutex, as are the next two
    int volts = 0;
    int outside = 0;
    {
        velmora::Watch const watch = car.watch({"SPEED", "BATTERY_VOLTS", "OUTSIDE"}, [&](Reading const& reading) {
            EXPECT_TRUE(number(reading)) << reading.sensor;
            std::lock_guard const lock(mutex);
            ++(reading.sensor == "SPEED" ? speed : reading.sensor == "BATTERY_VOLTS" ? volts : outside);
            changed.notify_all();
        });
        std::unique_lock lock(mutex);
        changed.wait_for(lock, std::chrono::seconds(20), [&] { return speed >= 5 && volts >= 5 && outside >= 1; });
    }
    EXPECT_GE(speed, 5);
    EXPECT_GE(volts, 5);
    EXPECT_GE(outside, 1);
}

} // namespace
