#include "libvelmora/record/checkedfile.h"
#include "libvelmora/record/traffictrace.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using testing::MatchesRegex;
using velmora::Error;
using velmora::requireWritable;
using velmora::TrafficTrace;
using velmora::whyUnreadable;

std::vector<unsigned char> bytesOf(std::string const& text)
{
    return {text.begin(), text.end()};
}

TEST(TrafficTrace, HasALineEachWayWithItsTime)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.path() / "trace";
    TrafficTrace trace(file);
    trace.onDataSent(bytesOf("010C\r"));
    trace.onDataReceived(bytesOf("41 0C\r\n>"));
    trace.onDataReceived(bytesOf("\\ ~\x7F\x1F\xFF"));
    std::ifstream in(file); // while the trace is still open: every line is on the disk at once
    std::vector<std::string> lines;
    for (std::string line; std::getline(in, line);) {
        ASSERT_THAT(line, MatchesRegex("[0-9]{2}:[0-9]{2}:[0-9]{2}\\.[0-9]{3} .*"));
        lines.push_back(line.substr(line.find(' ') + 1));
    }
    EXPECT_THAT(lines, testing::ElementsAre(">> 010C\\r", "<< 41 0C\\r\\n>", "<< \\\\ ~\\x7F\\x1F\\xFF"));
}

TEST(TrafficTrace, TellsTheTimeToTheMillisecond)
{
    testsupport::TemporaryFolder const folder;
    TrafficTrace trace(folder.path() / "trace");
    auto const millis = [] {
        auto const now = std::chrono::system_clock::now().time_since_epoch();
        return std::chrono::floor<std::chrono::milliseconds>(now).count();
    };
    auto const begin = millis();
    trace.onDataSent(bytesOf("A"));
    auto const end = millis();
    std::string const line = folder.read("trace");
    bool found = false;
    for (auto at = begin; at <= end; ++at) {
        std::time_t const seconds = at / 1000;
        std::tm fields{};
        ::localtime_r(&seconds, &fields);
        char text[32] = {};
        std::strftime(text, sizeof(text), "%H:%M:%S.", &fields);
        std::string const fraction = std::to_string(1000 + at % 1000).substr(1);
        found = found || line.starts_with(text + fraction + " >> A");
    }
    EXPECT_TRUE(found) << line << " is not between " << begin << " and " << end;
}

TEST(TrafficTrace, AFileThatCannotBeWrittenIsTold)
{
    EXPECT_THROW(TrafficTrace("/nowhere/at/all"), velmora::Error);
}

TEST(CheckedFile, IsNotWaitedForAndNotReadWithoutEnd)
{
    testsupport::TemporaryFolder const own;
    std::filesystem::path const& folder = own.path();
    std::filesystem::path const pipe = folder / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    EXPECT_THROW(requireWritable(pipe, "log file"), Error) << "nobody reads it";
    EXPECT_EQ(whyUnreadable(pipe, 100), "it is no plain file");
    std::filesystem::remove(pipe);
    EXPECT_EQ(whyUnreadable("/dev/zero", 100), "it is no plain file");
    EXPECT_EQ(whyUnreadable(folder, 100), "it is no plain file");
    EXPECT_EQ(whyUnreadable(pipe, 100), "there is no such file");
    std::ofstream(pipe) << "12345";
    EXPECT_EQ(whyUnreadable(pipe, 5), "");
    EXPECT_EQ(whyUnreadable(pipe, 4), "it has 5 bytes; at most 4 are read");
    requireWritable(pipe, "log file");
    EXPECT_EQ(std::filesystem::file_size(pipe), 5U) << "looking at it changes nothing";
    EXPECT_THROW(requireWritable(folder / "no" / "such", "log file"), Error);
}

TEST(TrafficTrace, NotesThatTheDiskIsFull)
{
    TrafficTrace full("/dev/full");
    EXPECT_FALSE(full.failed());
    full.onDataSent({'A', 'T', 'I', '\r'});
    EXPECT_TRUE(full.failed());
}

} // namespace
