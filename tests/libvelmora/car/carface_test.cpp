// What the program asks of a car beside its topics: to stop, to be recorded, to tell of its files and of its port.

#include "tests/support/temporaryfolder.h"

#include <obd/messagedatamodel.h>
#include <velmora/car.h>
#include <velmora/console.h>
#include <velmora/doctor.h>
#include <velmora/recorder.h>
#include <velmora/settingsfile.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <sstream>

namespace {

using velmora::Car;
using velmora::CarOptions;
using velmora::CodeKind;
using velmora::CodeList;
using velmora::Error;
using velmora::ErrorKind;

CarOptions instantCar(std::string const& vehicle)
{
    CarOptions options;
    options.port = "sim:" + vehicle + "?instant";
    options.settingsFile = "/proc/nonexistent/settings.toml";
    return options;
}

template <typename Function>
ErrorKind kindThrown(Function const& function)
{
    try {
        function();
    } catch (Error const& error) {
        return error.kind();
    }
    ADD_FAILURE() << "nothing was thrown";
    return ErrorKind::Failed;
}

std::string wholeFile(std::string const& file)
{
    std::ostringstream text;
    text << std::ifstream(file).rdbuf();
    return text.str();
}

TEST(CarFace, AWishToStopEndsWhatItIsAtForGood)
{
    std::stop_source stop;
    CarOptions options = instantCar("petrol-can11");
    options.stop = stop.get_token();
    Car car(options);
    EXPECT_NO_THROW(car.check());
    EXPECT_EQ(car.port(), "sim:petrol-can11?instant");
    EXPECT_EQ(car.trouble(), "");
    stop.request_stop();
    EXPECT_EQ(kindThrown([&] { car.check(); }), ErrorKind::Interrupted);
    EXPECT_EQ(kindThrown([&] { car.codeReports(); }), ErrorKind::Interrupted);
    EXPECT_EQ(kindThrown([&] { car.reconnect(); }), ErrorKind::Interrupted);
}

TEST(CarFace, AWishToStopThatCameBeforeEndsTheConnecting)
{
    std::stop_source stop;
    stop.request_stop();
    CarOptions options = instantCar("petrol-can11");
    options.stop = stop.get_token();
    EXPECT_EQ(kindThrown([&] { Car const car(options); }), ErrorKind::Interrupted);
}

TEST(CarFace, GivesChosenListsTheMeaningsOfANamedMaker)
{
    Car car(instantCar("petrol-can11"));
    auto const pending = car.codeReports({CodeKind::Pending});
    ASSERT_EQ(pending.size(), 2U);
    ASSERT_EQ(pending[0].report.lists.size(), 1U);
    EXPECT_EQ(pending[0].report.lists[0].kind, CodeKind::Pending);
    auto const named = car.codeReports({CodeKind::Confirmed}, "Ford");
    EXPECT_EQ(named[0].report.maker.by, velmora::MakerChoice::By::Option);
    EXPECT_EQ(named[0].report.maker.maker, "Ford");

    auto const routine = car.findRoutine(1);
    EXPECT_EQ(routine.id, 0x7E8U);
    EXPECT_EQ(routine.report.name, "Evaporative system leak test");
    EXPECT_EQ(kindThrown([&] { car.findRoutine(0x7F); }), ErrorKind::NotSupported);
    EXPECT_EQ(car.tryRoutine(1).report.result, velmora::RoutineRun::Result::Accepted);

    auto const cleared = car.tryClearCodes();
    ASSERT_FALSE(cleared.empty());
    EXPECT_NO_THROW(velmora::requireAllCleared(cleared));
    auto refused = cleared;
    refused.back().report = {velmora::ClearReport::Result::Refused, "conditions not correct (22)"};
    EXPECT_NO_THROW(velmora::requireCleared(refused)) << "one has cleared its codes";
    EXPECT_EQ(kindThrown([&] { velmora::requireAllCleared(refused); }), ErrorKind::Refused);
}

TEST(CarFace, TellsWhatEachModuleOffers)
{
    Car car(instantCar("petrol-can11"));
    auto const offers = car.offers();
    ASSERT_EQ(offers.size(), 2U);
    EXPECT_EQ(offers[0].name, "ECM");
    ASSERT_EQ(offers[0].services.size(), 4U);
    EXPECT_EQ(offers[0].services[0].number, 1);
    EXPECT_EQ(offers[0].services[0].answer, velmora::TopicAnswer::Read);
    auto const& ids = offers[0].services[0].identifiers;
    EXPECT_TRUE(std::is_sorted(ids.begin(), ids.end()));
    EXPECT_NE(std::find(ids.begin(), ids.end(), 0x0CU), ids.end());
    EXPECT_EQ(std::find(ids.begin(), ids.end(), 0x20U), ids.end()) << "only tells of the next range";
    auto const& parameters = offers[0].parameters;
    auto const speed =
        std::find_if(parameters.begin(), parameters.end(), [](auto const& each) { return each.pid == 0x0D; });
    ASSERT_NE(speed, parameters.end());
    EXPECT_TRUE(std::all_of(parameters.begin(), parameters.end(), [](auto const& each) { return each.offered; }));
    ASSERT_EQ(speed->values.size(), 1U);
    EXPECT_EQ(speed->values[0].unit, "km/h");
    EXPECT_EQ(speed->values[0].maximum, 255);
    EXPECT_GT(car.offers(true)[0].parameters.size(), parameters.size());
    EXPECT_EQ(speed->values[0].minimum, 0);
    auto const coolant =
        std::find_if(parameters.begin(), parameters.end(), [](auto const& each) { return each.pid == 0x05; });
    ASSERT_NE(coolant, parameters.end());
    EXPECT_EQ(coolant->values.at(0).minimum, -40);
    EXPECT_EQ(coolant->values.at(0).maximum, 215);
    EXPECT_LT(offers[1].parameters.size(), parameters.size()) << "another module's are its own";
}

TEST(CarFace, TellsTheModulesOfAKLineByIso14230)
{
    Car car(instantCar("petrol-kwp-fast"));
    auto const modules = car.findModules({true, true});
    ASSERT_EQ(modules.size(), 2U);
    EXPECT_EQ(modules[0].request, "8011F1");
    EXPECT_EQ(modules[0].codes, 1U);
    auto const codes = car.udsCodes();
    ASSERT_EQ(codes.size(), 2U);
    EXPECT_TRUE(codes[0].byService18);
    ASSERT_EQ(codes[0].codes.size(), 1U);
    EXPECT_EQ(codes[0].codes[0].hex, "0420");
    EXPECT_EQ(codes[0].codes[0].meaning, "") << "nobody says that the number is one of SAE J2012";
    EXPECT_NE(toText(codes, {}).find("0420  status E8"), std::string::npos);
    EXPECT_NE(toJson(codes).find("\"byService18\""), std::string::npos);
    EXPECT_NE(toText(modules, {}).find("8011F1"), std::string::npos);
    auto const told = car.identifiers();
    ASSERT_EQ(told.size(), 2U);
    EXPECT_EQ(told[0].report.at(0x1A90), "VELMRAK1M70000004");
}

TEST(CarFace, IsRecordedWithoutItsVinAndWithoutItsEnd)
{
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("car.dialogue");
    auto const recorder = std::make_shared<velmora::Recorder>(file);
    EXPECT_EQ(kindThrown([&] { velmora::Recorder const second(file); }), ErrorKind::WrongUse);
    std::string vin;
    {
        CarOptions options = instantCar("petrol-can11");
        options.recorder = recorder;
        options.sleep = true;
        Car car(options);
        vin = car.info()[0].report.vin;
        car.askSensors();
    }
    EXPECT_GT(recorder->save(std::string("te\0st\ncar \xC3\xBC", 12)), 20U);
    std::string const text = wholeFile(file);
    EXPECT_NE(text.find("te st car \xC3\xBC"), std::string::npos) << "on one line";
    EXPECT_NE(text.find("ELM327"), std::string::npos) << "the adapter names itself";
    EXPECT_EQ(text.find("ATLP"), std::string::npos) << "closing is no part of it";

    Car replayed([&] {
        CarOptions options = instantCar("petrol-can11");
        options.port = "replay:" + file;
        return options;
    }());
    EXPECT_EQ(replayed.info()[0].report.vin, vin.substr(0, 11) + "000000");
    EXPECT_EQ(replayed.read({"RPM"}).size(), 1U);

    std::string const unsaved = folder.file("none.dialogue");
    {
        velmora::Recorder nothing(unsaved);
        EXPECT_EQ(nothing.save("car"), 0U);
    }
    EXPECT_FALSE(std::filesystem::exists(unsaved));
}

TEST(CarFace, IsRecordedAcrossAReconnection)
{
    testsupport::TemporaryFolder const folder;
    auto const recorder = std::make_shared<velmora::Recorder>(folder.file("car.dialogue"));
    std::string vin;
    {
        CarOptions options = instantCar("petrol-can11");
        options.recorder = recorder;
        Car car(options);
        vin = car.info()[0].report.vin;
        car.reconnect();
        EXPECT_EQ(car.read({"FUEL_LEVEL"}).size(), 1U);
    }
    EXPECT_GT(recorder->save("", true), 20U);
    std::string text = wholeFile(folder.file("car.dialogue"));
    EXPECT_NE(text.find("012F"), std::string::npos) << "what came behind it, too";
    EXPECT_NE(text.find("unknown"), std::string::npos) << "a vehicle without a name";
    std::erase(text, ' ');
    EXPECT_TRUE(vin.ends_with("000001")) << vin;
    EXPECT_NE(text.find("303030303031"), std::string::npos) << "kept, as was wished";
}

TEST(CarFace, TellsItsTrafficUpToTheClosing)
{
    std::mutex mutex;
    std::condition_variable asked;
    int requests = 0;
    std::string last;
    {
        CarOptions options = instantCar("petrol-can11");
        options.sleep = true;
        options.onTraffic = [&](obd::MessageDataModel const& entry) {
            std::lock_guard const lock(mutex);
            last = entry.data;
            requests += entry.direction == obd::MessageDataModel::Sent && entry.data.starts_with("010C") ? 1 : 0;
            asked.notify_one();
        };
        Car car(options);
        EXPECT_EQ(kindThrown([&] { car.keepAsking({"NOSUCHTHING"}); }), ErrorKind::WrongUse);
        car.keepAsking({"RPM"});
        std::unique_lock lock(mutex);
        EXPECT_TRUE(asked.wait_for(lock, std::chrono::seconds(10), [&] { return requests >= 2; }));
    }
    EXPECT_EQ(last.find("ATLP"), std::string::npos) << "closing is not told";
}

TEST(CarFace, TellsOfAFileThatItCouldNotWrite)
{
    std::vector<std::string> unwritten;
    CarOptions options = instantCar("petrol-can11");
    options.traceFile = "/dev/full";
    options.onUnwritten = [&unwritten](std::string const& file) { unwritten.push_back(file); };
    {
        Car const car(options);
    }
    EXPECT_EQ(unwritten, std::vector<std::string>{"/dev/full"});
}

TEST(CarFace, TellsAFileThatItCouldNotWriteOfACarThatDidNotAnswer)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("silent.toml"))
        << "name = \"a car that is silent\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n";
    std::vector<std::string> unwritten;
    CarOptions options = instantCar(folder.file("silent.toml"));
    options.traceFile = "/dev/full";
    options.onUnwritten = [&unwritten](std::string const& file) { unwritten.push_back(file); };
    EXPECT_EQ(kindThrown([&] { Car const car(options); }), ErrorKind::VehicleSilent);
    EXPECT_EQ(unwritten, std::vector<std::string>{"/dev/full"});
}

