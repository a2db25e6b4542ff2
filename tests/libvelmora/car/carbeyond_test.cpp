// A car beyond its standard sensors: offers, probes, live values with signals, silent files, an adapter that is cut
// off.
#include "libvelmora/car/carprobe.h"
#include "libvelmora/car/livestate.h"
#include "libvelmora/port/opening/openport.h"
#include "libvelmora/session/libraryuse.h"
#include "libvelmora/session/session.h"
#include "libvelmora/uds/identifierprobe.h"
#include "libvelmora/uds/modulestore.h"
#include "tests/support/temporaryfolder.h"

#include <obd/messagedatamodel.h>
#include <velmora/car.h>
#include <velmora/console.h>
#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <fstream>
#include <thread>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using velmora::Car;
using velmora::CarOptions;
using velmora::Error;
using velmora::ErrorKind;
using velmora::ProbeRequest;

class CarBeyond : public testing::Test
{
protected:
    CarOptions options(std::string const& vehicle = "petrol-can11") const
    {
        CarOptions options;
        options.port = "sim:" + vehicle + "?instant";
        options.settingsFile = m_folder.file("settings.toml");
        options.units = velmora::Units::Metric;
        return options;
    }
    // A car of raw replies.
    CarOptions raw(std::string const& modules) const
    {
        std::ofstream(m_folder.file("car.toml")) << "name = \"a car of raw replies\"\nprotocol = 6\n" << modules;
        return options(m_folder.file("car.toml"));
    }

    velmora::LibraryUse const m_library{""}; // keeps the catalogue from car to car
    testsupport::TemporaryFolder m_folder;
};

std::string probeComplaint(ProbeRequest const& request)
{
    try {
        velmora::probeTask(request);
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
        return error.what();
    }
    return "";
}

TEST_F(CarBeyond, AProbeIsTakenAtItsWordOrRefused)
{
    velmora::ProbeTask const usual = velmora::probeTask({});
    EXPECT_EQ(usual.header + " " + usual.reply, "7E0 7E8");
    EXPECT_EQ(usual.extended, std::nullopt);
    EXPECT_EQ(usual.service, 0x22);
    EXPECT_EQ(usual.from, 0xF100U);
    EXPECT_EQ(usual.to, 0xF1FFU);
    velmora::ProbeTask const own =
        velmora::probeTask({.module = "18da10f1", .extended = "07", .service = "1A", .from = "80", .to = "9F"});
    EXPECT_EQ(own.header + " " + own.reply, "18DA10F1 18DAF110");
    EXPECT_EQ(own.extended, 0x07);
    EXPECT_EQ(own.service, 0x1A);
    EXPECT_EQ(own.from, 0x80U);
    EXPECT_EQ(own.to, 0x9FU);
    EXPECT_EQ(velmora::probeTask({.module = "743", .reply = "763"}).reply, "763");
    EXPECT_EQ(velmora::probedModule({.module = "7e1"}), "7E1");
    EXPECT_EQ(probeComplaint({.module = "x"}), "\"x\" is no identifier of a module");
    EXPECT_EQ(probeComplaint({.module = "743"}),
              "The identifier of this module's replies has to be told, with --reply");
    EXPECT_EQ(probeComplaint({.extended = "100"}), "\"100\" is no hexadecimal number for --ext");
    EXPECT_EQ(probeComplaint({.extended = "FF"}), "");
    EXPECT_EQ(probeComplaint({.service = "100"}), "\"100\" is no hexadecimal number for --service");
    EXPECT_EQ(probeComplaint({.from = "10000"}), "\"10000\" is no hexadecimal number for --from");
    EXPECT_EQ(probeComplaint({.to = "g"}), "\"g\" is no hexadecimal number for --to");
    EXPECT_EQ(probeComplaint({.to = "FFFF"}), "");
}

