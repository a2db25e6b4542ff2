// Files to write, beside streams that somebody has redirected.
#include "tests/support/temporaryfolder.h"

#include <common/outputfile.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <fcntl.h>
#include <fstream>
#include <unistd.h>

namespace {

// A stream of the process while it goes to that file, at its end; to nowhere for an empty name.
class Redirection
{
public:
    Redirection(std::FILE* stream, std::filesystem::path const& file)
        : m_stream(stream), m_number(::fileno(stream)), m_before(::dup(m_number))
    {
        std::fflush(m_stream);
        ::close(m_number);
        if (!file.empty()) {
            int const target = ::open(file.c_str(), O_WRONLY | O_APPEND | O_CLOEXEC);
            if (target != m_number) {
                ::dup2(target, m_number);
                ::close(target);
            }
        }
    }
    ~Redirection()
    {
        std::fflush(m_stream);
        ::dup2(m_before, m_number);
        ::close(m_before);
    }
    Redirection(Redirection const&) = delete;
    Redirection& operator=(Redirection const&) = delete;

private:
    std::FILE* m_stream;
    int m_number;
    int m_before;
};

class OutputFile : public testing::Test
{
protected:
    OutputFile() { std::ofstream(m_path) << "old\n"; }

    testsupport::TemporaryFolder const m_folder;
    std::filesystem::path const m_path = m_folder.path() / "day.log";
};

TEST_F(OutputFile, LosesWhatStoodInIt)
{
    std::FILE* const file = tervex::openForWriting(m_path);
    ASSERT_NE(file, nullptr);
    std::fputs("new\n", file);
    tervex::closeWritten(file);
    EXPECT_EQ(m_folder.read("day.log"), "new\n");
}

TEST_F(OutputFile, ThatCannotBeOpenedIsNone)
{
    errno = 0;
    EXPECT_EQ(tervex::openForWriting(m_folder.path() / "none" / "day.log"), nullptr);
    EXPECT_EQ(errno, ENOENT);
    tervex::closeWritten(nullptr);
}

TEST_F(OutputFile, ThatAStreamGoesToIsWrittenOnByThatStreamWhichStaysOpen)
{
    for (std::FILE* const stream : {stdout, stderr}) {
        std::ofstream(m_path) << "old\n";
        std::FILE* opened = nullptr;
        bool stays = false;
        {
            Redirection const redirection(stream, m_path);
            opened = tervex::openForWriting(m_path);
            std::fputs("new\n", opened);
            tervex::closeWritten(opened);
            stays = std::fputs("more\n", stream) >= 0 && std::fflush(stream) == 0;
        }
        EXPECT_EQ(opened, stream);
        EXPECT_TRUE(stays);
        EXPECT_EQ(m_folder.read("day.log"), "old\nnew\nmore\n");
    }
}

TEST_F(OutputFile, IsNoStreamThatGoesElsewhereOrIsClosed)
{
    std::filesystem::path const other = m_folder.path() / "other";
    std::ofstream(other) << "other\n";
    for (std::filesystem::path const& target : {other, std::filesystem::path()}) {
        std::FILE* found = stdout;
        {
            Redirection const out(stdout, target);
            Redirection const err(stderr, target);
            found = tervex::redirectedTo(m_path);
        }
        EXPECT_EQ(found, nullptr) << target;
    }
    EXPECT_EQ(tervex::redirectedTo("/dev/null"), nullptr);
}

} // namespace
