#include "simulator/car/vehiclelibrary.h"
#include "simulator/control/scenario.h"
#include "simulator/error.h"
#include "simulator/serve/tracepeer.h"
#include "simulator/simulation.h"
#include "simulator/textfile.h"
#include "tests/support/closedinput.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <fcntl.h>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace {

class TextFile : public testing::Test
{
protected:
    TextFile()
    {
        std::ofstream(m_file) << "12345";
        std::remove(m_pipe.c_str());
        EXPECT_EQ(::mkfifo(m_pipe.c_str(), 0600), 0);
    }
    ~TextFile() override
    {
        std::remove(m_file.c_str());
        std::remove(m_pipe.c_str());
    }

    std::string m_file = testsupport::ownPath("text");
    std::string m_pipe = testsupport::ownPath("pipe");
};

TEST_F(TextFile, onlyPlainFilesOfABoundedSizeAreRead)
{
    EXPECT_EQ(obdsim::readTextFile(m_file, 5), "12345");
    EXPECT_EQ(obdsim::readTextFile(m_file, 4), std::nullopt);
    EXPECT_EQ(obdsim::whyNoText(m_file, 4), "it is larger than 0 MiB");
    for (std::string const path : {"/dev/zero", "/dev/null", "/", m_pipe.c_str()}) {
        EXPECT_EQ(obdsim::readTextFile(path), std::nullopt) << path;
        EXPECT_EQ(obdsim::whyNoText(path), "it is no plain file") << path;
    }
    EXPECT_EQ(obdsim::whyNoText("/no/such/file"), "there is no such file");
}

TEST_F(TextFile, carsRecordingsAndScenariosAreTextFiles)
{
    for (std::string const& path : {std::string("/dev/zero"), m_pipe}) {
        EXPECT_THROW(obdsim::loadVehicle(path), obdsim::SimulatorError);
        EXPECT_THROW(obdsim::replay(path), obdsim::SimulatorError);
        EXPECT_THROW(obdsim::loadScenario(path), obdsim::SimulatorError);
    }
}

TEST_F(TextFile, isOpenedForWritingWithoutWaitingAndLookedAtWithoutAChange)
{
    EXPECT_EQ(obdsim::keepForWriting(m_pipe), nullptr);
    EXPECT_EQ(obdsim::openForWriting(m_pipe), nullptr);
    EXPECT_EQ(obdsim::keepForWriting("/no/such/folder/file"), nullptr);
    std::FILE* const kept = obdsim::keepForWriting(m_file);
    ASSERT_NE(kept, nullptr);
    std::fclose(kept);
    EXPECT_EQ(obdsim::readTextFile(m_file), "12345");
    std::FILE* const file = obdsim::openForWriting(m_file);
    ASSERT_NE(file, nullptr);
    std::fputs("6", file);
    std::fclose(file);
    EXPECT_EQ(obdsim::readTextFile(m_file), "6");
}

TEST_F(TextFile, isOpenedWhereStandardInputIsClosed)
{
    testsupport::ClosedInput const closed;
    for (auto* const open : {obdsim::keepForWriting, obdsim::openForWriting}) {
        std::FILE* const file = open(m_file);
        ASSERT_NE(file, nullptr);
        EXPECT_EQ(::fileno(file), STDIN_FILENO);
        std::fclose(file);
    }
    EXPECT_TRUE(testsupport::ClosedInput::isFree());
}

TEST_F(TextFile, traceToAPipeThatNobodyReadsIsRefusedAndAFullDiskIsNoted)
{
    EXPECT_THROW(obdsim::TraceFile{m_pipe}, obdsim::SimulatorError);
    obdsim::TraceFile full("/dev/full");
    full.write(obdsim::Time(0), 1, '>', "ATI\r");
    EXPECT_TRUE(full.failed());
    obdsim::TraceFile good(m_file);
    good.write(obdsim::Time(1500), 2, '<', "OK\r\n\\\x01 ~\x7F\xFF");
    EXPECT_FALSE(good.failed());
    std::ifstream in(m_file);
    std::string line;
    std::getline(in, line);
    EXPECT_EQ(line, "0.001500 2 < OK\\r\\n\\\\\\x01 ~\\x7F\\xFF");
}

/// Whether the end of this process that writes to the pipe waits for its reader.
bool waitsForItsReader(std::string const& pipe)
{
    struct stat wanted
    {};
    EXPECT_EQ(::stat(pipe.c_str(), &wanted), 0);
    for (int file = 3; file < 256; ++file) {
        struct stat info
        {};
        bool const same = ::fstat(file, &info) == 0 && info.st_ino == wanted.st_ino && info.st_dev == wanted.st_dev;
        int const flags = ::fcntl(file, F_GETFL);
        if (same && (flags & O_ACCMODE) == O_WRONLY) {
            return (flags & O_NONBLOCK) == 0;
        }
    }
    ADD_FAILURE() << "nothing writes to " << pipe;
    return false;
}

TEST_F(TextFile, traceToAPipeLosesNothingWhenItsReaderIsSlow)
{
    int const reader = ::open(m_pipe.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    {
        obdsim::TraceFile const trace(m_pipe);
        EXPECT_TRUE(waitsForItsReader(m_pipe));
    }
    char byte = 0;
    EXPECT_EQ(::read(reader, &byte, 1), 0) << "its end is the pipe's";
    ::close(reader);
}

TEST_F(TextFile, traceTakesThePlaceOfTheOneBefore)
{
    std::ofstream(m_file) << std::string(1000, 'x');
    {
        obdsim::TraceFile trace(m_file);
        trace.write(obdsim::Time(0), 1, '>', "ATI\r");
    }
    EXPECT_EQ(obdsim::readTextFile(m_file), "0.000000 1 > ATI\\r\n");
}

} // namespace
