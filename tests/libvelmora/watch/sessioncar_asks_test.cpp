// What the watch asks of a car behind a simulated adapter: while it sleeps, while it is awake, and by whom it is heard.
#include "libvelmora/session/libraryuse.h"
#include "libvelmora/watch/sessioncar.h"
#include "tests/support/temporaryfolder.h"

#include <obd/iecumanager.h>
#include <obd/iobdvelmora.h>
#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <fstream>
#include <thread>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::IsEmpty;
using velmora::Error;
using velmora::ErrorKind;
using velmora::SessionCar;
using velmora::SessionCarOptions;

class AskedCar : public testing::Test
{
protected:
    AskedCar()
    {
        m_options.session.settingsFile = m_folder.file("settings.toml");
        m_options.session.port = "sim:petrol-can11?instant";
        m_options.vehicle = "van";
    }
    // A car of raw replies.
    void make(std::string const& modules)
    {
        std::ofstream(m_folder.file("car.toml")) << "name = \"a car of raw replies\"\nprotocol = 6\n" << modules;
        m_options.session.port = "sim:" + m_folder.file("car.toml") + "?instant";
    }
    template <typename Call>
    static std::optional<ErrorKind> kindOf(Call const& call)
    {
        try {
            call();
        } catch (Error const& error) {
            return error.kind();
        }
        return std::nullopt;
    }

    velmora::LibraryUse const m_library{""}; // keeps the catalogue from car to car
    testsupport::TemporaryFolder m_folder;
    SessionCarOptions m_options;
};

TEST_F(AskedCar, IsAskedForVoltsAndAliveWithAndWithoutASession)
{
    SessionCar car(m_options);
    EXPECT_GT(car.volts().value_or(0.0), 11.0) << "the bare adapter tells it";
    EXPECT_EQ(car.session(), nullptr);
    EXPECT_EQ(car.requests(), 0U) << "no control module was asked";
    EXPECT_TRUE(car.probe());
    EXPECT_NE(car.session(), nullptr) << "the probe brought it up";
    EXPECT_EQ(car.visits(), 1U);
    EXPECT_GT(car.requests(), 0U);
    EXPECT_GT(car.volts().value_or(0.0), 11.0);
    std::uint64_t const before = car.requests();
    EXPECT_TRUE(car.probe());
    EXPECT_EQ(car.requests(), before + 1);
    car.connect();
    EXPECT_EQ(car.visits(), 1U) << "it is up";
    car.check();
    car.disconnect();
    EXPECT_EQ(car.session(), nullptr);
    car.disconnect();
    car.connect();
    EXPECT_EQ(car.visits(), 2U);
}

TEST_F(AskedCar, ASleepingOneAnswersNoProbeAndAMissingPortIsAnError)
{
    make("[[module]]\nid = \"7E8\"\n");
    SessionCar silent(m_options);
    EXPECT_FALSE(silent.probe());
    EXPECT_EQ(silent.session(), nullptr);
    m_options.session.port = "/dev/velmora-none";
    SessionCar missing(m_options);
    EXPECT_EQ(kindOf([&] { missing.probe(); }), ErrorKind::PortFailed);
    EXPECT_EQ(kindOf([&] { missing.volts(); }), ErrorKind::PortFailed);
    EXPECT_EQ(kindOf([&] { missing.startNap(); }), ErrorKind::PortFailed);
    EXPECT_TRUE(missing.napIsOver()) << "none has begun";
}

TEST_F(AskedCar, TellsItsModulesAndTheVinIfThatMayBeKept)
{
    std::string vins;
    for (bool const full : {false, true}) {
        m_options.fullVin = full;
        SessionCar car(m_options);
        car.connect();
        std::vector<velmora::ModuleInfo> const modules = car.modules();
        ASSERT_EQ(modules.size(), 2U);
        EXPECT_EQ(modules[0].id, 0x7E8U);
        EXPECT_EQ(modules[0].name, "ECM");
        EXPECT_EQ(modules[0].vehicle, "van");
        EXPECT_EQ(modules[0].vin, full ? car.vin() : "");
        EXPECT_EQ(modules[1].id, 0x7E9U);
    }
}

TEST_F(AskedCar, LooksAtTheListsThatWereTold)
{
    make(R"([[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 80 00 00 00"
"0101" = "41 01 81 07 21 01"
"03" = "43 01 01 71"
"07" = "7F 07 22"
"0A" = "4A 00"
)");
    SessionCar car(m_options);
    car.connect();
    std::vector<velmora::CodeLook> const looks = car.lookAtCodes();
    ASSERT_EQ(looks.size(), 1U);
    EXPECT_EQ(looks[0].module, 0x7E8U);
    EXPECT_EQ(looks[0].lamp, true);
    EXPECT_EQ(looks[0].notReady, 1);
    ASSERT_TRUE(looks[0].lists.at("confirmed"));
    ASSERT_EQ(looks[0].lists.at("confirmed")->size(), 1U);
    EXPECT_EQ(looks[0].lists.at("confirmed")->at(0).code, "P0171");
    EXPECT_EQ(looks[0].lists.at("confirmed")->at(0).text, "System Too Lean Bank 1");
    EXPECT_FALSE(looks[0].lists.at("pending")) << "a list that was refused is not an empty one";
    ASSERT_TRUE(looks[0].lists.at("permanent"));
    EXPECT_TRUE(looks[0].lists.at("permanent")->empty());
}

