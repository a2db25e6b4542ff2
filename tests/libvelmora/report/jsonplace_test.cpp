// Documents from anywhere: what is taken, and what is refused with the name of its place.
#include "libvelmora/report/document/vehiclereportjson.h"
#include "libvelmora/report/jsonplace.h"
#include "tests/libvelmora/report/carbuilder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <functional>

namespace {

using namespace velmora;
using namespace testsupport;

// The text of the error; empty if there is none.
std::string refusalOf(std::function<void()> const& action)
{
    try {
        action();
    } catch (Error const& error) {
        return error.what();
    }
    return {};
}

TEST(JsonPlace, TellsWhatIsMissingAndWhere)
{
    Json const document = Json::parse(R"({"a": {"list": [1, "x", null], "no": null}, "flag": true})");
    JsonPlace const root(document);
    EXPECT_EQ(refusalOf([&] { root.at("b"); }), "The report has no member \"b\" at /");
    EXPECT_EQ(refusalOf([&] { root.at("a").at("b"); }), "The report has no member \"b\" at /a");
    EXPECT_EQ(refusalOf([&] { root.at("flag").at("b"); }), "The report has no member \"b\" at /flag");
    EXPECT_EQ(refusalOf([&] { root.at("flag").find("b"); }), "The report has no object at /flag");
    EXPECT_EQ(refusalOf([&] { root.at("a").elements(); }), "The report has no list at /a");
    std::vector<JsonPlace> const list = root.at("a").at("list").elements();
    ASSERT_EQ(list.size(), 3U);
    EXPECT_EQ(list[0].number(), 1.0);
    EXPECT_EQ(list[1].text(), "x");
    EXPECT_EQ(list[2].textOrEmpty(), "");
    EXPECT_EQ(refusalOf([&] { list[0].text(); }), "The report has no text at /a/list/0");
    EXPECT_EQ(refusalOf([&] { list[0].textOrEmpty(); }), "The report has no text at /a/list/0");
    EXPECT_EQ(refusalOf([&] { list[1].number(); }), "The report has no number at /a/list/1");
    EXPECT_EQ(refusalOf([&] { list[1].boolean(); }), "The report has no true or false at /a/list/1");
    EXPECT_FALSE(root.at("a").find("no"));
    EXPECT_FALSE(root.at("a").find("none"));
    EXPECT_EQ(root.find("flag")->booleanOrNothing(), true);
    EXPECT_EQ(list[2].booleanOrNothing(), std::nullopt);
}

TEST(JsonPlace, TakesWholeNumbersHexadecimalOnesAndWords)
{
    auto const whole = [](Json const& value) { return refusalOf([&value] { JsonPlace(value).whole(255); }); };
    for (Json const& good : {Json(0), Json(255), Json(0U), Json(255U)}) {
        EXPECT_EQ(whole(good), "");
        EXPECT_EQ(JsonPlace(good).whole(255), good.get<std::uint32_t>());
    }
    for (Json const& wrong : {Json(-1), Json(256), Json(256U), Json(1.5), Json("1"), Json(std::uint64_t{1} << 32)}) {
        EXPECT_EQ(whole(wrong), "The report has no whole number up to 255 at /") << wrong.dump();
    }
    EXPECT_EQ(JsonPlace(Json("7E8")).hex(), 0x7E8U);
    EXPECT_EQ(JsonPlace(Json("FFFFFFFF")).hex(), 0xFFFFFFFFU);
    for (char const* const wrong : {"", "x", "1x", "1FFFFFFFF", "-1", " 1"}) {
        EXPECT_EQ(refusalOf([&] { JsonPlace(Json(wrong)).hex(); }), "The report has no hexadecimal number at /")
            << wrong;
    }
    static constexpr std::array<char const*, 2> words = {"yes", "no"};
    EXPECT_EQ(JsonPlace(Json("no")).wordOf(words), 1U);
    EXPECT_EQ(refusalOf([&] { JsonPlace(Json("maybe")).wordOf(words); }), "The report has no known word at /");
}

// A report with one place changed: what is refused, or what became of it.
std::string changedReport(char const* place, Json const& value, char const* read)
{
    ModuleReport module = soundModule();
    setValue(module, 0x05, {88}, "88", "C");
    module.oxygen = {TopicAnswer::Read, true, false, {{obd::OxygenSensorLocation::Bank1Sensor1, {}}}};
    module.counters = {TopicAnswer::Read, {{"A", 1}}};
    Json document = Json::parse(vehicleOf({module}).toJson());
    document[Json::json_pointer(place)] = value;
    std::string shown;
    std::string const refused =
        refusalOf([&] { shown = Json::parse(parseReport(document).toJson())[Json::json_pointer(read)].dump(); });
    return refused.empty() ? shown : refused;
}

TEST(ReportParser, TakesNumbersUpToTheirEnds)
{
    struct Case
    {
        char const* place;
        Json value;
        char const* read;
    };
    Case const cases[] = {
        {"/adapter/volts", 0.0, "0.0"},
        {"/adapter/volts", 1000.0, "1000.0"},
        {"/adapter/volts", -0.1, "The report has no voltage at /adapter/volts"},
        {"/adapter/volts", 1000.1, "The report has no voltage at /adapter/volts"},
        {"/adapter/volts", nullptr, "null"},
        {"/protocol/number", 255, "255"},
        {"/protocol/number", 256, "The report has no whole number up to 255 at /protocol/number"},
        {"/protocol/number", nullptr, "null"},
        {"/modules/0/values/0/part", 255, "255"},
        {"/modules/0/values/0/part", 256, "The report has no whole number up to 255 at /modules/0/values/0/part"},
        {"/modules/0/counters/counters/0/value", 4294967295U, "4294967295"},
        {"/modules/0/freeze/frame", 256, "The report has no whole number up to 255 at /modules/0/freeze/frame"},
        {"/modules/0/oxygen/sensors/0/sensor", 9,
         "The report has no place of an oxygen sensor at /modules/0/oxygen/sensors/0"},
        {"/modules/0/oxygen/sensors/0/bank", 5,
         "The report has no place of an oxygen sensor at /modules/0/oxygen/sensors/0"},
        {"/modules/0/oxygen/sensors/0/bank", 2, "2"},
    };
    for (Case const& each : cases) {
        EXPECT_EQ(changedReport(each.place, each.value, each.place), each.read) << each.place << " " << each.value;
    }
}

TEST(ReportParser, KeepsWhyALampWasNotTold)
{
    ModuleReport module = soundModule();
    module.codes.lamp.reset();
    for (TopicAnswer const answer : {TopicAnswer::Silent, TopicAnswer::NotOffered, TopicAnswer::Unreadable}) {
        module.codes.lampAnswer = answer;
        VehicleReport const report = vehicleOf({module});
        EXPECT_EQ(parseReport(Json::parse(report.toJson())).toJson(), report.toJson());
        EXPECT_EQ(Json::parse(report.toJson())["modules"][0]["codes"]["lampAnswer"], answerWord(answer));
    }
}

TEST(ReportParser, TakesCodesOfAListThatWasReadAlone)
{
    Json const codes = Json::parse(R"([{"code": "P0420", "system": "Powertrain", "meanings": []}])");
    char const* const list = "/modules/0/codes/confirmed/codes";
    EXPECT_NE(changedReport(list, codes, list).find("P0420"), std::string::npos);
    Json const silent = {{"answer", "no answer"}, {"offered", true}, {"reason", nullptr}, {"codes", codes}};
    EXPECT_EQ(changedReport("/modules/0/codes/confirmed", silent, list), "null");
    EXPECT_EQ(changedReport("/modules/0/codes/pending", nullptr, "/modules/0/codes/confirmed/answer"), "\"read\"");
}

} // namespace
