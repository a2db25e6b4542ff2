#include "common/text/text.h"
#include "program/view/live/livecsv.h"
#include "program/view/live/livehelp.h"
#include "program/view/live/livelines.h"
#include "program/view/live/livescreen.h"
#include "program/view/live/sensorpicker.h"
#include "program/view/live/trendline.h"
#include "program/view/unitpairs.h"
#include "tests/program/view/liveparameter.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::milliseconds;
using std::chrono::seconds;
using support::liveParameter;
using support::liveValue;
using testing::ElementsAre;
using testing::HasSubstr;

LiveRow numberRow(std::string const& name, std::string const& value, std::string const& unit)
{
    LiveRow row{};
    row.uid = 120;
    row.name = name;
    row.unit = unit;
    row.numeric = true;
    row.value = row.minimum = row.mean = row.maximum = value;
    return row;
}

std::vector<std::string> lines(std::string const& text)
{
    std::vector<std::string> list;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        list.push_back(line);
    }
    return list;
}

TEST(LiveLines, TellNameValueAndUnit)
{
    EXPECT_EQ(toLine(numberRow("Engine RPM", "1726", "rpm")), "Engine RPM: 1726 rpm\n");
    EXPECT_EQ(toLine(numberRow("Commanded ratio", "0.98", "")), "Commanded ratio: 0.98\n");
    EXPECT_EQ(toLine(numberRow("Engine RPM", "", "rpm")), "Engine RPM: -\n");
}

TEST(LiveLines, JsonHasNumbersAndNull)
{
    std::string const text = toJsonLine(numberRow("Engine RPM", "1726", "rpm"), "2024-03-07T09:05:02.123Z");
    EXPECT_EQ(
        text,
        "{\"time\":\"2024-03-07T09:05:02.123Z\",\"module\":\"0\",\"pid\":\"0C\",\"uid\":120,"
        "\"name\":\"Engine RPM\",\"value\":1726,\"unit\":\"rpm\",\"minimum\":1726,\"mean\":1726,\"maximum\":1726}\n");
    for (char const* missing : {"", "nan", "inf", "-"}) {
        auto const json = nlohmann::json::parse(toJsonLine(numberRow("x", missing, ""), "t"));
        EXPECT_TRUE(json["value"].is_null()) << missing;
        EXPECT_TRUE(json["unit"].is_null());
    }
    auto const json = nlohmann::json::parse(toJsonLine(numberRow("x", "-8.30", "°"), "t"));
    EXPECT_DOUBLE_EQ(json["value"].get<double>(), -8.3);
    EXPECT_THAT(toJsonLine(numberRow("x", "21", "°C"), "t"), HasSubstr("\"unit\":\"°C\""));
}

TEST(LiveLines, JsonOfATextIsAText)
{
    LiveRow row = numberRow("Fuel system", "12", "");
    row.numeric = false;
    row.minimum.clear();
    auto const json = nlohmann::json::parse(toJsonLine(row, "t"));
    EXPECT_EQ(json["value"], "12");
    EXPECT_TRUE(json["minimum"].is_null());
}

TEST(LiveLines, TimesAreIso8601InUtc)
{
    std::chrono::system_clock::time_point const time{milliseconds(1709802302007)};
    EXPECT_EQ(isoTime(time), "2024-03-07T09:05:02.007Z");
}

TEST(LiveCsv, HasAHeaderWithUnitsAndOneColumnASensor)
{
    std::vector<LiveRow> const rows = {numberRow("Engine RPM", "1726", "rpm"),
                                       numberRow("Bank 1, \"Sensor\" 1", "521", "°C"), numberRow("Ratio", "", "")};
    EXPECT_EQ(toCsvHeader(rows), "time,Engine RPM (rpm),\"Bank 1, \"\"Sensor\"\" 1 (°C)\",Ratio\n");
    EXPECT_EQ(toCsvRow(rows, "T"), "T,1726,521,-\n");
}

class LiveCsvFile : public testing::Test
{
protected:
    LiveCsvFile() { table.select({liveParameter(0x0C, "A"), liveParameter(0x0D, "B")}); }
    ~LiveCsvFile() override { std::filesystem::remove(file); }

    std::vector<std::string> content() const
    {
        std::ifstream in(file);
        std::vector<std::string> list = lines({std::istreambuf_iterator<char>(in), {}});
        for (std::string& line : list) {
            line = line.substr(line.find(',') + 1); // without the time
        }
        return list;
    }
    void reading(int pid, std::string const& text) { table.update(pid, {liveValue(pid * 10, text)}, now); }

    std::filesystem::path file =
        std::filesystem::temp_directory_path() / ("velmora-live-" + std::to_string(::getpid()) + ".csv");
    LiveTime now = LiveTime() + seconds(1000);
    LiveCsv::WallTime const start{seconds(1709802302)}; // 2024-03-07T09:05:02Z
    LiveTable table;
};