TEST(CarFace, TakesTheSearchForABusInPlaceOfTheSettings)
{
    testsupport::TemporaryFolder const folder;
    CarOptions options = instantCar("petrol-can11");
    options.protocol = 10;
    EXPECT_EQ(kindThrown([&] { Car const car(options); }), ErrorKind::WrongUse);
    options.protocol = 0;
    Car car(options);
    EXPECT_EQ(car.protocol().number, 6);
}

TEST(DoctorFace, ExaminesAndBundlesWithoutTheVin)
{
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("bundle.txt");
    velmora::Doctor::checkBundle(file);
    velmora::Doctor const doctor(instantCar("petrol-can11"));
    EXPECT_NE(doctor.toText().find("adapter"), std::string::npos);
    EXPECT_EQ(doctor.toJson().front(), '{');
    doctor.saveBundle(file);
    EXPECT_EQ(kindThrown([&] { velmora::Doctor::checkBundle(file); }), ErrorKind::WrongUse);
    EXPECT_NO_THROW(velmora::Doctor::checkBundle(file, true));
    EXPECT_EQ(wholeFile(file), doctor.bundle());
    EXPECT_NE(doctor.bundle(true), doctor.bundle()) << "the VIN";
    EXPECT_EQ(kindThrown([&] { doctor.saveBundle("/dev/full"); }), ErrorKind::Failed);
    EXPECT_EQ(kindThrown([&] { velmora::Doctor::checkBundle(folder.file("no/such/folder")); }), ErrorKind::Failed);
}