TEST_F(CarBeyond, AProbeAsksFromItsFirstIdentifierAndGoesOnWhereItWasLeft)
{
    ProbeRequest request{.module = "7E1", .from = "1E31", .to = "1E32"};
    velmora::ProbeTask const task = velmora::probeTask(request);
    velmora::ProbeStore const store(velmora::ProbeStore::besides(m_folder.file("settings.toml"), task));
    std::vector<std::string> resumed;
    auto const noteResumed = [&resumed](std::string const& at) { resumed.push_back(at); };
    std::vector<std::string> phases;
    CarOptions chosen = options("petrol-can11-modules");
    chosen.onPhase = [&phases](std::string const& phase) { phases.push_back(phase); };
    Car car(chosen);
    phases.clear();
    velmora::ProbeReport const report = car.probe(request, noteResumed);
    EXPECT_EQ(report.told(), 0U);
    EXPECT_EQ(report.toText({}), "There, but locked:\n  1E31  Security Access Denied\n"
                                 "There, but not under these conditions:\n  1E32  Conditions Not Correct\n");
    EXPECT_THAT(resumed, IsEmpty());
    ASSERT_FALSE(phases.empty());
    EXPECT_EQ(phases.back(), "") << "the line is taken away";
    EXPECT_TRUE(phases.front().starts_with("Asked up to 1E3")) << phases.front();
    EXPECT_FALSE(store.load()) << "what is finished is not gone on with";

    velmora::ProbeState left;
    left.task = task;
    left.vin = "VELMRAS1M60000022";
    left.next = 0x1E32;
    store.save(left);
    EXPECT_EQ(car.probe(request, noteResumed).toText({}),
              "There, but not under these conditions:\n  1E32  Conditions Not Correct\n");
    EXPECT_THAT(resumed, ElementsAre("1E32"));
    for (std::string const vin : {"", "VELMRAS1M60000099"}) {
        left.vin = vin;
        store.save(left);
        try {
            car.probe(request, noteResumed);
            ADD_FAILURE() << "another vehicle's";
        } catch (Error const& error) {
            EXPECT_EQ(std::string(error.what()), "An interrupted probe of this module is of another vehicle (" +
                                                     (vin.empty() ? "no VIN" : vin) +
                                                     ", this one is VELMRAS1M60000022)");
        }
    }
    request.fresh = true;
    EXPECT_THAT(car.probe(request, noteResumed).toText({}), HasSubstr("1E31"));
    EXPECT_EQ(resumed.size(), 1U);
    left.vin = "VELMRAS1M60000022";
    left.task.to = 0x1E33;
    store.save(left);
    request.fresh = false;
    EXPECT_THAT(car.probe(request, noteResumed).toText({}), HasSubstr("1E31")) << "another range begins anew";
}

