#include "program/view/json.h"
#include "program/view/live/livecsv.h"
#include "program/view/live/livelines.h"
#include "program/view/timetext.h"
#include "tests/program/view/liveparameter.h"
#include "tests/program/view/liverows.h"
#include "tests/support/closedinput.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using namespace velmora;
using namespace velmora::cli;
using std::chrono::milliseconds;
using std::chrono::seconds;
using support::linesOf;
using support::liveParameter;
using support::liveValue;
using support::numberRow;
using testing::ElementsAre;
using testing::HasSubstr;

TEST(LiveLines, TellNameValueAndUnit)
{
    EXPECT_EQ(toLine(numberRow("Engine RPM", "1726", "rpm")), "Engine RPM: 1726 rpm\n");
    EXPECT_EQ(toLine(numberRow("Commanded ratio", "0.98", "")), "Commanded ratio: 0.98\n");
    EXPECT_EQ(toLine(numberRow("Engine RPM", "", "rpm")), "Engine RPM: -\n");
}

TEST(LiveLines, DocumentsAreReadByPeopleToo)
{
    EXPECT_EQ(cli::printed(cli::Json{{"unit", "\u00B0C"}, {"bad", "\xFF"}, {"none", cli::textOrNull("")}}),
              "{\n  \"unit\": \"\u00B0C\",\n  \"bad\": \"\uFFFD\",\n  \"none\": null\n}\n");
}

TEST(LiveLines, JsonHasNumbersAndNull)
{
    std::string const text = toJsonLine(numberRow("Engine RPM", "1726", "rpm"), "2024-03-07T09:05:02.123Z");
    EXPECT_EQ(
        text,
        "{\"time\":\"2024-03-07T09:05:02.123Z\",\"module\":\"0\",\"pid\":\"0C\",\"uid\":120,"
        "\"name\":\"Engine RPM\",\"value\":1726,\"unit\":\"rpm\",\"minimum\":1726,\"mean\":1726,\"maximum\":1726}\n");
    EXPECT_THAT(toJsonLine(numberRow("x", "1", "\u00B0C"), "t"), HasSubstr("\"unit\":\"\u00B0C\"")) << "as it is";
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

    std::vector<std::string> content() const
    {
        std::ifstream in(file);
        std::vector<std::string> list = linesOf({std::istreambuf_iterator<char>(in), {}});
        for (std::string& line : list) {
            line = line.substr(line.find(',') + 1); // without the time
        }
        return list;
    }
    void reading(int pid, std::string const& text) { table.update(pid, {liveValue(pid * 10, text)}, now); }

    testsupport::TemporaryFolder const own;
    std::filesystem::path const file = own.path() / "live.csv";
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

TEST_F(LiveCsvFile, StandsWhereStandardInputIsClosed)
{
    std::string const pipe = own.file("pipe");
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    int const reader = ::open(pipe.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    testsupport::ClosedInput const closed;
    LiveCsv(file.string()).begin(table, now, start);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%)"));
    EXPECT_TRUE(testsupport::ClosedInput::isFree());
    LiveCsv const piped(pipe);
    EXPECT_EQ(::fcntl(STDIN_FILENO, F_GETFL) & (O_ACCMODE | O_NONBLOCK), O_WRONLY) << "a slow reader is waited for";
    ::close(reader);
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

TEST_F(LiveCsvFile, ASecondCountsFromTheLastRow)
{
    table.select({liveParameter(0x0C, "A"), liveParameter(0x0D, "B"), liveParameter(0x0E, "C")});
    LiveCsv csv(file.string());
    csv.begin(table, now, start);
    now += seconds(1);
    reading(0x0C, "1");
    csv.update(table, now);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%),C (%)", "1,-,-"));
    now += milliseconds(999);
    reading(0x0D, "2");
    csv.update(table, now);
    EXPECT_EQ(content().size(), 2U);
    now += milliseconds(1);
    csv.update(table, now);
    EXPECT_THAT(content(), ElementsAre("A (%),B (%),C (%)", "1,-,-", "1,2,-"));
}

TEST_F(LiveCsvFile, WaitsForASlowReader)
{
    std::string const pipe = (own.path() / "pipe").string();
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    int const reader = ::open(pipe.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    struct stat wanted
    {};
    ASSERT_EQ(::stat(pipe.c_str(), &wanted), 0);
    {
        LiveCsv const csv(pipe);
        int writers = 0;
        for (int each = 3; each < 256; ++each) {
            struct stat info
            {};
            int const flags = ::fcntl(each, F_GETFL);
            if (::fstat(each, &info) == 0 && info.st_ino == wanted.st_ino && info.st_dev == wanted.st_dev &&
                (flags & O_ACCMODE) == O_WRONLY) {
                ++writers;
                EXPECT_EQ(flags & O_NONBLOCK, 0) << "or rows would be lost";
            }
        }
        EXPECT_EQ(writers, 1);
    }
    char byte = 0;
    EXPECT_EQ(::read(reader, &byte, 1), 0) << "closed";
    ::close(reader);
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
    auto const complaint = [](std::string const& name) {
        try {
            LiveCsv{name};
        } catch (Error const& error) {
            return error.what() + (" - " + error.hints().front());
        }
        return std::string();
    };
    EXPECT_EQ(complaint(file),
              "Nobody reads " + file.string() + ", which is a pipe - start its reader first, or name a file")
        << "it is not waited for";
    EXPECT_THAT(complaint(file.parent_path()), testing::EndsWith("Is a directory - name a file in it"));
    if (std::filesystem::exists("/dev/full")) {
        LiveCsv full("/dev/full");
        EXPECT_THROW(full.begin(table, now, start), Error);
    }
}

} // namespace
