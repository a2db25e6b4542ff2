// Ports that another process really holds, and the order in which rates are tried.

#include "libvelmora/port/opening/portsearch.h"
#include "libvelmora/port/serialport.h"
#include "tests/libvelmora/port/asuser.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <csignal>
#include <fstream>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/wait.h>

namespace {

using testing::ElementsAre;
using velmora::PortSearch;
using velmora::SerialProbe;
using velmora::test::asUser;
using velmora::test::ScriptedDevice;
using Outcome = SerialProbe::Outcome;

// A program that has taken a line for itself, until it is ended.
class Holder
{
public:
    explicit Holder(std::string const& device)
    {
        int ends[2] = {-1, -1};
        if (::pipe(ends) != 0) {
            return;
        }
        m_process = ::fork();
        if (m_process == 0) {
            ::prctl(PR_SET_PDEATHSIG, SIGKILL);
            int const line = ::open(device.c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
            char const done = ::ioctl(line, TIOCEXCL) == 0 ? 'y' : 'n';
            ::_exit(::write(ends[1], &done, 1) == 1 ? ::pause() : 1);
        }
        char done = 'n';
        m_holds = ::read(ends[0], &done, 1) == 1 && done == 'y';
        ::close(ends[0]);
        ::close(ends[1]);
    }
    ~Holder()
    {
        ::kill(m_process, SIGKILL);
        ::waitpid(m_process, nullptr, 0);
    }
    Holder(Holder const&) = delete;
    Holder& operator=(Holder const&) = delete;

    bool holds() const { return m_holds; }
    pid_t process() const { return m_process; }

private:
    pid_t m_process = -1;
    bool m_holds = false;
};

TEST(HeldPort, ThatAnotherProgramHasTakenForItselfIsNotAsked)
{
    ScriptedDevice const device("ELM327 v1.5\r\r>", B38400);
    Holder const holder(device.path());
    ASSERT_TRUE(holder.holds());
    auto const outcome = [&device] {
        return static_cast<int>(velmora::probeSerialPort(device.path(), {38400}).outcome);
    };
    EXPECT_EQ(asUser(device.path(), true, outcome), static_cast<int>(Outcome::Held)) << "EBUSY";
    EXPECT_EQ(outcome(), static_cast<int>(Outcome::Held)) << "whom the system would let pass";
    EXPECT_EQ(device.received(), "");
    PortSearch search;
    search.ports = {{device.path(), ""}};
    try {
        velmora::findAdapter(search);
        FAIL();
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.hints()[0], device.path() + " is held by another program; by which is not readable");
    }
    EXPECT_EQ(asUser(device.path(), true, outcome), static_cast<int>(Outcome::Held)) << "it is still the other's";
}

TEST(HeldPort, IsNamedByTheLockFileOfALivingProcess)
{
    ScriptedDevice const device("ELM327 v1.5\r\r>", B38400);
    testsupport::TemporaryFolder const locks;
    std::string const file = locks.path() / ("LCK.." + std::filesystem::path(device.path()).filename().string());
    velmora::HolderPlaces const places{{locks.path()}, "/proc"};
    {
        Holder const holder(device.path());
        std::ofstream(file) << fmt::format("{:10}\n", holder.process());
        SerialProbe const probe = velmora::probeSerialPort(device.path(), {38400}, {}, {}, places);
        EXPECT_EQ(probe.outcome, Outcome::Held);
        EXPECT_THAT(probe.text, testing::EndsWith(fmt::format("(process {})", holder.process())));
        velmora::HolderPlaces const unreadable{{locks.path()}, locks.path() / "none"};
        SerialProbe const unknown = velmora::probeSerialPort(device.path(), {38400}, {}, {}, unreadable);
        EXPECT_EQ(unknown.outcome, Outcome::Held) << "by whom is not readable";
        EXPECT_EQ(unknown.text, "");
    }
    EXPECT_EQ(device.received(), "");
}

TEST(HeldPort, IsLeftToOthersBehindTheLastVisit)
{
    ScriptedDevice const device("ELM327 v1.5\r\r>", B38400); // keeps its line open, as simulated adapters do
    auto const open = [&device] {
        try {
            velmora::openSerialPort({device.path(), 38400});
            return 0;
        } catch (velmora::Error const&) {
            return 1;
        }
    };
    EXPECT_EQ(asUser(device.path(), true, open), 0);
    EXPECT_EQ(asUser(device.path(), true, open), 0);
    velmora::probeSerialPort(device.path(), {38400});
    EXPECT_EQ(asUser(device.path(), true, open), 0);
}

// Something that answers at each rate, and as no adapter does.
TEST(LineRates, AreTriedInTheirOrderAndThatOfTheLastTimeFirst)
{
    ScriptedDevice const console("switch>", B0);
    PortSearch search;
    search.ports = {{console.path(), ""}};
    EXPECT_THROW(velmora::findAdapter(search), velmora::Error);
    EXPECT_THAT(console.rates(), ElementsAre(B38400, B115200, B9600, B230400, B57600, B500000));

    ScriptedDevice const known("switch>", B0);
    search.ports = {{known.path(), ""}};
    search.last = velmora::SerialAddress{known.path(), 9600};
    EXPECT_THROW(velmora::findAdapter(search), velmora::Error);
    EXPECT_THAT(known.rates(), ElementsAre(B9600, B38400, B115200, B230400, B57600, B500000));

    ScriptedDevice const named("switch>", B0);
    search.ports = {{named.path(), ""}};
    search.baud = 57600;
    EXPECT_THROW(velmora::findAdapter(search), velmora::Error);
    EXPECT_THAT(named.rates(), ElementsAre(B57600));
}

} // namespace