TEST_F(LiveCsvFile, TimesCountOnFromItsStart)
{
    LiveCsv csv(file.string());
    csv.begin(table, now, start);
    now += milliseconds(61250);
    reading(0x0C, "1");
    csv.update(table, now);
    std::ifstream in(file);
    std::string header;
    std::string row;
    std::getline(in, header);
    std::getline(in, row);
    EXPECT_EQ(row, "2024-03-07T09:06:03.250Z,1,-");
}

TEST_F(LiveCsvFile, HasARowForEachRoundAtOnce)
{
    LiveCsv csv(file.string());
    csv.begin(table, now, start);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)"));
    reading(0x0C, "1");
    EXPECT_TRUE(csv.update(table, now));
    EXPECT_EQ(content().size(), 1U);
    reading(0x0D, "2");
    EXPECT_TRUE(csv.update(table, now));
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)", "1,2")) << "on the disk without a close";
}

TEST_F(LiveCsvFile, HasARowASecondOnASlowBus)
{
    LiveCsv csv(file.string());
    csv.begin(table, now, start);
    reading(0x0C, "1");
    now += milliseconds(999);
    csv.update(table, now);
    EXPECT_EQ(content().size(), 1U);
    now += milliseconds(1);
    csv.update(table, now);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)", "1,-"));
    now += seconds(5);
    csv.update(table, now);
    EXPECT_EQ(content().size(), 2U) << "nothing new";
}

TEST_F(LiveCsvFile, FinishWritesWhatIsLeft)
{
    LiveCsv csv(file.string());
    csv.begin(table, now, start);
    reading(0x0C, "7");
    csv.finish(table, now);
    csv.finish(table, now);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)", "7,-"));
}

TEST_F(LiveCsvFile, KeepsAnOldFileUntilItBegins)
{
    std::ofstream(file) << "x,old\n";
    LiveCsv csv(file.string());
    EXPECT_THAT(content(), ElementsAre("old"));
    EXPECT_THROW(csv.begin(table, now, start), Error) << "unasked it replaces nothing";
    EXPECT_THAT(content(), ElementsAre("old"));
    LiveCsv replacing(file.string(), true);
    EXPECT_THAT(content(), ElementsAre("old"));
    replacing.begin(table, now, start);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)"));
}

TEST_F(LiveCsvFile, GoesOnWhereTheColumnsAreTheSame)
{
    for (char const* old : {"time,A (%),B (%)\nT,1,2\n", "time,A (%),B (%)\nT,1,2"}) {
        std::ofstream(file) << old;
        LiveCsv csv(file.string());
        csv.begin(table, now, start);
        reading(0x0C, "7");
        csv.finish(table, now);
        EXPECT_THAT(content(), ElementsAre("A (%),B (%)", "1,2", "7,-"));
    }
    std::ofstream(file) << "time,A (%),B (%),C\n";
    EXPECT_THROW(LiveCsv(file.string()).begin(table, now, start), Error);
    std::ofstream(file) << "";
    LiveCsv empty(file.string());
    empty.begin(table, now, start);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)"));
}

// As with `live --csv - >> day.csv`.
TEST_F(LiveCsvFile, StandardOutputKeepsWhatStandsBeforeIt)
{
    std::ofstream(file) << "x,old\n";
    int const before = ::dup(STDOUT_FILENO);
    int const target = ::open(file.c_str(), O_WRONLY | O_APPEND);
    ::dup2(target, STDOUT_FILENO);
    LiveCsv csv("-", true);
    csv.begin(table, now, start);
    ::dup2(before, STDOUT_FILENO);
    ::close(before);
    ::close(target);
    EXPECT_THAT(content(), ElementsAre("old", "A (%),B (%)"));
}

TEST_F(LiveCsvFile, TellsOfAFileThatCannotBeOpenedOrWritten)
{
    EXPECT_THROW(LiveCsv("/nowhere/at/all.csv"), Error);
    ASSERT_EQ(::mkfifo(file.c_str(), 0600), 0);
    EXPECT_THROW(LiveCsv(file.string()), Error) << "a pipe that nobody reads is not waited for";
    if (std::filesystem::exists("/dev/full")) {
        LiveCsv full("/dev/full");
        EXPECT_THROW(full.begin(table, now, start), Error);
    }
}