TEST_F(CarBeyond, OffersNameWhatTheLibraryDoesNotDecode)
{
    Car car(raw(R"([[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 00 10 00 01"
"0120" = "41 20 00 00 00 01"
"0140" = "41 40 00 00 00 01"
"0160" = "41 60 00 00 00 01"
"0180" = "41 80 00 00 00 09"
"01A0" = "41 A0 04 00 00 01"
"01C0" = "41 C0 40 00 00 00"
"0600" = "46 00 80 00 00 00"
"0900" = "49 00 40 00 00 00"
)"));
    auto const offers = car.offers();
    ASSERT_EQ(offers.size(), 1U);
    std::vector<std::string> services;
    for (auto const& each : offers[0].services) {
        services.push_back(std::to_string(each.number) + ":" + std::to_string(each.identifiers.size()) +
                           (each.answer == velmora::TopicAnswer::Read ? " read" : " not"));
    }
    EXPECT_THAT(services, ElementsAre("1:7 read", "6:1 read", "8:0 not", "9:1 read"));
    ASSERT_FALSE(offers[0].further.empty());
    std::vector<unsigned int> further;
    for (auto const& each : offers[0].further) {
        further.push_back(each.pid);
    }
    EXPECT_THAT(further, testing::Contains(0xC2U));
    EXPECT_THAT(further, testing::Not(testing::Contains(0xC0U))) << "only tells of the next range";
    EXPECT_THAT(further, testing::Not(testing::Contains(0x0CU)));
    EXPECT_EQ(offers[0].further.back().name, "PID C2");
    EXPECT_TRUE(offers[0].further.back().values.empty());
    EXPECT_EQ(offers[0].further.front().pid, 0x9DU);
    ASSERT_EQ(offers[0].further.front().values.size(), 2U);
    EXPECT_EQ(offers[0].further.front().values[0].sensor, "ENGINE_FUEL_RATE_MASS");
    EXPECT_EQ(offers[0].further.front().values[0].unit, "g/s");
    EXPECT_NE(offers[0].further.front().values[0].standing, "");
}

TEST_F(CarBeyond, ReadingsAreOfTheModuleThatWasAsked)
{
    Car car(raw(R"([[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 08 18 00 00"
"0105" = "41 05 5A"
"010C" = "41 0C 0F A0"
[[module]]
id = "7E9"
[module.raw]
"0100" = "41 00 08 10 00 00"
"0105" = "41 05 64"
)"));
    auto const readings = car.read({"7E9:COOLANT_TEMP", "7E8:COOLANT_TEMP", "7E9:RPM", "RPM"});
    ASSERT_EQ(readings.size(), 4U);
    EXPECT_EQ(velmora::number(readings[0]), 60.0);
    EXPECT_EQ(velmora::number(readings[1]), 50.0);
    EXPECT_EQ(readings[2].module, 0x7E9U);
    EXPECT_EQ(velmora::number(readings[2]), std::nullopt) << "claimed, and never told";
    EXPECT_EQ(readings[2].sensor, "RPM");
    EXPECT_EQ(readings[2].name, "RPM");
    EXPECT_EQ(velmora::number(readings[3]), 1000.0);
    std::vector<std::string> keys;
    for (velmora::Sensor const& each : car.sensors()) {
        keys.push_back(each.key + " " + each.pid);
    }
    EXPECT_THAT(keys, testing::IsSupersetOf({"COOLANT_TEMP 0105", "RPM 010C", "SPEED 010D"}));
    try {
        car.read({"7EA:RPM"});
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "The vehicle has no control module 7EA");
    }
}

TEST_F(CarBeyond, CodesThatNobodyToldAreAnErrorThatSaysWhy)
{
    auto const trouble = [this](std::string const& reply) {
        Car car(raw("[[module]]\nid = \"7E8\"\n[module.raw]\n\"0100\" = \"41 00 80 00 00 00\"\n" + reply));
        try {
            EXPECT_TRUE(car.codes().empty());
        } catch (Error const& error) {
            EXPECT_EQ(error.kind(), reply.empty() ? ErrorKind::NotSupported : ErrorKind::Refused);
            return std::string(error.what());
        }
        return std::string();
    };
    EXPECT_EQ(trouble(""), "No control module reported its trouble codes");
    EXPECT_EQ(trouble("\"03\" = \"7F 03 22\"\n"), "The vehicle refused to report its trouble codes");
    EXPECT_EQ(trouble("\"03\" = \"43 00\"\n"), "");
}

TEST_F(CarBeyond, EachSensorIsReadOnceAndSignalsBehindThem)
{
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"GEARBOX_TEMP\"\nname = \"Gearbox oil\"\n"
                                                "header = \"7E1\"\nrequest = \"221E1C\"\n"
                                                "formula = \"(A*256+B)/16\"\nunit = \"°C\"\n";
    CarOptions chosen = options("petrol-can11-modules");
    chosen.signalFiles = {m_folder.file("own.toml")};
    Car car(chosen);
    auto const keys = [&car](std::vector<std::string> const& words) {
        std::vector<std::string> result;
        for (velmora::Reading const& each : car.read(words)) {
            result.push_back(each.sensor);
            EXPECT_LT(std::chrono::abs(std::chrono::system_clock::now() - each.time), std::chrono::minutes(1));
        }
        return result;
    };
    EXPECT_THAT(keys({"RPM", "0C", "7E8:RPM", "SPEED"}), ElementsAre("RPM", "SPEED"));
    EXPECT_THAT(keys({"GEARBOX_TEMP", "RPM"}), ElementsAre("RPM", "GEARBOX_TEMP"));
    EXPECT_THAT(keys({"gearbox oil"}), ElementsAre("GEARBOX_TEMP"));
    EXPECT_EQ(keys({}).size(), 5U) << "the usual ones";
    std::unique_ptr<velmora::LiveReader> const reader =
        car.live({.sensors = {"GEARBOX_TEMP", "COOLANT_TEMP"}, .rate = "5hz"});
    EXPECT_EQ(reader->parameters().at(1).at(0).hertz, 5.0) << "of those that have none of their own";
    EXPECT_EQ(reader->parameters().at(0).at(0).module, 0x7E8U) << "the first one, though another was read last";
    car.codeReports();
    EXPECT_NO_THROW(car.keepAsking({"COOLANT_TEMP"})) << "which the first one has alone";

    EXPECT_EQ(car.probe({.module = "743", .reply = "763", .from = "F187", .to = "F187"}).toText({}),
              "  F187  32383430302D5331303034  28400-S1004\n");
}

TEST_F(CarBeyond, AWatchEndsWithTheObjectThatHoldsItAndSoDoesItsAsking)
{
    std::atomic<int> asked = 0;
    std::atomic<int> first = 0;
    std::atomic<int> second = 0;
    CarOptions chosen = options();
    chosen.onTraffic = [&asked](obd::MessageDataModel const& entry) {
        asked += entry.direction == obd::MessageDataModel::Sent ? 1 : 0;
    };
    Car car(chosen);
    auto const waitFor = [](std::atomic<int> const& count, int number) {
        for (int i = 0; i < 10000 && count < number; ++i) {
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
        return count >= number;
    };
    velmora::Watch silent = car.watch({"SPEED"}, nullptr);
    velmora::Watch watch = car.watch({"RPM"}, [&first](velmora::Reading const&) { ++first; });
    EXPECT_TRUE(waitFor(first, 2));
    watch = car.watch({"RPM"}, [&second](velmora::Reading const&) { ++second; });
    int const before = first;
    EXPECT_TRUE(waitFor(second, 2));
    EXPECT_EQ(first, before) << "the one that it held has ended";
    velmora::Watch& itself = watch;
    watch = std::move(itself);
    int const now = second;
    EXPECT_TRUE(waitFor(second, now + 1)) << "itself it does not end";
    watch.end();
    silent = velmora::Watch();
    int after = -1;
    for (int i = 0; i < 40 && after != asked; ++i) {
        after = asked;
        std::this_thread::sleep_for(std::chrono::milliseconds(250));
    }
    EXPECT_EQ(asked, after) << "nobody wants a reading any more";
    car.keepAsking({});
    EXPECT_TRUE(waitFor(asked, after + 1)) << "the lamp, which keeps the connection up";
}

TEST_F(CarBeyond, ServicesOfTheMakersAreForSomeBusesAndModules)
{
    CarOptions chosen = options("petrol-can11-modules");
    chosen.module = 0x7E8;
    {
        Car car(chosen);
        EXPECT_EQ(car.udsCodes().size(), 1U) << "the one that was named";
    }
    Car legacy(options("petrol-pwm"));
    try {
        legacy.udsCodes();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "Services 19 and 18 are asked on CAN and ISO 14230 only");
        EXPECT_EQ(error.kind(), ErrorKind::NotSupported);
    }
}

TEST_F(CarBeyond, LiveValuesMayBeSignalsOfOnesOwn)
{
    std::ofstream(m_folder.file("own.toml")) << R"([[signal]]
id = "GEARBOX_TEMP"
name = "Gearbox oil"
header = "7E1"
request = "221E1C"
formula = "(A*256+B)/16"
unit = "°C"
)";
    CarOptions chosen = options("petrol-can11-modules");
    chosen.signalFiles = {m_folder.file("own.toml")};
    std::unique_ptr<velmora::LiveReader> reader;
    Car car(chosen);
    try {
        reader = car.live({.sensors = {"GEARBOX_TEMP@20hz", "RPM"}, .rate = "5hz"});
    } catch (Error const& error) {
        FAIL() << error;
    }
    auto const parameters = reader->parameters();
    ASSERT_EQ(parameters.size(), 2U);
    velmora::LiveSensor const& own = parameters[1][0];
    EXPECT_TRUE(own.isSignal);
    EXPECT_EQ(own.key, "GEARBOX_TEMP");
    EXPECT_EQ(own.name, "Gearbox oil");
    EXPECT_EQ(own.request, "221E1C");
    EXPECT_EQ(own.unit + own.metricUnit, "°C°C");
    EXPECT_EQ(own.hertz, 20.0);
    EXPECT_TRUE(own.numeric);
    EXPECT_EQ(own.uid, own.id * 10) << "as values name it";
    EXPECT_EQ(parameters[0][0].hertz, 5.0) << "the rate of those that have none of their own";
    EXPECT_EQ(reader->words(), std::vector<std::string>{"7E8:0C@5"});
    EXPECT_EQ(reader->signalTroubles(), "");
    EXPECT_TRUE(reader->isConnected());
    EXPECT_EQ(reader->units(), velmora::Units::Metric);
    EXPECT_NO_THROW(reader->checkAdapter());
    EXPECT_GT(reader->offers().size(), 5U);
    EXPECT_EQ(reader->run().kilograms, 0) << "no run was begun";
    reader->beginRuns();
    EXPECT_GT(reader->run().kilograms, 0);
    EXPECT_EQ(reader->parameters().size(), 2U) << "speed and engine speed";
    reader->endRuns();
    EXPECT_EQ(reader->run().kilograms, 0);
    EXPECT_EQ(reader->parameters().size(), 2U);
    EXPECT_TRUE(reader->parameters()[1][0].isSignal);
    car.reconnect();
    for (auto const& call : std::vector<std::function<void()>>{
             [&] { reader->units(); }, [&] { reader->isConnected(); }, [&] { reader->setMetric(true); },
             [&] { reader->words(); }, [&] { reader->offers(); }, [&] { reader->beginRuns(); },
             [&] { reader->checkAdapter(); }, [&] { reader->signalTroubles(); }}) {
        EXPECT_THROW(call(), Error) << "its connection is over";
    }
    EXPECT_EQ(reader->run().kilograms, 0);
}

