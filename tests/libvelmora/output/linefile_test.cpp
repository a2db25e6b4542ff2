// A file of lines: who holds it, what a crash, a full disk or somebody else left of it, and when another one begins.
#include "libvelmora/output/linefile.h"
#include "libvelmora/output/valuetext.h"
#include "tests/support/filelimit.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <csignal>
#include <fcntl.h>
#include <pthread.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

using testsupport::FileLimit;
using testsupport::march;
using testsupport::TemporaryFolder;
using velmora::fromMillis;
using velmora::LineFile;
using velmora::parseOutputAddress;

// What adding the lines complains of.
std::string lineTrouble(LineFile& file, std::string const& lines, long long millis = march)
{
    try {
        file.add(lines, fromMillis(millis));
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Failed);
        return error.what();
    }
    return "";
}

TEST(LineFiles, AreHeldOneAtATime)
{
    TemporaryFolder const folder;
    std::string const name = folder.file("a");
    long const before = testsupport::openDescriptors();
    {
        LineFile file(parseOutputAddress("ndjson:" + name));
        EXPECT_EQ(lineTrouble(file, "one\n"), "");
        EXPECT_TRUE(testsupport::isHeldOpen(name));
        file.setHeader("head\n");
        EXPECT_EQ(file.file(), folder.file("a-2"));
        EXPECT_FALSE(testsupport::isHeldOpen(name)) << "that has no such header";
        EXPECT_EQ(testsupport::openDescriptors(), before + 1);
        file.close();
        file.close();
        EXPECT_EQ(testsupport::openDescriptors(), before);
        EXPECT_EQ(lineTrouble(file, "two\n"), "");
    }
    EXPECT_EQ(testsupport::openDescriptors(), before);
    EXPECT_EQ(folder.read("a-2"), "head\ntwo\n");
}

TEST(LineFiles, GoOnBehindTheLastWholeLine)
{
    TemporaryFolder const folder;
    for (auto const& [left, whole] : {std::pair("head\nunfinished", "head\n1\n"),
                                      {"head\n", "head\n1\n"},
                                      {"head\na\n", "head\na\n1\n"},
                                      {"head\na\nb", "head\na\n1\n"}}) {
        std::ofstream(folder.file("a")) << left;
        LineFile file(parseOutputAddress("ndjson:" + folder.file("a")));
        file.setHeader("head\n");
        EXPECT_EQ(lineTrouble(file, "1\n"), "");
        EXPECT_EQ(folder.read("a"), whole) << left;
    }
}

TEST(LineFiles, KeepAHeaderAloneUntilItHasLines)
{
    TemporaryFolder const folder;
    LineFile file(parseOutputAddress("ndjson:" + folder.file("a") + "?rotate=8"));
    file.setHeader("head\n");
    EXPECT_EQ(lineTrouble(file, "longer than a file\n"), "");
    EXPECT_EQ(folder.read("a"), "head\nlonger than a file\n");
    for (char const* const line : {"1\n", "22\n", "33\n", "44\n"}) {
        EXPECT_EQ(lineTrouble(file, line), "");
    }
    EXPECT_EQ(folder.read("a-20260301T081500Z"), "head\nlonger than a file\n");
    EXPECT_EQ(folder.read("a-20260301T081500Z-2"), "head\n1\n");
    EXPECT_EQ(folder.read("a-20260301T081500Z-3"), "head\n22\n");
    EXPECT_EQ(folder.read("a-20260301T081500Z-4"), "head\n33\n");
    EXPECT_EQ(folder.read("a"), "head\n44\n");
}

TEST(LineFiles, TakeALineOfNothing)
{
    TemporaryFolder const folder;
    LineFile file(parseOutputAddress("ndjson:" + folder.file("a")));
    EXPECT_EQ(lineTrouble(file, "\n"), "");
    EXPECT_EQ(folder.read("a"), "\n");
}

TEST(LineFiles, MayBeStandardOutputWhichStaysOpen)
{
    TemporaryFolder const folder;
    std::cout.flush();
    std::fflush(stdout);
    int const before = ::dup(STDOUT_FILENO);
    int const own = ::open(folder.file("out").c_str(), O_WRONLY | O_CREAT | O_CLOEXEC, 0600);
    ::dup2(own, STDOUT_FILENO);
    std::string trouble;
    {
        LineFile file(parseOutputAddress("ndjson:-?rotate=1"));
        file.setHeader("head\n");
        EXPECT_EQ(file.file(), "-");
        trouble += lineTrouble(file, "1\n");
        trouble += lineTrouble(file, "2\n");
        file.close();
        trouble += lineTrouble(file, "3\n");
    }
    bool const open = ::write(STDOUT_FILENO, "end\n", 4) == 4;
    ::dup2(before, STDOUT_FILENO);
    ::close(before);
    ::close(own);
    EXPECT_EQ(trouble, "");
    EXPECT_TRUE(open);
    EXPECT_EQ(folder.read("out"), "head\n1\n2\nhead\n3\nend\n");
    EXPECT_FALSE(std::filesystem::exists("-"));
}

TEST(LineFiles, AreNotRenamedBeforeTheyHaveLines)
{
    for (char const* const head : {"", "head\n"}) {
        TemporaryFolder const folder;
        LineFile file(parseOutputAddress("ndjson:" + folder.file("a") + "?rotate=day"));
        file.setHeader(head);
        EXPECT_EQ(lineTrouble(file, "1\n"), "");
        EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.path()), {}), 1) << head;
    }
}