TEST(LiveScreen, DrawsATrend)
{
    EXPECT_EQ(trendLine({0, 1, 2, 3, 4, 5, 6, 7}, 8), "▁▂▃▄▅▆▇█");
    EXPECT_EQ(trendLine({5, 5}, 4), "  ▁▁");
    EXPECT_EQ(trendLine({9, 0, 7}, 2), "▁█");
    EXPECT_EQ(trendLine({-10, -3, -6.5}, 3), "▁█▅");
    EXPECT_EQ(trendLine({}, 3), "   ");
    EXPECT_EQ(trendLine({1, NAN, 2, NAN}, 5), " ▁ █ ") << "a gap stays a gap";
    EXPECT_EQ(trendLine({NAN}, 1), " ");
}

TEST(LiveScreen, NoLineIsWiderThanTheScreenNorTheFrameHigher)
{
    std::vector<LiveRow> rows(30, numberRow("Exhaust Gas Temperature Bank 1: Sensor 3", "-1234.56", "mg/stroke"));
    rows[3].numeric = false;
    rows[3].value = "Closed loop, using oxygen sensor feedback to determine fuel mix, but with a fault";
    for (std::size_t const width : {10U, 30U, 59U, 80U, 120U, 300U}) {
        std::vector<std::string> const frame = lines(drawTable(rows, 2, std::string(200, 't'), "status", {width, 12}));
        EXPECT_EQ(frame.size(), 12U);
        for (std::string const& line : frame) {
            EXPECT_LE(displayWidth(line), width) << line;
        }
    }
}

TEST(LiveScreen, ShowsValueUnitAndStatistics)
{
    LiveRow row = numberRow("Engine RPM", "1726", "rpm");
    row.minimum = "700";
    row.maximum = "3000";
    std::vector<std::string> const frame = lines(drawTable({row}, 0, "title", "status", {80, 24}));
    ASSERT_EQ(frame.size(), 5U);
    EXPECT_EQ(frame[0], "title");
    EXPECT_EQ(frame[1], "Sensor               Value Unit Minimum    Mean Maximum Trend of 120 s");
    EXPECT_THAT(frame[2], HasSubstr("Engine RPM            1726 rpm      700    1726    3000"));
    EXPECT_EQ(frame[4], "status");
}

TEST(LiveScreen, ShowsStatisticsAndTrendWhereThereIsRoom)
{
    std::vector<LiveRow> const rows = {numberRow(std::string(30, 'n'), "1726", "rpm")};
    std::size_t const plain = 18 + std::string(" 1234567 unit").size();
    std::size_t const statistics = plain + 3 * std::string(" Minimum").size();
    std::size_t const all = statistics + 1 + 16;
    auto const heading = [&rows](std::size_t width) { return lines(drawTable(rows, 0, "t", "s", {width, 24}))[1]; };
    EXPECT_EQ(heading(plain), "Sensor               Value Unit");
    EXPECT_EQ(heading(statistics - 1), heading(plain).insert(6, 12, ' ')) << "no wider than the longest name";
    EXPECT_EQ(heading(statistics), "Sensor               Value Unit Minimum    Mean Maximum");
    EXPECT_EQ(heading(all), heading(statistics) + " Trend of 80 s");
    EXPECT_EQ(heading(all + 9), heading(all).insert(6, 9, ' ')) << "names come first";
    EXPECT_EQ(heading(all + 16), heading(statistics).insert(6, 12, ' ') + " Trend of 100 s")
        << "the trend has the rest";
    EXPECT_THAT(heading(300), testing::EndsWith(" Trend of 300 s"));
}

TEST(LiveScreen, MarksWhatIsBeyondItsLimit)
{
    LiveRow row = numberRow("Engine RPM", "6120", "rpm");
    row.limit.highest = 6000;
    FrameStyle style;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("Engine RPM           !6120 rpm")) << "without colours";
    style.bold = true;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\n\033[1mEngine RPM"));
    style.coloured = true;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\n\033[1;31mEngine RPM"));
    row.value = "6000";
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("\nEngine RPM            6000 rpm"));
}

TEST(LiveScreen, AValueThatIsGoneIsDimAndTellsItsAge)
{
    LiveRow row = numberRow("Engine RPM", "", "rpm");
    row.last = "1726";
    row.updated = LiveTime() + seconds(100);
    FrameStyle style;
    style.bold = true;
    style.now = LiveTime() + seconds(112);
    std::string const wide = drawTable({row}, 0, "t", "s", style);
    EXPECT_THAT(wide, HasSubstr("\n\033[2mEngine RPM            1726 rpm"));
    EXPECT_THAT(wide, HasSubstr("12 s ago\033[0m\n"));
    style.columns = 40;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", style), HasSubstr("Engine RPM               - rpm"))
        << "no room for the age";
    EXPECT_EQ(ageText(seconds(119)), "119 s ago");
    EXPECT_EQ(ageText(seconds(120)), "2 min ago");
}