TEST_F(CarBeyond, LiveValuesAreOfOneModuleOrTheOneThatTellsBoth)
{
    CarOptions chosen = raw(R"([[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 08 08 00 00"
"0105" = "41 05 5A"
"010D" = "41 0D 10"
[[module]]
id = "7E9"
[module.raw]
"0100" = "41 00 00 18 00 00"
"010C" = "41 0C 0F A0"
"010D" = "41 0D 10"
)");
    std::ofstream(m_folder.file("own.toml")) << "[[signal]]\nid = \"OWN\"\nname = \"Own\"\nheader = \"7E0\"\n"
                                                "request = \"0105\"\nformula = \"Z\"\n";
    chosen.signalFiles = {m_folder.file("own.toml")};
    Car car(chosen);
    std::unique_ptr<velmora::LiveReader> reader = car.live({.sensors = {"SPEED"}, .allModules = true});
    EXPECT_EQ(reader->parameters().size(), 2U);
    EXPECT_THAT(reader->modulesText(), testing::MatchesRegex("modules 7E8 .* and 7E9 .*"));
    try {
        reader->picked();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "Sensors of several modules are chosen on the command line");
    }
    reader->beginRuns();
    for (auto const& parameter : reader->parameters()) {
        EXPECT_EQ(parameter[0].module, 0x7E9U) << "the other one has no engine speed";
    }
    EXPECT_EQ(reader->parameters().size(), 2U);
    reader = car.live({.sensors = {"OWN"}});
    EXPECT_EQ(reader->parameters().size(), 1U);
    EXPECT_EQ(reader->modulesText(), "modules ");
    EXPECT_TRUE(reader->words().empty());
    try {
        reader->offers();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "Signals are chosen on the command line");
    }
    std::string troubles;
    for (int i = 0; i < 1000 && troubles.empty(); ++i) {
        reader->wait(std::chrono::milliseconds(5));
        reader->take();
        troubles = reader->signalTroubles();
    }
    EXPECT_TRUE(troubles.starts_with("OWN: replies without a value: ") || troubles.starts_with("OWN ")) << troubles;
}

