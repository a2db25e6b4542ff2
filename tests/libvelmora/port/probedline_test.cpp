// What is asked on a serial line, how it is read, and how the line stands meanwhile and afterwards.

#include "libvelmora/port/opening/portsearch.h"
#include "libvelmora/port/serialport.h"
#include "tests/libvelmora/port/asuser.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sys/file.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using velmora::SerialProbe;
using velmora::test::ScriptedDevice;
using Found = SerialProbe::Outcome;

std::string foundAs(std::string const& answer)
{
    ScriptedDevice const device(answer, B38400);
    SerialProbe const probe = velmora::probeSerialPort(device.path(), {38400});
    EXPECT_EQ(probe.baud, probe.outcome == Found::Adapter ? 38400U : 0U) << answer;
    std::string const kind = probe.outcome == Found::Adapter      ? "adapter: "
                             : probe.outcome == Found::OtherThing ? "other: "
                                                                  : "silent: ";
    return kind + probe.text;
}

TEST(ProbedLine, IsAnAdaptersByThePromptInALineOfItsOwn)
{
    EXPECT_EQ(foundAs("ELM327 v1.5\r\r>"), "adapter: ELM327 v1.5");
    EXPECT_EQ(foundAs("ELM327 v1.5\n>"), "adapter: ELM327 v1.5");
    EXPECT_EQ(foundAs(std::string("ELM327 v1.5\0>", 13)), "adapter: ELM327 v1.5");
    EXPECT_EQ(foundAs("ATI\rELM327 v1.5\r\r>"), "adapter: ELM327 v1.5") << "its echo is no word of it";
    EXPECT_EQ(foundAs("ELM327 v1.5>"), "other: ELM327 v1.5");
    EXPECT_EQ(foundAs(">x"), "other: x") << "nothing stands before it";
    EXPECT_EQ(foundAs("\r\r>"), "silent: ") << "a prompt alone names nobody";
}

TEST(ProbedLine, IsAskedAgainWhereTheFirstQuestionWasNotUnderstood)
{
    ScriptedDevice device("ELM327 v2.1\r\r>", B38400);
    device.answerFirst("?\r\r>"); // what had stood in its line made an unknown command of it
    EXPECT_EQ(velmora::probeSerialPort(device.path(), {38400}).text, "ELM327 v2.1");
    EXPECT_EQ(device.received(), "ATI\rATI\r");
    ScriptedDevice const console("what?>", B38400);
    EXPECT_EQ(velmora::probeSerialPort(console.path(), {38400}).text, "what?");
    EXPECT_EQ(console.received(), "ATI\r") << "only who has a prompt";
}

TEST(ProbedLine, IsReadToThePromptHoweverItComes)
{
    ScriptedDevice slow("ELM v1\r>", B38400);
    slow.spell();
    EXPECT_EQ(velmora::probeSerialPort(slow.path(), {38400}).text, "ELM v1");
    ScriptedDevice const stale("ELM327 v1.5\r\r>", B38400);
    stale.say("\r\r>\n");
    EXPECT_EQ(velmora::probeSerialPort(stale.path(), {38400}).text, "ELM327 v1.5") << "what was said before is dropped";
    ScriptedDevice flooding("", B38400);
    flooding.answerFirst(std::string(3900, 'x') + ">");
    EXPECT_EQ(velmora::probeSerialPort(flooding.path(), {38400}).text.size(), 3900U);
}

