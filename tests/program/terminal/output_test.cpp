// Standard output when it is read, when nobody reads it any more, and when the disk behind it is full.
#include "program/terminal/lineprinter.h"
#include "program/terminal/output.h"
#include "tests/program/terminal/terminalinput.h"

#include <gmock/gmock.h>

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <stdio_ext.h>
#include <system_error>

namespace {

using namespace velmora;
using namespace velmora::cli;

// Another file as standard output, for as long as an action runs. What could not be written is forgotten behind it.
template <typename Action>
void withOutput(int file, Action action)
{
    std::fflush(stdout);
    {
        SignalsAsBefore const signals;
        std::signal(SIGPIPE, SIG_IGN);
        Replaced const output(STDOUT_FILENO, file);
        action();
        __fpurge(stdout);
        std::clearerr(stdout);
    }
}

struct Pipe
{
    Pipe() { EXPECT_EQ(::pipe2(ends, O_NONBLOCK), 0); }
    ~Pipe()
    {
        endReader();
        ::close(ends[1]);
    }
    void endReader()
    {
        if (ends[0] >= 0) {
            ::close(ends[0]);
        }
        ends[0] = -1;
    }
    std::string content() const
    {
        char bytes[256];
        ssize_t const count = ::read(ends[0], bytes, sizeof bytes);
        return {bytes, count > 0 ? static_cast<std::size_t>(count) : 0};
    }

    int ends[2] = {-1, -1};
};

TEST(Output, IsWrittenAtOnce)
{
    Pipe const pipe;
    bool written = false;
    std::string content;
    withOutput(pipe.ends[1], [&] {
        written = writeOutput("a line\n");
        content = pipe.content();
    });
    EXPECT_TRUE(written);
    EXPECT_EQ(content, "a line\n");
}

TEST(Output, ThatNobodyReadsIsNoError)
{
    Pipe pipe;
    pipe.endReader();
    bool written = true;
    bool gone = false;
    int why = 0;
    withOutput(pipe.ends[1], [&] { written = writeOutput("a line\n"); });
    withOutput(pipe.ends[1], [&] {
        LinePrinter printer;
        printer.print("a line\n");
        printer.finish();
        gone = printer.readerGone();
    });
    withOutput(pipe.ends[1], [&] {
        std::fputs("a line\n", stdout);
        try {
            flushOutput();
        } catch (std::system_error const& error) {
            why = error.code().value();
        }
    });
    EXPECT_FALSE(written);
    EXPECT_TRUE(gone);
    EXPECT_EQ(why, EPIPE);
}

TEST(Output, ThatCannotBeWrittenIsTold)
{
    int const full = ::open("/dev/full", O_WRONLY);
    if (full < 0) {
        GTEST_SKIP() << "there is no /dev/full";
    }
    std::vector<std::string> told;
    auto const tellErrorOf = [&told](auto action) {
        try {
            action();
            told.emplace_back("nothing");
        } catch (Error const& error) {
            told.push_back(error.what() + (" - " + error.hints().front()));
        }
    };
    withOutput(full, [&] { tellErrorOf([] { writeOutput("a line\n"); }); });
    withOutput(full, [&] {
        LinePrinter printer;
        printer.print("a line\n");
        tellErrorOf([&] { printer.finish(); });
        tellErrorOf([&] { printer.readerGone(); });
    });
    ::close(full);
    std::string const expected =
        "Could not write to standard output: No space left on device - is the disk full that it goes to?";
    EXPECT_THAT(told, testing::ElementsAre(expected, expected, expected));
}

TEST(LinePrinter, PrintsALineWhenItComes)
{
    Pipe const pipe;
    std::string content;
    withOutput(pipe.ends[1], [&] {
        LinePrinter printer;
        printer.print("a line\n");
        pollfd reader{pipe.ends[0], POLLIN, 0};
        ::poll(&reader, 1, 5000);
        content = pipe.content();
    });
    EXPECT_EQ(content, "a line\n") << "though more may follow";
}

TEST(LinePrinter, PrintsAllOfItInItsOrder)
{
    std::string expected;
    testing::internal::CaptureStdout();
    {
        LinePrinter printer;
        for (int i = 0; i < 500; ++i) {
            std::string const line = std::to_string(i) + "\n";
            expected += line;
            printer.print(line);
        }
    }
    EXPECT_EQ(testing::internal::GetCapturedStdout(), expected) << "the end waits for what was handed in";
    testing::internal::CaptureStdout();
    LinePrinter printer;
    printer.print("last\n");
    printer.finish();
    EXPECT_EQ(testing::internal::GetCapturedStdout(), "last\n");
    EXPECT_FALSE(printer.readerGone());
}

} // namespace
