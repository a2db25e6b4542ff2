#include "libvelmora/dash/dashlimits.h"
#include "libvelmora/dash/dashplace.h"
#include "libvelmora/dash/dashstate.h"
#include "libvelmora/session/settingsstore.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <arpa/inet.h>

namespace {

using testing::ElementsAre;
using velmora::DashLine;
using velmora::DashState;
using velmora::DashVehicle;
using velmora::Json;
using velmora::Reading;
using velmora::Record;

velmora::WallTime dashTime(std::int64_t millis)
{
    return velmora::WallTime(std::chrono::milliseconds(millis));
}

Reading stateReading(std::string const& sensor, Reading::Value value, std::int64_t millis, int precision = 0)
{
    Reading reading;
    reading.time = dashTime(millis);
    reading.module = 0x7E8;
    reading.sensor = sensor;
    reading.pid = "010C";
    reading.name = "Engine " + sensor;
    reading.unit = "rpm";
    reading.value = std::move(value);
    reading.precision = precision;
    return reading;
}

Json jsonOf(std::string const& text)
{
    return Json::parse(text, nullptr, false);
}

TEST(DashState, TellsOfEachSensorOnceAndThenItsValues)
{
    DashState state;
    EXPECT_EQ(state.takeValues(), "");
    state.take(stateReading("RPM", 800.26, 1000, 1));
    state.take(stateReading("NONE", std::monostate(), 1001));
    state.take(stateReading("WORD", std::string("open \x01 loop"), 1002));
    state.take(stateReading("ZERO", -0.0, 1003, 2));
    EXPECT_EQ(
        state.takeValues(),
        R"({"v":[["7E8/NONE",1001,null],["7E8/RPM",1000,800.3],["7E8/WORD",1002,"open � loop"],["7E8/ZERO",1003,0.0]],)"
        R"("sensors":[{"id":"7E8/NONE","module":"7E8","sensor":"NONE","pid":"010C","name":"Engine NONE","unit":"rpm",)"
        R"("precision":0},{"id":"7E8/RPM","module":"7E8","sensor":"RPM","pid":"010C","name":"Engine RPM",)"
        R"("unit":"rpm","precision":1},{"id":"7E8/WORD","module":"7E8","sensor":"WORD","pid":"010C",)"
        R"("name":"Engine WORD","unit":"rpm","precision":0},{"id":"7E8/ZERO","module":"7E8","sensor":"ZERO",)"
        R"("pid":"010C","name":"Engine ZERO","unit":"rpm","precision":2}]})");
    EXPECT_EQ(state.takeValues(), "") << "nothing has changed since";
    state.take(stateReading("RPM", 900.0, 2000, 1));
    EXPECT_EQ(state.takeValues(), R"({"v":[["7E8/RPM",2000,900.0]]})");
    state.take(stateReading("RPM", 900.0, 2001, 0));
    EXPECT_FALSE(jsonOf(state.takeValues()).contains("sensors")) << "fewer digits are no news";
    state.take(stateReading("RPM", 900.125, 2002, 3));
    EXPECT_EQ(jsonOf(state.takeValues())["sensors"][0]["precision"], 3) << "more are";
    state.take(stateReading("RPM", 1.0 / 3, 2003, 12));
    EXPECT_EQ(jsonOf(state.takeValues())["v"][0][2], 0.333333333);
    state.take(stateReading("RPM", 7.6, 2004, -2));
    EXPECT_EQ(jsonOf(state.takeValues())["v"][0][2], 8);
    EXPECT_EQ(jsonOf(state.allValues())["v"].size(), 4U);
    EXPECT_EQ(jsonOf(state.allValues())["sensors"].size(), 4U);
}

TEST(DashState, KeepsAThousandSensors)
{
    DashState state;
    for (int i = 0; i <= 1000; ++i) {
        state.take(stateReading("S" + std::to_string(i), 1.0, 1000));
    }
    EXPECT_EQ(jsonOf(state.takeValues())["v"].size(), 1000U);
    state.take(stateReading("S1000", 2.0, 2000));
    EXPECT_EQ(state.takeValues(), "");
    state.take(stateReading("S999", 2.0, 2000));
    EXPECT_EQ(jsonOf(state.takeValues())["v"].size(), 1U) << "those that are there go on";
}

TEST(DashState, KeepsPointsOfAQuarterOfAnHour)
{
    DashState state;
    for (std::int64_t const time : {0, 99, 100, 199, 150, 200, 900000, 900099}) {
        state.take(stateReading("RPM", static_cast<double>(time), time));
    }
    state.take(stateReading("RPM", std::string("odd"), 900050));
    EXPECT_EQ(state.history("7E8/RPM", 100)["t"], Json({0, 100, 200, 900000})) << "a tenth of a second apart";
    state.take(stateReading("RPM", 1.0, 900100));
    EXPECT_EQ(state.history("7E8/RPM", 100)["t"], Json({100, 200, 900000, 900100}));
    EXPECT_EQ(state.history("7E8/RPM", 100)["id"], "7E8/RPM");
    for (int i = 0; i < 4002; ++i) {
        state.take(stateReading("MANY", static_cast<double>(i % 2), 100 * i));
    }
    Json const all = state.history("7E8/MANY", 1000000);
    EXPECT_EQ(all["t"].size(), 4000U);
    EXPECT_EQ(all["t"][0], 200);
    EXPECT_EQ(all["v"][1], 1);
}

TEST(DashState, ThinsRunsToTheirEndsAndPeaks)
{
    DashState state;
    double const values[] = {5, 9, 1, 5, 5, 5, 2, 3, 4, 5, 6, 7};
    for (int i = 0; i < 12; ++i) {
        state.take(stateReading("RPM", values[i], 100 * i));
    }
    Json const six = state.history("7E8/RPM", 8);
    EXPECT_EQ(six["t"], Json({0, 100, 200, 500, 600, 1100})) << "two runs of six";
    EXPECT_EQ(six["v"], Json({5, 9, 1, 5, 2, 7}));
    EXPECT_EQ(state.history("7E8/RPM", 0)["t"], Json({0, 100, 200, 1100})) << "one run of twelve";
    EXPECT_EQ(state.history("7E8/RPM", 48)["t"].size(), 12U);
    double const ties[] = {5, 1, 3, 1, 9, 3, 9, 5};
    for (int i = 0; i < 8; ++i) {
        state.take(stateReading("TIES", ties[i], 100 * i));
    }
    EXPECT_EQ(state.history("7E8/TIES", 4)["t"], Json({0, 100, 600, 700})) << "the first lowest, the last highest";
    EXPECT_EQ(state.history("none", 8), Json({{"id", "none"}, {"t", Json::array()}, {"v", Json::array()}}));
}

TEST(DashState, KeepsThreeHundredLinesOfTraffic)
{
    DashState state;
    EXPECT_EQ(state.takeLines(), "");
    EXPECT_EQ(state.allLines(), "[]");
    state.take(DashLine{dashTime(5), true, "ATI\r"});
    state.take(DashLine{dashTime(6), false, "ELM327"});
    EXPECT_EQ(state.takeLines(), R"([[5,">","ATI�",1],[6,"<","ELM327",2]])");
    EXPECT_EQ(state.takeLines(), "");
    for (int i = 0; i < 299; ++i) {
        state.take(DashLine{dashTime(i), true, "x"});
    }
    EXPECT_EQ(jsonOf(state.allLines()).size(), 300U);
    EXPECT_EQ(jsonOf(state.allLines())[0][2], "ELM327");
    EXPECT_EQ(jsonOf(state.takeLines()).size(), 299U);
    for (int i = 0; i < 302; ++i) {
        state.take(DashLine{dashTime(i), true, "y"});
    }
    EXPECT_EQ(jsonOf(state.takeLines()).size(), 300U);
    EXPECT_EQ(jsonOf(state.allLines())[0][0], 2);
}

TEST(DashState, ForgetsWithTheVehicle)
{
    DashState state;
    EXPECT_EQ(state.vehicle(), Json({{"key", nullptr}, {"offered", Json::array()}}));
    state.take(DashVehicle{"van", {{0x7E8, "RPM", "010C", "Engine RPM", "rpm"}}});
    EXPECT_EQ(state.vehicleKey(), "van");
    EXPECT_EQ(state.vehicle().dump(),
              R"({"key":"van","offered":[{"id":"7E8/RPM","module":"7E8","sensor":"RPM","pid":"010C",)"
              R"("name":"Engine RPM","unit":"rpm"}]})");
    state.take(stateReading("RPM", 1.0, 1000));
    state.take(velmora::DashAnswer{"info", true, 5});
    state.take(DashVehicle{"van", {}});
    EXPECT_EQ(state.answers()["info"]["data"], 5) << "the same vehicle came back";
    EXPECT_EQ(jsonOf(state.allValues())["v"].size(), 1U);
    state.take(DashVehicle{"car", {}});
    EXPECT_EQ(state.takeValues(), "");
    EXPECT_EQ(state.allValues(), R"({"v":[]})");
    state.take(stateReading("SPEED", 2.0, 1001));
    EXPECT_EQ(jsonOf(state.takeValues())["sensors"].size(), 1U) << "what was new of the other is none of this one's";
    EXPECT_EQ(state.answers(), Json::object());
    for (char const* const topic : {"console", "clear", "performance", "codes"}) {
        state.take(velmora::DashAnswer{topic, false, "why"});
    }
    EXPECT_EQ(state.answers().size(), 1U) << "an answer to one browser's command is not told to the next";
    EXPECT_EQ(state.answers()["codes"]["topic"], "codes");
    EXPECT_EQ(state.answers()["codes"]["done"], false);
    EXPECT_GT(state.answers()["codes"]["time"], 1600000000000);
}

TEST(DashState, TellsCodesAndEvents)
{
    DashState state;
    EXPECT_FALSE(state.takeNews());
    EXPECT_EQ(state.news().dump(), R"({"codes":[],"events":[]})");
    velmora::CodeChange code{{}, "van", 0x7E8, "P0133", "confirmed", "slow\x01", true};
    state.take(Record(code));
    EXPECT_TRUE(state.takeNews());
    EXPECT_FALSE(state.takeNews()) << "once";
    EXPECT_EQ(state.news()["codes"].dump(), R"([{"module":"7E8","code":"P0133","kind":"confirmed","text":"slow�"}])");
    code.present = false;
    state.take(Record(code));
    EXPECT_TRUE(state.takeNews());
    EXPECT_TRUE(state.news()["codes"].empty());
    state.take(Record(velmora::LampState{}));
    state.take(Record(stateReading("RPM", 1.0, 1)));
    EXPECT_FALSE(state.takeNews());
    for (int i = 0; i < 51; ++i) {
        state.take(Record(velmora::Event{dashTime(i), "van", "parked", {}, "it\tstands"}));
    }
    EXPECT_TRUE(state.takeNews());
    EXPECT_EQ(state.news()["events"].size(), 50U);
    EXPECT_EQ(state.news()["events"][0].dump(), R"({"time":1,"kind":"parked","text":"it�stands"})");
}

TEST(DashState, BeatsWithTheHealthOfTheLink)
{
    velmora::Health health;
    health.linkUp = true;
    health.state = "driving";
    health.linkLosses = 3;
    EXPECT_EQ(velmora::beatJson(health, dashTime(7)).dump(),
              R"({"now":7,"link":true,"state":"driving","trouble":null,"losses":3})");
    EXPECT_EQ(velmora::dashId(0x10, "RPM"), "10/RPM");
}

TEST(DashPlace, ReadsItsOptions)
{
    auto const address = velmora::OutputAddress{"dash", "127.0.0.1:0", {{"a", "yes"}, {"b", "no"}, {"c", "maybe"}}};
    EXPECT_TRUE(velmora::isAllowed(address, "a"));
    EXPECT_FALSE(velmora::isAllowed(address, "b"));
    EXPECT_FALSE(velmora::isAllowed(address, "d"));
    try {
        velmora::isAllowed(address, "c");
        ADD_FAILURE();
    } catch (velmora::Error const& error) {
        EXPECT_STREQ(error.what(), "c: \"maybe\" is neither yes nor no");
    }
    EXPECT_THAT(velmora::hostNamesOf("Van.local,other"), ElementsAre("other", "van.local"));
    EXPECT_TRUE(velmora::hostNamesOf("").empty());
    for (char const* const odd : {"a:80", "a,,b", ",a", "a b"}) {
        EXPECT_THROW(velmora::hostNamesOf(odd), velmora::Error) << odd;
    }
    in_addr parsed{};
    EXPECT_EQ(::inet_pton(AF_INET, velmora::ownAddress().c_str(), &parsed), 1);
    EXPECT_EQ(velmora::dumpedJson(Json({{"a", "\xFF"}})), "{\"a\":\"\xEF\xBF\xBD\"}");
}

TEST(DashDesk, HandsEachThingToWhoListensForIt)
{
    velmora::DashDesk desk;
    std::vector<std::string> heard;
    velmora::DashDesk::Listener listener;
    listener.reading = [&heard](Reading const& each) { heard.push_back("reading " + each.sensor); };
    listener.line = [&heard](DashLine const& each) { heard.push_back("line " + each.text); };
    listener.answer = [&heard](velmora::DashAnswer const& each) { heard.push_back("answer " + each.topic); };
    auto const listening = desk.listen(listener);
    desk.tell(stateReading("RPM", 1.0, 1));
    desk.tell(DashLine{{}, true, "ATI"});
    desk.tell(velmora::DashAnswer{"info", true, {}});
    desk.tell(DashVehicle{"van", {}});
    EXPECT_THAT(heard, ElementsAre("reading RPM", "line ATI", "answer info"));
}

} // namespace