TEST(ConsoleFace, GivesWhatTheAdapterSays)
{
    std::stop_source stop;
    CarOptions options = instantCar("petrol-can11");
    options.stop = stop.get_token();
    velmora::AdapterConsole console(options);
    auto const answer = console.ask("ATI");
    EXPECT_TRUE(answer.complete);
    ASSERT_EQ(answer.lines.size(), 1U) << "without its echo";
    EXPECT_EQ(answer.lines[0].substr(0, 6), "ELM327");
    EXPECT_EQ(console.port(), "sim:petrol-can11?instant");
    EXPECT_EQ(kindThrown([&] { Car const second(instantCar("petrol-can11")); }), ErrorKind::WrongUse);
    stop.request_stop();
    EXPECT_EQ(kindThrown([&] { console.ask("ATI"); }), ErrorKind::Interrupted);
    EXPECT_EQ(kindThrown([&] { console.check(); }), ErrorKind::Interrupted);
}

TEST(SettingsFace, SetsAndTellsSettings)
{
    testsupport::TemporaryFolder const folder;
    std::string const path = folder.file("settings.toml");
    {
        velmora::SettingsFile file(path);
        EXPECT_EQ(file.path(), path);
        EXPECT_EQ(file.setting("displacement").value, "2.00");
        file.set("displacement", "1.6");
        EXPECT_EQ(kindThrown([&] { file.set("displacement", "99"); }), ErrorKind::WrongUse);
        EXPECT_EQ(kindThrown([&] { file.setting("nothing"); }), ErrorKind::WrongUse);
    }
    velmora::SettingsFile file(path);
    EXPECT_EQ(file.setting("displacement").value, "1.60");
    EXPECT_EQ(file.setting("displacement").unit, "l");
    EXPECT_GT(file.settings().size(), 4U);
    EXPECT_FALSE(file.text("own/word").has_value());
    file.setText("own/word", "text");
    file.setNumber("own/number", 7);
    EXPECT_EQ(velmora::SettingsFile(path).text("own/word"), "text");
    EXPECT_EQ(velmora::SettingsFile(path).number("own/number"), 7);
    EXPECT_FALSE(file.number("own/word").has_value());
}

} // namespace
