#include "libvelmora/port/opening/portsearch.h"
#include "simulator/server.h"
#include "simulator/simulation.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sys/file.h>
#include <termios.h>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;
using velmora::PortSearch;
using velmora::SerialAddress;
using velmora::SerialProbe;
using velmora::test::ScriptedDevice;
using Outcome = SerialProbe::Outcome;

TEST(SerialProbe, FindsTheSimulatedAdapter)
{
    auto const server = obdsim::servePseudoTerminal(obdsim::simulate({}));
    server->start();
    SerialProbe const probe = velmora::probeSerialPort(server->address(), velmora::usualRates());
    EXPECT_EQ(probe.outcome, Outcome::Adapter);
    EXPECT_EQ(probe.baud, 38400U);
    EXPECT_EQ(probe.text, "ELM327 v1.5");
}

TEST(SerialProbe, FindsTheRate)
{
    ScriptedDevice const device("ELM327 v2.1\r\r>", B115200);
    EXPECT_EQ(velmora::probeSerialPort(device.path(), {38400, 115200, 9600}).baud, 115200U);
    EXPECT_EQ(device.received(), "ATI\rATI\r");
}

TEST(SerialProbe, AModemSurvivesAndItsLineIsLeftAsItWas)
{
    ScriptedDevice const modem("56000\r\nOK\r\n", B9600);
    termios const before = modem.settings();
    SerialProbe const probe = velmora::probeSerialPort(modem.path(), {38400, 9600});
    EXPECT_EQ(probe.outcome, Outcome::OtherThing);
    EXPECT_EQ(probe.text, "56000 OK");
    EXPECT_EQ(modem.received(), "ATI\rATI\r") << "harmless, and never a carriage return alone";
    termios const after = modem.settings();
    EXPECT_EQ(before.c_cflag, after.c_cflag);
    EXPECT_EQ(before.c_lflag, after.c_lflag);
    EXPECT_EQ(before.c_iflag, after.c_iflag);
    EXPECT_EQ(before.c_oflag, after.c_oflag);
    EXPECT_EQ(::cfgetospeed(&before), ::cfgetospeed(&after));
    EXPECT_EQ(::cfgetispeed(&before), ::cfgetispeed(&after));
    EXPECT_TRUE(std::equal(std::begin(before.c_cc), std::end(before.c_cc), std::begin(after.c_cc)));
}

std::string plainFile()
{
    std::string const file = testsupport::ownPath("no-port");
    std::ofstream(file) << "text\n";
    return file;
}

TEST(SerialProbe, WhatIsNoPortIsTold)
{
    EXPECT_EQ(velmora::probeSerialPort("/dev/velmora-none", {38400}).outcome, Outcome::Missing);
    EXPECT_EQ(velmora::probeSerialPort(plainFile(), {38400}).outcome, Outcome::NoPort);
}

TEST(SerialProbe, AConsoleWithAPromptOfItsOwnIsNoAdapter)
{
    ScriptedDevice const console("ATI\r\n% Unknown command\r\nswitch>", B38400);
    SerialProbe const probe = velmora::probeSerialPort(console.path(), {38400});
    EXPECT_EQ(probe.outcome, Outcome::OtherThing);
    EXPECT_EQ(console.received(), "ATI\r");
}

// A printer that prints whatever it is sent answers nothing at all.
TEST(SerialProbe, WhatSaysNothingIsAskedOnceARateAndLeftAsItWas)
{
    ScriptedDevice const printer("", B9600);
    termios const before = printer.settings();
    EXPECT_EQ(velmora::probeSerialPort(printer.path(), {38400, 9600}).outcome, Outcome::Silent);
    EXPECT_EQ(printer.received(), "ATI\rATI\r");
    termios const after = printer.settings();
    EXPECT_EQ(before.c_lflag, after.c_lflag);
    EXPECT_EQ(::cfgetospeed(&before), ::cfgetospeed(&after));
}