TEST(LiveScreen, HelpNamesTheKeysOfItsHost)
{
    EXPECT_THAT(drawHelp({{"w", "write a recording"}}, {}), HasSubstr("  w          write a recording\n"));
    for (std::string const& line : lines(drawHelp({{"w", std::string(200, 'x')}}, {30, 24}))) {
        EXPECT_LE(displayWidth(line), 30U);
    }
}

TEST(LiveUnits, ALimitFollowsTheUnitsThatAreShown)
{
    SensorLimit const limit{50.0, 120.0};
    EXPECT_EQ(converted(limit, "km/h", "km/h"), limit);
    EXPECT_NEAR(*converted(limit, "km/h", "mph").highest, 74.56, 0.01);
    EXPECT_NEAR(*converted(limit, "°C", "°F").lowest, 122.0, 1e-9);
    EXPECT_EQ(converted(limit, "l/100 km", "mpg"), SensorLimit()) << "none is better than a wrong one";
}

TEST(LiveScreen, ATextTakesThePlaceOfUnitAndStatistics)
{
    LiveRow row = numberRow("Fuel system", "Closed loop, using oxygen sensor feedback", "");
    row.numeric = false;
    EXPECT_THAT(drawTable({row}, 0, "t", "s", {80, 24}),
                HasSubstr("Fuel system        Closed loop, using oxygen sensor feedback\n"));
    EXPECT_THAT(drawTable({row}, 0, "t", "s", {30, 24}), HasSubstr("\nFuel system       Closed loop…\n"));
}

TEST(LiveScreen, NeverCutsANumber)
{
    std::string const frame = drawTable({numberRow("Run time", "4294967295", "s")}, 0, "t", "s", {60, 24});
    EXPECT_THAT(frame, HasSubstr(" 4294967295 s"));
}

TEST(LiveScreen, ShowsADashForAMissingValueAndTellsWhatIsHidden)
{
    std::vector<LiveRow> const rows(5, numberRow("A", "", "V"));
    std::string const frame = drawTable(rows, 0, "t", "s", {80, 7});
    EXPECT_THAT(frame, HasSubstr("A                        - V"));
    EXPECT_THAT(frame, HasSubstr("(2 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 1, "t", "s", {80, 7}), HasSubstr("(2 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 4, "t", "s", {80, 7}), HasSubstr("(4 more: up and down) s"));
    EXPECT_THAT(drawTable(rows, 0, "t", "s", {80, 9}), HasSubstr("\n\ns\n"));
}

TEST(LiveScreen, TheSmallestScreenHasARow)
{
    EXPECT_EQ(roomForRows({80, 1}), 1U);
    EXPECT_EQ(roomForRows({80, 4}), 1U);
    EXPECT_EQ(roomForRows({80, 6}), 2U);
}

TEST(LivePicker, MarksAndOrders)
{
    auto const id = [](int pid) { return obd::ParameterIdentifier(pid).id(); };
    SensorPicker picker({{id(0x04), "Load"}, {id(0x0C), "RPM"}, {id(0x0D), "Speed"}}, {id(0x0D), id(0x0C)});
    EXPECT_THAT(picker.draw({40, 10}), HasSubstr("> [x] 0D Speed\n  [x] 0C RPM\n  [ ] 04 Load\n"));
    picker.move(1);
    picker.carry(-1);
    EXPECT_THAT(picker.chosen(), ElementsAre(id(0x0C), id(0x0D)));
    picker.toggle();
    picker.move(100);
    picker.toggle();
    picker.carry(1);
    EXPECT_THAT(picker.chosen(), ElementsAre(id(0x0D), id(0x04)));
    picker.move(-100);
    picker.carry(-1);
    EXPECT_THAT(picker.draw({40, 10}), HasSubstr("> [ ] 0C RPM\n  [x] 0D Speed\n  [x] 04 Load\n"));
}

TEST(LivePicker, ScrollsWithTheCursor)
{
    std::vector<OfferedSensor> offered;
    for (int pid = 3; pid < 0x20; ++pid) {
        offered.push_back({obd::ParameterIdentifier(pid).id(), "x"});
    }
    SensorPicker picker(offered, {});
    picker.move(15);
    std::string const frame = picker.draw({40, 8});
    EXPECT_THAT(frame, HasSubstr("> [ ] 12 x"));
    EXPECT_EQ(lines(frame).size(), 8U);
    EXPECT_THAT(lines(picker.draw({40, 3})),
                ElementsAre("Which sensors, in which order?", "> [ ] 12 x", "", testing::_));
}

TEST(LivePicker, AVehicleWithoutSensorsLeavesNothingToMark)
{
    SensorPicker picker({}, {});
    picker.move(1);
    picker.toggle();
    picker.carry(1);
    EXPECT_TRUE(picker.chosen().empty());
}

} // namespace