TEST(ProbedLine, IsHeldOpenRawAndLeftAsItWas)
{
    ScriptedDevice const device("ELM327 v1.5\r\r>", B19200);
    termios before = device.settings();
    std::ptrdiff_t const open = std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
    std::vector<unsigned int> tried;
    SerialProbe const probe =
        velmora::probeSerialPort(device.path(), {12345, 19200}, [&tried](unsigned int baud) { tried.push_back(baud); });
    EXPECT_EQ(probe.baud, 19200U);
    EXPECT_THAT(tried, ElementsAre(19200U)) << "the other is no rate of lines";
    termios const asked = device.settingsWhenAsked();
    EXPECT_EQ(asked.c_cflag & (CLOCAL | CREAD | CRTSCTS), static_cast<tcflag_t>(CLOCAL | CREAD));
    EXPECT_EQ(asked.c_lflag & (ECHO | ICANON), 0U);
    EXPECT_EQ(::cfgetispeed(&asked), static_cast<speed_t>(B19200));
    EXPECT_EQ(device.settings().c_lflag, before.c_lflag);
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {}), open);
    SerialProbe const stopped = velmora::probeSerialPort(device.path(), {38400, 19200}, {}, [] { return true; });
    EXPECT_EQ(stopped.outcome, Found::Silent);
    EXPECT_EQ(device.received(), "ATI\r") << "not asked a second time";
}

// The other end of a line goes in the midst of an answer.
TEST(ProbedLine, ThatIsPulledOutIsNoAdapter)
{
    int const master = ::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_TRUE(::grantpt(master) == 0 && ::unlockpt(master) == 0);
    std::string const path = ::ptsname(master);
    std::thread device([master] {
        char question[16];
        EXPECT_EQ(::read(master, question, sizeof(question)), 4);
        EXPECT_EQ(::write(master, "ELM", 3), 3);
        ::close(master);
    });
    SerialProbe const probe = velmora::probeSerialPort(path, {38400});
    device.join();
    EXPECT_TRUE(probe.outcome == Found::OtherThing || probe.outcome == Found::Silent);
    EXPECT_EQ(probe.baud, 0U);
}