// Another open file of the same line stands for another program: its lock tells, though /proc doesn't.
TEST(SerialProbe, WhatAnotherProgramHoldsIsNotAsked)
{
    ScriptedDevice const modem("OK\r\n", B38400);
    int const other = ::open(modem.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_EQ(::flock(other, LOCK_EX | LOCK_NB), 0);
    SerialProbe const probe = velmora::probeSerialPort(modem.path(), {38400});
    ::close(other);
    EXPECT_EQ(probe.outcome, Outcome::Held);
    EXPECT_EQ(probe.text, "") << "by whom is not readable";
    EXPECT_EQ(modem.received(), "");
}

// A folder that stands for /run/lock, /proc and a device.
class PortHolderTest : public testing::Test
{
protected:
    PortHolderTest()
    {
        fs::create_directories(m_root / "locks");
        fs::create_directories(m_root / "proc/4711/fd");
        std::ofstream(m_root / "proc/4711/comm") << "minicom\n";
        std::ofstream(m_root / "ttyUSB0");
    }

    std::optional<std::string> holder() const
    {
        return velmora::findPortHolder(m_root / "ttyUSB0", {{m_root / "locks"}, m_root / "proc"});
    }

    testsupport::TemporaryFolder const m_folder;
    fs::path const m_root = fs::canonical(m_folder.path());
};

TEST_F(PortHolderTest, IsFoundByItsOpenFile)
{
    EXPECT_EQ(holder(), std::nullopt);
    fs::create_symlink(m_root / "ttyUSB0", m_root / "proc/4711/fd/3");
    EXPECT_EQ(holder(), "minicom (process 4711)");
    EXPECT_EQ(
        velmora::probeSerialPort(m_root / "ttyUSB0", {38400}, {}, {}, {{m_root / "locks"}, m_root / "proc"}).outcome,
        Outcome::Held);
}

TEST_F(PortHolderTest, IsFoundByItsLockUnlessItHasGone)
{
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << "      4711\n";
    EXPECT_EQ(holder(), "minicom (process 4711)");
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << "      4712\n";
    EXPECT_EQ(holder(), std::nullopt);
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << "rubbish\n";
    EXPECT_EQ(holder(), std::nullopt);
    fs::create_directories(m_root / "proc/0");
    fs::create_directories(m_root / "proc/1");
    fs::create_directories(m_root / "proc" / std::to_string(::getpid()));
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << "0\n";
    EXPECT_EQ(holder(), std::nullopt);
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << ::getpid();
    EXPECT_EQ(holder(), std::nullopt) << "its own lock stands in nobody's way";
    std::ofstream(m_root / "locks/LCK..ttyUSB0") << "1\n";
    EXPECT_EQ(holder(), "a program (process 1)") << "whose name is not readable";
}

TEST_F(PortHolderTest, IsAnotherProcess)
{
    for (std::string const& process : {std::string("self"), std::to_string(::getpid())}) {
        fs::create_directories(m_root / "proc" / process / "fd");
        fs::create_symlink(m_root / "ttyUSB0", m_root / "proc" / process / "fd/3");
        EXPECT_EQ(holder(), std::nullopt) << process;
    }
    fs::create_symlink(m_root / "elsewhere", m_root / "proc/4711/fd/3");
    EXPECT_EQ(holder(), std::nullopt) << "who has something else open";
    fs::create_symlink(m_root / "ttyUSB0", m_root / "proc/4711/fd/4");
    EXPECT_EQ(holder(), "minicom (process 4711)");
}

TEST(PortSearch, TriesTheLastGoodOneFirstAndPassesOthersBy)
{
    ScriptedDevice const modem("OK\r\n", B38400);
    auto const server = obdsim::servePseudoTerminal(obdsim::simulate({}));
    server->start();
    std::string told;
    PortSearch search;
    search.ports = {{"/dev/velmora-none", ""}, {modem.path(), ""}, {server->address(), ""}};
    search.baud = 38400;
    search.tell = [&](std::string const& line) { told += line; };
    EXPECT_EQ(velmora::findAdapter(search), velmora::PortAddress(SerialAddress{server->address(), 38400}));
    EXPECT_EQ(told, fmt::format("Trying {} at 38400 baud ...\nTrying {} at 38400 baud ...\n", modem.path(),
                                server->address()));
    told.clear();
    search.last = SerialAddress{server->address(), 38400};
    velmora::findAdapter(search);
    EXPECT_EQ(told, fmt::format("Trying {} at 38400 baud ...\n", server->address()));
}

// Neither is opened, and each is named with the program that holds it.
TEST_F(PortHolderTest, ASearchPassesHeldPortsByAndNamesTheirHolders)
{
    ScriptedDevice const modem("ELM327 v1.5\r\r>", B38400);
    std::ofstream(m_root / ("locks/LCK.." + fs::path(modem.path()).filename().string())) << "      4711\n";
    fs::create_symlink(m_root / "ttyUSB0", m_root / "proc/4711/fd/3");
    PortSearch search;
    search.ports = {{m_root / "ttyUSB0", ""}, {modem.path(), ""}};
    search.baud = 38400;
    search.places = {{m_root / "locks"}, m_root / "proc"};
    try {
        velmora::findAdapter(search);
        FAIL();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.hints()[0], (m_root / "ttyUSB0").string() + " is held by minicom (process 4711)");
        EXPECT_EQ(error.hints()[1], modem.path() + " is held by minicom (process 4711)");
    }
    EXPECT_EQ(modem.received(), "");
}

TEST(PortSearch, TellsOfEachPortWhatWasFound)
{
    ScriptedDevice const modem("OK\r\n", B38400);
    PortSearch search;
    search.ports = {{plainFile(), ""}, {modem.path(), ""}};
    search.baud = 38400;
    try {
        velmora::findAdapter(search);
        FAIL();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::PortFailed);
        EXPECT_EQ(error.hints()[0], plainFile() + " is no serial port");
        EXPECT_EQ(error.hints()[1], modem.path() + " answers, but not as an adapter does (\"OK\")");
    }
    EXPECT_THROW(velmora::findAdapter({}), velmora::Error);
    search.stop = [] { return true; };
    EXPECT_THROW(velmora::findAdapter(search), velmora::Error);
}

} // namespace
