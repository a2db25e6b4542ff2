#include "libvelmora/watch/servicenotify.h"
#include "tests/libvelmora/watch/servicemanager.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace {

using namespace std::chrono_literals;
using velmora::ServiceNotify;
using velmora::test::Manager;

TEST(ServiceNotify, TellsTheManagerByEitherKindOfSocket)
{
    testsupport::TemporaryFolder const folder;
    for (std::string const& name : {folder.file("notify"), "@velmora-notify-" + std::to_string(::getpid())}) {
        Manager const manager(name);
        ServiceNotify const notify;
        notify.tell("READY=1\nSTATUS=up");
        EXPECT_EQ(manager.heard(), "READY=1\nSTATUS=up") << name;
        EXPECT_EQ(manager.heard(), "-");
    }
    ServiceNotify().tell("READY=1"); // nobody listens
    std::string longest = folder.file("");
    longest += std::string(107 - longest.size(), 'x');
    Manager const far(longest);
    ServiceNotify().tell("READY=1");
    EXPECT_EQ(far.heard(), "READY=1") << "as long as a name may be";
    long const before = testsupport::openDescriptors();
    ServiceNotify().tell("STOPPING=1");
    EXPECT_EQ(testsupport::openDescriptors(), before);
    ::setenv("NOTIFY_SOCKET", (longest + "x").c_str(), 1);
    ServiceNotify().tell("READY=1");
    EXPECT_EQ(far.heard(), "STOPPING=1");
    EXPECT_EQ(far.heard(), "-") << "the name was another";
    ::setenv("NOTIFY_SOCKET", std::string(200, 'x').c_str(), 1);
    ServiceNotify().tell("READY=1"); // no socket has so long a name
    ::unsetenv("NOTIFY_SOCKET");
}

TEST(ServiceNotify, TellsThatTheWorkGoesOnTwiceAPeriod)
{
    Manager const manager("@velmora-watchdog-" + std::to_string(::getpid()));
    ::setenv("WATCHDOG_USEC", "2000000", 1);
    ::setenv("WATCHDOG_PID", std::to_string(::getpid()).c_str(), 1);
    ServiceNotify notify;
    std::chrono::steady_clock::time_point const start(1h);
    notify.alive(start);
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
    notify.alive(start + 999ms);
    EXPECT_EQ(manager.heard(), "-");
    notify.alive(start + 1s);
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
    for (char const* const period : {"0", "-1", "2x", ""}) {
        ::setenv("WATCHDOG_USEC", period, 1);
        ServiceNotify().alive(start);
        EXPECT_EQ(manager.heard(), "-") << period;
    }
    ::setenv("WATCHDOG_USEC", "1", 1);
    ::setenv("WATCHDOG_PID", "1", 1);
    ServiceNotify().alive(start);
    EXPECT_EQ(manager.heard(), "-") << "the watchdog is another process's";
    ::unsetenv("WATCHDOG_PID");
    ServiceNotify().alive(start);
    EXPECT_EQ(manager.heard(), "WATCHDOG=1");
}

} // namespace
