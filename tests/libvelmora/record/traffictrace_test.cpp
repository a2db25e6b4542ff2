#include "libvelmora/record/traffictrace.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <unistd.h>

namespace {

using testing::MatchesRegex;
using velmora::TrafficTrace;

std::vector<unsigned char> bytesOf(std::string const& text)
{
    return {text.begin(), text.end()};
}

TEST(TrafficTrace, HasALineEachWayWithItsTime)
{
    std::filesystem::path const file =
        std::filesystem::temp_directory_path() / ("velmora-trace-" + std::to_string(::getpid()));
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
    std::filesystem::remove(file);
    EXPECT_THAT(lines, testing::ElementsAre(">> 010C\\r", "<< 41 0C\\r\\n>", "<< \\\\ ~\\x7F\\x1F\\xFF"));
}

TEST(TrafficTrace, AFileThatCannotBeWrittenIsTold)
{
    EXPECT_THROW(TrafficTrace("/nowhere/at/all"), velmora::Error);
}

} // namespace