TEST_F(AskedCar, LooksAtAllModulesAndGoesOnWithTheFirst)
{
    make("[[module]]\nid = \"7E8\"\n[module.raw]\n\"0100\" = \"41 00 00 10 00 00\"\n"
         "[[module]]\nid = \"7E9\"\n[module.raw]\n\"0100\" = \"41 00 00 10 00 00\"\n\"03\" = \"43 00\"\n");
    m_options.session.sleep = true;
    std::vector<std::string> sent;
    m_options.onTraffic = [&sent](bool out, std::string_view text) {
        if (out) {
            sent.emplace_back(text);
        }
    };
    SessionCar car(m_options);
    car.connect();
    std::vector<velmora::CodeLook> const looks = car.lookAtCodes();
    ASSERT_EQ(looks.size(), 2U);
    EXPECT_EQ(looks[1].module, 0x7E9U);
    EXPECT_FALSE(looks[0].lists.at("confirmed"));
    EXPECT_FALSE(looks[0].lamp);
    EXPECT_FALSE(looks[0].notReady) << "not told";
    EXPECT_TRUE(looks[1].lists.at("confirmed"));
    EXPECT_EQ(car.session()->obd().getEcuManager()->getCurrentEcu()->id(), 0x7E8U);
    EXPECT_FALSE(sent.empty());
    car.disconnect();
    EXPECT_THAT(sent, testing::Not(testing::Contains(testing::HasSubstr("ATLP")))) << "closing is not told";
}

TEST_F(AskedCar, ReadsSignalsOfOnesOwn)
{
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"GEARBOX_TEMP\"\nname = \"Gearbox oil\"\n"
                                                "header = \"7E1\"\nrequest = \"221E1C\"\n"
                                                "formula = \"(A*256+B)/16\"\nunit = \"°C\"\n";
    m_options.session.port = "sim:petrol-can11-modules?instant";
    m_options.session.signalFiles = {m_folder.file("own.toml")};
    for (char const* const wish : {"GEARBOX_TEMP@20hz", "gearbox oil@20hz"}) {
        m_options.sensors = {wish};
        SessionCar car(m_options);
        car.connect();
        std::vector<velmora::SensorEntry> const sensors = car.sensors().sensors;
        ASSERT_EQ(sensors.size(), 3U) << "with what trips need";
        EXPECT_EQ(sensors[2].sensor + sensors[2].pid + sensors[2].name + sensors[2].unit,
                  "GEARBOX_TEMP221E1CGearbox oil°C");
        EXPECT_EQ(sensors[2].hertz, 20.0);
        car.startAsking();
        bool come = false;
        for (int i = 0; i < 2000 && !come; ++i) {
            car.wait(5ms);
            for (velmora::Reading const& each : car.readings()) {
                come = come || each.sensor == "GEARBOX_TEMP";
            }
        }
        EXPECT_TRUE(come) << wish;
    }
}

TEST_F(AskedCar, IsHeardReadingByReadingAndByteByByte)
{
    std::atomic<int> heard = 0;
    std::atomic<int> sent = 0;
    std::atomic<int> received = 0;
    m_options.sensors = {"RPM", "SPEED@5hz"};
    m_options.onReading = [&heard](velmora::Reading const&) { ++heard; };
    m_options.onTraffic = [&](bool out, std::string_view text) {
        EXPECT_FALSE(text.empty());
        ++(out ? sent : received);
    };
    SessionCar car(m_options);
    car.connect();
    std::vector<std::string> keys;
    for (velmora::SensorEntry const& each : car.sensors().sensors) {
        keys.push_back(each.sensor + " " + each.pid + " " + each.unit + (each.hertz == 5.0 ? " 5" : ""));
    }
    EXPECT_THAT(keys, ElementsAre("RPM 010C rpm", "SPEED 010D km/h 5")) << "what a trip needs is there already";
    EXPECT_TRUE(car.readings().empty());
    car.startAsking();
    std::vector<velmora::Reading> all;
    for (int i = 0; i < 2000 && all.size() < 4; ++i) {
        car.wait(5ms);
        for (velmora::Reading const& each : car.readings()) {
            EXPECT_EQ(each.vehicle, "van");
            all.push_back(each);
        }
    }
    car.stopAsking();
    EXPECT_GE(all.size(), 4U);
    EXPECT_GE(heard, static_cast<int>(all.size()));
    EXPECT_GT(sent, 4);
    EXPECT_GT(received, 4);
    car.readings();
    car.wait(5ms);
    EXPECT_TRUE(car.readings().empty()) << "nobody asks any more";
    car.disconnect();
    EXPECT_TRUE(car.readings().empty());
}

