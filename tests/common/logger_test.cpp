#include "tests/support/fakeclock.h"
#include "tests/support/temporaryfolder.h"

#include <common/debuglogger.h>
#include <common/localtime.h>
#include <common/logrecord.h>
#include <common/tracestream.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iomanip>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <thread>

namespace {

std::time_t localSeconds(int year, int month, int day, int hour, int minute, int second)
{
    std::tm fields{};
    fields.tm_year = year - 1900;
    fields.tm_mon = month - 1;
    fields.tm_mday = day;
    fields.tm_hour = hour;
    fields.tm_min = minute;
    fields.tm_sec = second;
    fields.tm_isdst = -1;
    return tervex::fromLocalTime(fields);
}

class Logger : public testing::Test
{
protected:
    ~Logger() override { tervex::LogSink = nullptr; }

    std::string content() const
    {
        std::ifstream in(m_path);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    testsupport::TemporaryFolder const m_folder;
    std::filesystem::path const m_path = m_folder.path() / "log";
    support::FakeClock m_clock{1000, localSeconds(2024, 3, 7, 9, 5, 2)};
};

TEST_F(Logger, LineHasTheFixedLayout)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    TERVEX_LOG(Info) << "Lib OBD init";
    EXPECT_TRUE(std::regex_match(content(), std::regex("2024-03-07 09:05:02 [0-9]+ INFO - Lib OBD init\n")))
        << content();
    std::ostringstream thread;
    thread << std::this_thread::get_id();
    EXPECT_NE(content().find(" " + thread.str() + " "), std::string::npos);
}

TEST_F(Logger, EveryLevelIsWrittenWithItsWord)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    TERVEX_LOG(Debug) << "a";
    TERVEX_LOG(Info) << "b";
    TERVEX_LOG(Error) << "c";
    TERVEX_LOG(Fatal) << "d";
    std::istringstream lines(content());
    std::string line;
    for (char const* end : {"DEBUG - a", "INFO - b", "ERROR - c", "FATAL - d"}) {
        ASSERT_TRUE(std::getline(lines, line));
        EXPECT_TRUE(line.ends_with(end)) << line;
    }
    EXPECT_FALSE(std::getline(lines, line));
}

TEST_F(Logger, MonthDayHourMinuteSecondArePaddedEachOnItsOwn)
{
    m_clock.setWallSeconds(localSeconds(2009, 12, 31, 23, 0, 9));
    tervex::DebugLogger logger;
    logger.open(m_path);
    TERVEX_LOG(Error) << 1;
    EXPECT_EQ(content().substr(0, 20), "2009-12-31 23:00:09 ");
}

TEST_F(Logger, OpeningTruncatesAnOldLog)
{
    std::ofstream(m_path) << "old";
    tervex::DebugLogger logger;
    logger.open(m_path);
    EXPECT_EQ(content(), "");
}

TEST_F(Logger, EmptyPathWritesNothingAndFailsNothing)
{
    tervex::DebugLogger logger;
    logger.open("");
    EXPECT_NO_THROW(TERVEX_LOG(Fatal) << "lost");
    EXPECT_EQ(tervex::LogSink, &logger);
}

TEST_F(Logger, SecondOpeningWithAnEmptyPathChangesNothing)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    logger.open("");
    TERVEX_LOG(Info) << "still here";
    EXPECT_NE(content().find("still here"), std::string::npos);
}

TEST_F(Logger, PathInAFolderThatDoesNotExistTurnsLoggingOff)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    logger.open(m_path / "no" / "such");
    TERVEX_LOG(Info) << "lost";
    EXPECT_EQ(content(), "");
}

TEST_F(Logger, DestroyedLoggerLeavesTheSink)
{
    {
        tervex::DebugLogger logger;
        logger.open(m_path);
    }
    EXPECT_EQ(tervex::LogSink, nullptr);
    EXPECT_NO_THROW(TERVEX_LOG(Info) << "dropped");
}

TEST_F(Logger, RecordOutlivesASinkThatThrows)
{
    struct Throwing : tervex::ITraceLogger
    {
        int calls = 0;
        void log(char const* /*file*/, int /*line*/, int /*level*/, std::string const& /*message*/) override
        {
            ++calls;
            throw std::runtime_error("disk on fire");
        }
    } sink;
    tervex::LogSink = &sink;
    EXPECT_NO_THROW(TERVEX_LOG(Info) << "x");
    EXPECT_EQ(sink.calls, 1);
}

TEST_F(Logger, RecordCarriesFileLineAndLevel)
{
    struct Probe : tervex::ITraceLogger
    {
        std::string file;
        int line = 0;
        int level = -1;
        void log(char const* from, int at, int how, std::string const& /*message*/) override
        {
            file = from;
            line = at;
            level = how;
        }
    } sink;
    tervex::LogSink = &sink;
    TERVEX_LOG(Error) << "x";
    EXPECT_EQ(sink.line, __LINE__ - 1);
    EXPECT_EQ(sink.level, 2);
    EXPECT_TRUE(sink.file.ends_with("tests/common/logger_test.cpp")) << sink.file;
}

TEST_F(Logger, RecordsFormatInTheClassicLocaleWhateverTheProcessUses)
{
    struct Comma : std::numpunct<char>
    {
        char do_thousands_sep() const override { return '.'; }
        std::string do_grouping() const override { return "\3"; }
    };
    std::locale const before = std::locale::global(std::locale(std::locale::classic(), new Comma));
    tervex::DebugLogger logger;
    logger.open(m_path);
    TERVEX_LOG(Info) << 1234567;
    std::locale::global(before);
    EXPECT_TRUE(content().starts_with("2024-03-07")) << content();
    EXPECT_NE(content().find("INFO - 1234567\n"), std::string::npos) << content();
}

TEST_F(Logger, LinesOfSeveralThreadsStayWhole)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    std::vector<std::thread> threads;
    for (char letter : {'a', 'b', 'c', 'd'}) {
        threads.emplace_back([letter] {
            for (int i = 0; i < 100; ++i) {
                TERVEX_LOG(Info) << std::string(60, letter);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    std::istringstream lines(content());
    std::string line;
    std::regex const whole("2024-03-07 09:05:02 [0-9]+ INFO - (a{60}|b{60}|c{60}|d{60})");
    int count = 0;
    while (std::getline(lines, line)) {
        ++count;
        ASSERT_TRUE(std::regex_match(line, whole)) << line;
    }
    EXPECT_EQ(count, 400);
}

TEST_F(Logger, TraceStreamReachesNoLog)
{
    tervex::DebugLogger logger;
    logger.open(m_path);
    tervex::TraceStream << "Found ECU: 0x" << std::hex << 0x7E8 << std::setw(2) << 1;
    EXPECT_EQ(content(), "");
}

} // namespace