TEST_F(CarBeyond, AFeedThatWasStoppedBringsNothingMore)
{
    velmora::Session session{velmora::SessionOptions(options())};
    session.connect();
    velmora::LiveState state(session, {.sensors = {"RPM"}});
    std::shared_ptr<velmora::LiveFeed> const feed = state.feed();
    EXPECT_TRUE(feed->wait(std::chrono::seconds(20)));
    feed->stop();
    feed->take();
    EXPECT_FALSE(feed->wait(std::chrono::milliseconds(120)));
    EXPECT_EQ(feed->rates().size(), 1U) << "as they were";
    feed->stop();
    state.restart();
    std::shared_ptr<velmora::LiveFeed> const next = state.feed();
    EXPECT_NE(next, feed);
    EXPECT_TRUE(next->wait(std::chrono::seconds(20)));
    state.drop();
    next->take();
    EXPECT_FALSE(next->wait(std::chrono::milliseconds(120))) << "its session may be gone";
    state.drop();
    EXPECT_THROW(state.choice(), Error);
    EXPECT_THROW(state.session(), Error);
    EXPECT_THROW(state.restart(), Error);
}

TEST_F(CarBeyond, ModulesThatAreRememberedAreAskedWithoutASearch)
{
    std::string const vin = "VELMRAS1M60000022";
    velmora::ModuleStore const store(velmora::ModuleStore::besides(m_folder.file("settings.toml")));
    store.keep(vin, {{"743", "763", "", "", "", {}}, {"7D6", "7DE", "", "", "", {}}});
    std::string progress;
    CarOptions chosen = options("petrol-can11-modules");
    chosen.onProgress = [&progress](std::string const& lines) { progress += lines; };
    Car car(chosen);
    progress.clear();
    std::vector<velmora::FoundModule> const found = car.findModules({false, true});
    EXPECT_EQ(progress, "These are remembered of this vehicle; --scan looks anew\n");
    ASSERT_EQ(found.size(), 2U);
    EXPECT_EQ(found[0].part, "28400-S1004");
    EXPECT_EQ(found[0].software, "BCM-0023");
    EXPECT_EQ(found[0].identifiers.at(0xF187), "28400-S1004");
    EXPECT_EQ(found[1].codes, 1U);
    EXPECT_EQ(store.find(vin).value_or(std::vector<velmora::FoundModule>()).at(0).part, "28400-S1004");
    EXPECT_TRUE(car.findModules({})[0].identifiers.empty()) << "nobody asked for them";

    std::vector<velmora::UdsModuleReport> const codes = car.udsCodes();
    ASSERT_EQ(codes.size(), 4U) << "those of the connection, and those that are remembered";
    EXPECT_EQ(codes[0].module, "7E8");
    ASSERT_EQ(codes[0].codes.size(), 1U);
    EXPECT_EQ(codes[0].codes[0].code, "P0133");
    EXPECT_EQ(codes[0].codes[0].status, 0xAF);
    EXPECT_FALSE(codes[0].codes[0].states.empty());
    EXPECT_TRUE(codes[0].available) << "which of the states it tells";
    EXPECT_TRUE(codes[0].format);
    EXPECT_FALSE(codes[0].byService18);
    EXPECT_EQ(codes[3].module, "7DE");
    EXPECT_TRUE(codes[3].byService18);
    ASSERT_EQ(codes[3].codes.size(), 1U);
    EXPECT_EQ(codes[3].codes[0].hex, "4155");
    EXPECT_EQ(codes[3].codes[0].status, 0x60);
    EXPECT_EQ(codes[3].codes[0].type, 0) << "service 18 has none";
    EXPECT_EQ(codes[3].codes[0].code, "");
    EXPECT_EQ(car.identifiers()[0].report.at(0xF190), vin);
}

TEST_F(CarBeyond, ALogThatCouldNotBeWrittenIsTold)
{
    std::vector<std::string> unwritten;
    CarOptions chosen = options();
    chosen.logFile = "/dev/full";
    chosen.onUnwritten = [&unwritten](std::string const& file) { unwritten.push_back(file); };
    {
        Car const car(chosen);
    }
    EXPECT_THAT(unwritten, ElementsAre("/dev/full"));
}

TEST_F(CarBeyond, ANameThatNoModuleHasIsToldWithThoseThereAre)
{
    CarOptions chosen = options();
    chosen.module = 0x7EB;
    try {
        Car const car(chosen);
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "The vehicle has no control module 7EB");
        EXPECT_EQ(error.kind(), ErrorKind::NotSupported);
        EXPECT_THAT(error.hints(), ElementsAre("these answer: 7E8, 7E9"));
    }
}

} // namespace
