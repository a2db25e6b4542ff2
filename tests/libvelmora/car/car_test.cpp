#include "libvelmora/port/opening/openport.h"
#include "tests/support/temporaryfolder.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>
#include <velmora/car.h>
#include <velmora/print.h>

#include <gtest/gtest.h>

#include <atomic>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <sstream>
#include <thread>

namespace {

using velmora::Car;
using velmora::CarOptions;
using velmora::Error;
using velmora::ErrorKind;
using velmora::Reading;

CarOptions simulated(std::string const& vehicle)
{
    CarOptions options;
    options.port = "sim:" + vehicle + "?instant";
    options.settingsFile = "/proc/nonexistent/settings.toml";
    return options;
}

template <typename Value>
std::string printed(Value const& value)
{
    std::ostringstream text;
    text << value;
    return text.str();
}

// Waits for what callbacks bring; ten seconds are no measure but an end.
class Awaited
{
public:
    void add()
    {
        std::lock_guard const lock(m_mutex);
        ++m_count;
        m_wake.notify_all();
    }
    bool reaches(int count)
    {
        std::unique_lock lock(m_mutex);
        return m_wake.wait_for(lock, std::chrono::seconds(10), [&] { return m_count >= count; });
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    int m_count = 0;
};

// A simulated adapter whose link can be cut.
class CuttablePort : public velmora::IPort
{
public:
    explicit CuttablePort(std::function<void()>& cut) : m_cut(cut)
    {
        m_port = velmora::openPort(velmora::parsePortAddress("sim:petrol-can11?instant"));
    }
    ~CuttablePort() override { m_cut = nullptr; }
    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_cut = onLost;
        m_port->start(std::move(onBytes), std::move(onLost));
    }
    void write(std::string_view bytes) override { m_port->write(bytes); }
    void close() override { m_port->close(); }

private:
    std::function<void()>& m_cut;
    std::unique_ptr<velmora::IPort> m_port;
};

// One connection for all that needs no other.
class CarTest : public testing::Test
{
protected:
    static void SetUpTestSuite() { shared = std::make_unique<Car>(simulated("petrol-can11")); }
    static void TearDownTestSuite() { shared.reset(); }