TEST(LineFiles, BeginAgainWhereSomebodyHasMovedThemAway)
{
    TemporaryFolder const folder;
    LineFile file(parseOutputAddress("ndjson:" + folder.file("a") + "?rotate=4"));
    EXPECT_EQ(lineTrouble(file, "one\n"), "");
    std::filesystem::rename(folder.file("a"), folder.file("taken"));
    EXPECT_EQ(lineTrouble(file, "two\n"), "");
    EXPECT_EQ(folder.read("taken"), "one\n");
    EXPECT_EQ(folder.read("a"), "two\n");
}

TEST(LineFiles, TellWhatNameTheyCouldNotHave)
{
    TemporaryFolder const folder;
    std::string const name = folder.file(std::string(250, 'x'));
    LineFile lengthy(parseOutputAddress("ndjson:" + name + "?rotate=4"));
    EXPECT_EQ(lineTrouble(lengthy, "one\n"), "");
    EXPECT_EQ(lineTrouble(lengthy, "two\n"), "Could not rename " + name + ": File name too long");

    std::ofstream(folder.file("b.csv")) << "other\n";
    for (int number = 2; number < 10000; ++number) {
        std::filesystem::create_hard_link(folder.file("b.csv"), folder.file("b-" + std::to_string(number) + ".csv"));
    }
    LineFile crowded(parseOutputAddress("csv:" + folder.file("b.csv")));
    try {
        crowded.setHeader("head\n");
        ADD_FAILURE() << "all ten thousand are taken";
    } catch (velmora::Error const& error) {
        EXPECT_EQ(std::string(error.what()),
                  "Could not find a free name beside " + folder.file("b-9999.csv") + ": File exists");
    }
    std::filesystem::remove(folder.file("b-9999.csv"));
    crowded.setHeader("head\n");
    EXPECT_EQ(crowded.file(), folder.file("b-9999.csv"));
}

TEST(LineFiles, HoldNoHalfLineOfAFullDisk)
{
    TemporaryFolder const folder;
    LineFile file(parseOutputAddress("ndjson:" + folder.file("a")));
    EXPECT_EQ(lineTrouble(file, "one\n"), "");
    {
        FileLimit const limit(6);
        EXPECT_EQ(lineTrouble(file, "two\nthree\n"), "Could not write to " + folder.file("a") + ": File too large");
    }
    EXPECT_EQ(folder.read("a"), "one\n");
    EXPECT_TRUE(testsupport::isHeldOpen(folder.file("a"))) << "it goes on with the same";
    EXPECT_EQ(lineTrouble(file, "two\n"), "");
    EXPECT_EQ(folder.read("a"), "one\ntwo\n");
}

int pipeEnd = -1;
std::atomic<int> interruptions = 0;
char drained[40000];
std::size_t drainedSize = 0;

// Makes room in the pipe from the second interruption on.
void onInterruption(int /*signal*/)
{
    if (++interruptions < 2) {
        return;
    }
    int const before = errno; // of what it interrupts
    for (ssize_t count = 1; count > 0;) {
        count = ::read(pipeEnd, drained + drainedSize, sizeof(drained) - drainedSize);
        drainedSize += count > 0 ? static_cast<std::size_t>(count) : 0;
    }
    errno = before;
}

// A pipe is neither cut nor renamed, and a write that a signal interrupts goes on.
TEST(LineFiles, MayBePipes)
{
    TemporaryFolder const folder;
    ASSERT_EQ(::mkfifo(folder.file("pipe").c_str(), 0600), 0);
    pipeEnd = ::open(folder.file("pipe").c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    ASSERT_EQ(::fcntl(pipeEnd, F_SETPIPE_SZ, 4096), 4096);
    LineFile file(parseOutputAddress("ndjson:" + folder.file("pipe") + "?rotate=2"));
    file.setHeader("head\n");
    EXPECT_EQ(lineTrouble(file, "one\n"), "");
    EXPECT_EQ(lineTrouble(file, "two\n"), "");
    EXPECT_TRUE(std::filesystem::is_fifo(folder.file("pipe")));
    char text[64] = {};
    EXPECT_EQ(::read(pipeEnd, text, sizeof(text)), 13);
    EXPECT_STREQ(text, "head\none\ntwo\n");

    struct sigaction interrupt = {};
    struct sigaction before = {};
    interrupt.sa_handler = onInterruption; // and no SA_RESTART
    ::sigaction(SIGUSR1, &interrupt, &before);
    std::atomic<bool> done = false;
    std::thread interrupter([writer = ::pthread_self(), &done] {
        while (!done) {
            ::usleep(1000);
            ::pthread_kill(writer, SIGUSR1);
        }
    });
    std::string lengthy;
    while (lengthy.size() < 20000) {
        lengthy += std::to_string(lengthy.size()) + "\n";
    }
    EXPECT_EQ(lineTrouble(file, lengthy), "");
    done = true;
    interrupter.join();
    ::sigaction(SIGUSR1, &before, nullptr);
    EXPECT_GT(interruptions, 1);
    onInterruption(0);
    EXPECT_EQ(std::string(drained, drainedSize), lengthy);
    ::close(pipeEnd);
}

} // namespace