TEST(ProbedLine, HasNoRateWhereNobodyWasAsked)
{
    testsupport::TemporaryFolder const folder;
    ScriptedDevice const device("ELM327 v1.5\r\r>", B38400);
    std::ofstream(folder.file("plain")) << "x";
    std::ofstream(folder.file("LCK.." + std::filesystem::path(device.path()).filename().string())) << "1\n";
    velmora::HolderPlaces const places{{folder.path()}, "/proc"};
    for (std::string const& path : {folder.file("none"), folder.file("plain"), device.path()}) {
        SerialProbe const probe = velmora::probeSerialPort(path, {38400}, {}, {}, places);
        EXPECT_NE(probe.outcome, Found::Adapter) << path;
        EXPECT_EQ(probe.baud, 0U) << path;
    }
    int const other = ::open(device.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_EQ(::flock(other, LOCK_EX | LOCK_NB), 0);
    EXPECT_EQ(velmora::probeSerialPort(device.path(), {38400}).baud, 0U);
    ::close(other);
}

TEST(SerialLine, IsSetToEightBitsAtItsRateWithoutFlowControl)
{
    ScriptedDevice const device("", B38400);
    int const line = ::open(device.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    termios odd{};
    ASSERT_EQ(::tcgetattr(line, &odd), 0);
    odd.c_cflag |= CSTOPB | CRTSCTS;
    odd.c_iflag |= IXON;
    ASSERT_EQ(::tcsetattr(line, TCSANOW, &odd), 0);
    {
        auto const port = velmora::openSerialPort({device.path(), 9600});
        termios const set = device.settings();
        EXPECT_EQ(set.c_cflag & (CSTOPB | CRTSCTS | PARENB | CSIZE), static_cast<tcflag_t>(CS8));
        EXPECT_EQ(set.c_iflag & (IXON | IXOFF), 0U);
        EXPECT_EQ(::cfgetospeed(&set), static_cast<speed_t>(B9600));
        EXPECT_EQ(::cfgetispeed(&set), static_cast<speed_t>(B9600));
    }
    ::close(line);
}

TEST(SerialLine, ThatRefusesARateIsLeftToOthers)
{
    ScriptedDevice const device("", B38400);
    auto const failure = [&device](unsigned int baud) {
        try {
            velmora::openSerialPort({device.path(), baud});
        } catch (velmora::Error const& error) {
            return std::string(error.what()) + "|" + error.hints().front();
        }
        return std::string("opened");
    };
    EXPECT_EQ(failure(12345), "The serial port " + device.path() +
                                  " refuses 12345 baud|usual rates are 9600, 38400, 57600, 115200: choose with --baud");
    auto const opens = [&failure] { return failure(38400) == "opened" ? 0 : 1; };
    EXPECT_EQ(velmora::test::asUser(device.path(), true, opens), 0);
    int const line = ::open(device.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ::ioctl(line, TIOCEXCL);
    auto const isHeld = [&failure] {
        return failure(38400).find("does another program hold") != std::string::npos ? 0 : 1;
    };
    EXPECT_EQ(velmora::test::asUser(device.path(), true, isHeld), 0);
    ::ioctl(line, TIOCNXCL);
    ::close(line);
    ASSERT_EQ(::chmod(device.path().c_str(), 0), 0);
    auto const isForbidden = [&failure] { return failure(38400).find("group dialout") != std::string::npos ? 0 : 1; };
    EXPECT_EQ(velmora::test::asUser(device.path(), false, isForbidden), 0);
    testsupport::TemporaryFolder const folder;
    try {
        velmora::openSerialPort({folder.path(), 38400});
        ADD_FAILURE();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(std::string(error.what()), folder.path().string() + " is no serial port");
    }
}

// Lines without a rate of their own, by their names; the device behind the name is any.
TEST(ProbedLine, OfAModemOrOfBluetoothIsAskedAtOneRate)
{
    testsupport::TemporaryFolder const folder;
    std::pair<char const*, std::size_t> const rows[] = {{"ttyACM0", 1}, {"rfcomm1", 1}, {"ttyUSB0", 6}};
    for (auto const& [name, asked] : rows) {
        ScriptedDevice const console("switch>", B0);
        std::filesystem::create_symlink(console.path(), folder.path() / name);
        velmora::PortSearch search;
        search.ports = {{folder.file(name), ""}};
        search.last = velmora::SerialAddress{folder.file("another"), 9600};
        EXPECT_THROW(velmora::findAdapter(search), velmora::Error);
        EXPECT_EQ(console.rates().size(), asked) << name;
        EXPECT_EQ(console.rates().front(), static_cast<speed_t>(B38400)) << "the last one's rate is that one's alone";
    }
}

TEST(ProbedLine, IsToldByWhatAnsweredThere)
{
    ScriptedDevice const wordy(std::string(41, 'w') + ">", B38400);
    ScriptedDevice const silent("", B38400);
    velmora::PortSearch search;
    search.ports = {{wordy.path(), ""}, {silent.path(), ""}};
    search.baud = 38400;
    search.last = velmora::SerialAddress{wordy.path(), 9600};
    try {
        velmora::findAdapter(search);
        ADD_FAILURE();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.hints()[0],
                  wordy.path() + " answers, but not as an adapter does (\"" + std::string(40, 'w') + "\")");
        EXPECT_EQ(error.hints()[1], "nothing answers on " + silent.path());
    }
    EXPECT_THAT(wordy.rates(), ElementsAre(static_cast<speed_t>(B38400))) << "the rate that was named";
    ASSERT_EQ(::chmod(wordy.path().c_str(), 0), 0);
    search.ports = {{wordy.path(), ""}};
    auto const isForbidden = [&search, &wordy] {
        try {
            velmora::findAdapter(search);
        } catch (velmora::Error const& error) {
            return error.hints()[0] == wordy.path() + " is not yours to open: add your user to the group dialout and "
                                                      "log in again"
                       ? 0
                       : 1;
        }
        return 1;
    };
    EXPECT_EQ(velmora::test::asUser(wordy.path(), false, isForbidden), 0);
}

} // namespace