TEST_F(AskedCar, WithoutWishesReadsWhatTripsNeed)
{
    SessionCar car(m_options);
    car.connect();
    std::vector<std::string> keys;
    for (velmora::SensorEntry const& each : car.sensors().sensors) {
        keys.push_back(each.sensor);
    }
    EXPECT_THAT(keys, ElementsAre("RPM", "SPEED", "COOLANT_TEMP", "ENGINE_LOAD", "THROTTLE_POS", "FUEL_LEVEL",
                                  "MODULE_VOLTAGE", "CLEAR_DISTANCE"));
    car.readAlso({"RPM", "7E9:RPM", "NOSUCHTHING", "7EA:RPM"});
    ASSERT_EQ(car.sensors().sensors.size(), 9U) << "once each, as far as they are offered";
    EXPECT_EQ(car.sensors().sensors[8].module, 0x7E9U);
    car.readOnly({"NOSUCHTHING"});
    EXPECT_EQ(car.sensors().sensors.size(), 9U) << "none of those: the others, then";
    m_options.sensors = {"COOLANT_TEMP", "NOSUCHTHING"};
    SessionCar wrong(m_options);
    car.disconnect();
    EXPECT_EQ(kindOf([&] { wrong.connect(); }), ErrorKind::WrongUse) << "a wish of the settings has to be known";
}

TEST_F(AskedCar, WithoutSpeedItReadsWhatThereIs)
{
    make("[[module]]\nid = \"7E8\"\n[module.raw]\n\"0100\" = \"41 00 08 10 00 00\"\n");
    for (std::vector<std::string> const& wishes : {std::vector<std::string>(), {"COOLANT_TEMP"}}) {
        m_options.sensors = wishes;
        SessionCar car(m_options);
        car.connect();
        std::vector<std::string> keys;
        for (velmora::SensorEntry const& each : car.sensors().sensors) {
            keys.push_back(each.sensor);
        }
        EXPECT_THAT(keys, testing::UnorderedElementsAre("RPM", "COOLANT_TEMP"));
    }
}

TEST_F(AskedCar, NumbersTheSensorsOfAParameterThatHasSeveral)
{
    m_options.sensors = {"14", "RPM"};
    SessionCar car(m_options);
    car.connect();
    std::vector<std::string> keys;
    for (velmora::SensorEntry const& each : car.sensors().sensors) {
        if (each.pid == "0114") {
            keys.push_back(each.sensor + " " + each.unit);
            EXPECT_THAT(each.name, testing::HasSubstr(": "));
        }
    }
    EXPECT_THAT(keys, ElementsAre("O2_B1S1_1 V", "O2_B1S1_2 %"));
}

TEST_F(AskedCar, ANapIsTakenByAnAdapterThatKnowsIt)
{
    m_options.session.port += "&adapter=obdlink";
    SessionCar car(m_options);
    car.connect();
    EXPECT_TRUE(car.startNap());
    EXPECT_EQ(car.session(), nullptr);
    EXPECT_FALSE(car.napIsOver());
    car.connect();
    EXPECT_NE(car.session(), nullptr) << "the nap is over by force";
    EXPECT_TRUE(car.napIsOver());
}

TEST_F(AskedCar, ANapIsNoneWithAnAdapterThatKnowsNoSleep)
{
    m_options.session.port += "&adapter=elm327-v1.2";
    SessionCar car(m_options);
    EXPECT_TRUE(car.napIsOver());
    EXPECT_FALSE(car.startNap());
    EXPECT_TRUE(car.napIsOver());
}

TEST_F(AskedCar, AnInterruptionEndsWaitingAndConnecting)
{
    SessionCar car(m_options);
    car.connect();
    car.startAsking();
    auto const begin = std::chrono::steady_clock::now();
    std::thread breaker([&car] {
        std::this_thread::sleep_for(2ms);
        car.interrupt();
    });
    car.wait(1h);
    breaker.join();
    car.wait(1h);
    EXPECT_EQ(kindOf([&] { car.check(); }), ErrorKind::Interrupted);
    car.disconnect();
    car.wait(1h);
    EXPECT_EQ(kindOf([&] { car.connect(); }), ErrorKind::Interrupted);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 1min);
    SessionCar other(m_options);
    other.interrupt();
    other.wait(1h);
    EXPECT_EQ(kindOf([&] { other.connect(); }), ErrorKind::Interrupted);
    SessionCar parked(m_options);
    std::thread waker([&parked] {
        std::this_thread::sleep_for(20ms);
        parked.interrupt();
    });
    parked.wait(1h);
    waker.join();
}

} // namespace
