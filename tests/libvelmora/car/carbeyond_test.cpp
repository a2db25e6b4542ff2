// A car beyond its standard sensors: offers, probes, modules, silent files.
#include "libvelmora/car/carprobe.h"
#include "libvelmora/uds/identifierprobe.h"
#include "libvelmora/uds/modulestore.h"
#include "tests/libvelmora/car/carbeyond.h"

#include <velmora/car.h>
#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using velmora::Car;
using velmora::CarOptions;
using velmora::Error;
using velmora::ErrorKind;
using velmora::ProbeRequest;
using velmora::test::CarBeyond;

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