    Car& car = *shared;

private:
    static std::unique_ptr<Car> shared;
};

std::unique_ptr<Car> CarTest::shared;

TEST_F(CarTest, GivesAllThatACarTells)
{
    auto const modules = car.modules();
    ASSERT_EQ(modules.size(), 2U);
    EXPECT_EQ(printed(modules[0]), "7E8 ECM");

    auto const readings = car.read({"RPM", "COOLANT_TEMP", "7E9:0C"});
    ASSERT_EQ(readings.size(), 3U);
    EXPECT_EQ(readings[0].sensor, "RPM");
    EXPECT_EQ(readings[0].module, 0x7E8U);
    EXPECT_GT(velmora::number(readings[0]).value_or(0.0), 500.0);
    EXPECT_EQ(readings[1].unit, "°C");
    EXPECT_EQ(readings[2].module, 0x7E9U);
    EXPECT_EQ(printed(readings[1]), "Engine Coolant Temperature: " + velmora::valueText(readings[1]) + " °C");

    auto const codes = car.codes();
    ASSERT_EQ(codes.size(), 4U);
    EXPECT_EQ(printed(codes[1]), "7E8 confirmed P0171 System Too Lean Bank 1");

    auto const freeze = car.freezeFrame();
    ASSERT_TRUE(freeze[0].report.frame.has_value());
    EXPECT_EQ(printed(freeze[0]).substr(0, 14), "7E8 ECM\nP0133 ");

    EXPECT_EQ(car.readiness()[0].report.answer, velmora::TopicAnswer::Read);
    EXPECT_EQ(car.info()[0].report.vin.size(), 17U);
    EXPECT_FALSE(car.monitors()[0].report.monitors.empty());

    auto const sensors = car.sensors();
    auto const rpm = std::find_if(sensors.begin(), sensors.end(), [](auto const& each) { return each.key == "RPM"; });
    ASSERT_NE(rpm, sensors.end());
    EXPECT_EQ(rpm->pid, "010C");

    EXPECT_EQ(car.counters()[0].report.counters.at(0).value, 412U);
    EXPECT_TRUE(car.oxygen()[0].report.onCan);
    EXPECT_GT(car.adapter().volts.value_or(0.0F), 11.0F);
    EXPECT_EQ(car.protocol().number, 6);

    EXPECT_NE(car.report().toJson().find("\"P0171\""), std::string::npos);
}

TEST_F(CarTest, PrintsTopics)
{
    EXPECT_EQ(printed(car.routines()[0]).substr(0, 39), "7E8 ECM\n01 Evaporative system leak test");
    EXPECT_NE(printed(car.counters()[0]).find(": 412\n"), std::string::npos);
    EXPECT_NE(printed(car.oxygen()[0]).find("Bank 1 sensor 1"), std::string::npos);
    EXPECT_EQ(printed(velmora::OxygenReport()), "not supported");
    EXPECT_EQ(printed(velmora::RoutinesReport{velmora::TopicAnswer::Silent, {}}), "no answer");
    velmora::RoutinesReport const known{velmora::TopicAnswer::Read, {{1, "Leak test", "Closes the purge valve."}}};
    std::vector<velmora::ModuleTopic<velmora::RoutinesReport>> const modules{{0x7E8, "ECM", known}};
    std::string const lines = velmora::toText(modules, velmora::TextStyle());
    EXPECT_NE(lines.find("Leak test\n    Closes the purge valve.\n"), std::string::npos) << lines;
}

TEST_F(CarTest, RunsARoutineOrSaysWhyNot)
{
    EXPECT_EQ(printed(car.runRoutine(1)), "7E8 ECM\n01 Evaporative system leak test: accepted");
    auto const kind = [this](int id) {
        try {
            car.runRoutine(id);
        } catch (Error const& error) {
            return error.kind();
        }
        return ErrorKind::Failed;
    };
    EXPECT_EQ(kind(2), ErrorKind::Refused);
    EXPECT_EQ(kind(3), ErrorKind::NotSupported);
    EXPECT_EQ(kind(500), ErrorKind::NotSupported);
}

TEST_F(CarTest, SaysWhatIsWrongWithSensors)
{
    auto const kind = [this](std::string const& word) {
        try {
            car.read({word});
        } catch (Error const& error) {
            return error.kind();
        }
        return ErrorKind::Failed;
    };
    EXPECT_EQ(kind("NONSENSE"), ErrorKind::WrongUse);
    EXPECT_EQ(kind("OIL_TEMP@never"), ErrorKind::WrongUse);
    EXPECT_EQ(kind("7EA:RPM"), ErrorKind::NotSupported);
}

TEST_F(CarTest, IsOneInAProcess)
{
    try {
        Car second(simulated("petrol-can11"));
        FAIL() << "a second car was made";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
        EXPECT_EQ(printed(error).substr(0, 43), "There is a car in this process already\n  - ");
    }
    EXPECT_EQ(car.modules().size(), 2U) << "the first one goes on";
}

TEST_F(CarTest, LendsTheCoreForTheRest)
{
    std::thread::id thread;
    car.library([&](obd::IObdVelmora& obd) {
        thread = std::this_thread::get_id();
        EXPECT_TRUE(obd.getConnectionManager()->getProxy()->isConnected());
    });
    EXPECT_NE(thread, std::this_thread::get_id());
    EXPECT_THROW(car.library([](obd::IObdVelmora&) { throw std::runtime_error("mine"); }), std::runtime_error);
}

TEST(CarLife, AFailedOneLeavesRoomForTheNext)
{
    for (int i = 0; i < 2; ++i) {
        try {
            Car car(simulated("no-such-vehicle"));
            FAIL() << "there is no such vehicle";
        } catch (Error const& error) {
            EXPECT_NE(std::string(error.what()).find("no-such-vehicle"), std::string::npos) << error;
        }
    }
}

TEST(CarLife, ClearsCodesOfAllModules)
{
    Car car(simulated("petrol-can11"));
    auto const cleared = car.clearCodes();
    ASSERT_EQ(cleared.size(), 2U);
    EXPECT_EQ(printed(cleared[0]), "7E8 ECM\ncleared");
    for (velmora::StoredCode const& code : car.codes()) {
        EXPECT_EQ(code.kind, velmora::CodeKind::Permanent) << code;
    }
}

TEST(CarLife, AModuleThatIsSilentWhereAnotherAnswersHasNoValuesInTheReport)
{
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("silent.toml");
    std::ofstream(file) << R"(name = "two modules, of which one does not tell what it claims"
protocol = 6
[[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 08 00 00 01"
"0120" = "41 20 00 01 00 00"
[[module]]
id = "7E9"
[module.raw]
"0100" = "41 00 08 00 00 01"
"0120" = "41 20 00 01 00 00"
"0105" = "41 05 82"
"0130" = "41 30 07"
)";
    Car car(simulated(file));
    velmora::VehicleReport const report = car.report();
    ASSERT_EQ(report.modules.size(), 2U);
    EXPECT_TRUE(report.modules[0].values.empty()) << report.modules[0].values.front().value;
    ASSERT_EQ(report.modules[1].values.size(), 2U);
    EXPECT_EQ(report.modules[1].values[0].value, "90");
    EXPECT_EQ(report.modules[1].values[1].value, "7");
}

TEST(CarLife, KeepsToOneModuleAndToTheUnitsOfItsOptions)
{
    CarOptions options = simulated("petrol-can11");
    options.module = 0x7E9;
    options.units = velmora::Units::Imperial;
    Car car(options);
    ASSERT_EQ(car.modules().size(), 1U);
    EXPECT_EQ(car.modules()[0].id, 0x7E9U);
    EXPECT_EQ(car.read({"COOLANT_TEMP"})[0].unit, "°F");
}

TEST_F(CarTest, WatchCallsOnOneThreadOfItsOwnUntilItEnds)
{
    Awaited readings;
    std::atomic<std::thread::id> thread;
    std::atomic<bool> refused{false};
    std::atomic<int> count{0};
    {
        auto const watch = car.watch({"RPM@20hz", "SPEED"}, [&](Reading const& reading) {
            EXPECT_TRUE(reading.sensor == "RPM" || reading.sensor == "SPEED");
            thread = std::this_thread::get_id();
            try {
                car.read({"RPM"});
            } catch (Error const& error) {
                refused = error.kind() == ErrorKind::WrongUse;
            }
            ++count;
            readings.add();
        });
        ASSERT_TRUE(readings.reaches(4));
        EXPECT_EQ(car.read({"COOLANT_TEMP"}).size(), 1U) << "while it goes on";
    }
    int const atEnd = count;
    EXPECT_NE(thread.load(), std::this_thread::get_id());
    EXPECT_TRUE(refused) << "a blocking call from a callback is an error";
    car.read({"RPM", "SPEED"});
    EXPECT_EQ(count, atEnd) << "nothing comes behind the end";
}

TEST_F(CarTest, WatchMayEndItself)
{
    Awaited readings;
    velmora::Watch watch;
    std::atomic<bool> started{false};
    watch = car.watch({"RPM"}, [&](Reading const&) {
        if (started) {
            watch.end();
            readings.add();
        }
    });
    started = true;
    EXPECT_TRUE(readings.reaches(1));
    EXPECT_EQ(car.read({"SPEED"}).size(), 1U);
}

TEST(CarLife, WatchTellsLossAndReturn)
{
    std::function<void()> cut; // replaced by each connection, between which nobody reads it
    CarOptions options = simulated("petrol-can11");
    std::atomic<int> connections{0};
    options.openPort = [&]() -> std::unique_ptr<velmora::IPort> {
        ++connections;
        return std::make_unique<CuttablePort>(cut);
    };
    Car car(options);
    Awaited readings;
    Awaited lost;
    Awaited returned;
    Awaited after;
    std::atomic<bool> back{false};
    auto const watch = car.watch(
        {"RPM"},
        [&](Reading const&) {
            readings.add();
            if (back) {
                after.add();
            }
        },
        [&](velmora::LinkState state) {
            back = state == velmora::LinkState::Returned;
            (back ? returned : lost).add();
        });
    ASSERT_TRUE(readings.reaches(2));
    cut();
    EXPECT_TRUE(lost.reaches(1));
    EXPECT_TRUE(returned.reaches(1));
    EXPECT_TRUE(after.reaches(2));
    EXPECT_EQ(connections, 2);
}

TEST(CarLife, TellsALossAndReconnects)
{
    std::function<void()> cut;
    CarOptions options = simulated("petrol-can11");
    options.openPort = [&]() -> std::unique_ptr<velmora::IPort> { return std::make_unique<CuttablePort>(cut); };
    Car car(options);
    cut();
    try {
        car.read({"RPM"});
        ADD_FAILURE() << "read over a dead link";
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::LinkLost);
    }
    car.reconnect();
    EXPECT_EQ(car.read({"RPM"}).size(), 1U);
}

TEST(CarFiles, GetTheLogAndTheTraffic)
{
    testsupport::TemporaryFolder const folder;
    velmora::CarOptions options;
    options.port = "sim:petrol-can11?instant";
    options.settingsFile = folder.file("settings.toml");
    options.logFile = folder.file("log");
    options.traceFile = folder.file("trace");
    {
        Car car(options);
        EXPECT_EQ(car.modules().size(), 2U);
    }
    EXPECT_FALSE(folder.read("log").empty());
    EXPECT_NE(folder.read("trace").find("0100"), std::string::npos);
}

TEST(LinkState, IsPrintedAsAWord)
{
    EXPECT_EQ(printed(velmora::LinkState::Lost), "lost");
    EXPECT_EQ(printed(velmora::LinkState::Returned), "returned");
}

} // namespace
