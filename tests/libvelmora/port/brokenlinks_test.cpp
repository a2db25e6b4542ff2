// Links that break on one way only, and what a port of a socket leaves alone once it is closed.

#include "libvelmora/port/asioport.h"
#include "libvelmora/port/doorbell.h"

#include <asio/buffer.hpp>
#include <asio/local/connect_pair.hpp>
#include <asio/local/stream_protocol.hpp>
#include <asio/write.hpp>
#include <gtest/gtest.h>

#include <cerrno>
#include <filesystem>
#include <poll.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>

namespace {

using namespace std::chrono_literals;
using EndSocket = asio::local::stream_protocol::socket;
using Moment = velmora::IPulledPort::Moment;

// A port at one end of a socket, whose number is known; the test holds the other.
struct EndsRig
{
    EndsRig()
    {
        auto context = std::make_unique<asio::io_context>();
        EndSocket mine(*context);
        asio::local::connect_pair(mine, other);
        descriptor = mine.native_handle();
        port = std::make_unique<velmora::AsioPort<EndSocket>>(std::move(context), std::move(mine));
    }

    asio::io_context otherContext;
    EndSocket other{otherContext};
    int descriptor = -1;
    std::unique_ptr<velmora::AsioPort<EndSocket>> port;
};

Moment soon(std::chrono::milliseconds time)
{
    return std::chrono::steady_clock::now() + time;
}

bool rings(velmora::Doorbell const& bell)
{
    pollfd state{bell.descriptor(), POLLIN, 0};
    return ::poll(&state, 1, 0) == 1;
}

std::ptrdiff_t openDescriptors()
{
    return std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
}

TEST(Doorbell, RingsUntilItIsHushed)
{
    std::ptrdiff_t const before = openDescriptors();
    {
        velmora::Doorbell const bell;
        EXPECT_FALSE(rings(bell));
        bell.hush(); // which waits for nothing
        bell.ring();
        bell.ring();
        EXPECT_TRUE(rings(bell));
        bell.hush();
        EXPECT_FALSE(rings(bell));
    }
    EXPECT_EQ(openDescriptors(), before);
}

TEST(BrokenLink, ThatTakesNothingAnyMoreIsGoneThoughItCouldStillBring)
{
    EndsRig rig;
    std::string bytes;
    errno = EPIPE; // of whatever went before
    rig.port->write("");
    EXPECT_TRUE(rig.port->isUp());
    rig.other.shutdown(EndSocket::shutdown_receive);
    EXPECT_TRUE(rig.port->isUp()) << "nothing tells yet";
    rig.port->write("ATI\r");
    EXPECT_FALSE(rig.port->isUp());
    EXPECT_FALSE(rig.port->pull(bytes, soon(20s)));
}

TEST(BrokenLink, IsFoundByWhoWaitsForItsBytes)
{
    EndsRig rig;
    std::string bytes;
    EXPECT_TRUE(rig.port->pull(bytes, soon(0ms)));
    asio::write(rig.other, asio::buffer(std::string("last>")));
    rig.other.close();
    EXPECT_TRUE(rig.port->pull(bytes, soon(20s)));
    EXPECT_EQ(bytes, "last>") << "what came before the end is brought";
    EXPECT_FALSE(rig.port->pull(bytes, soon(0ms))) << "by a look, too";
    EXPECT_FALSE(rig.port->isUp());
    EXPECT_EQ(bytes, "last>");
}

// The system gives the number of what was closed to what is opened next.
TEST(ClosedPort, WritesNothingToWhatHasItsDescriptorNow)
{
    EndsRig rig;
    rig.port->close();
    int ends[2];
    ASSERT_EQ(::socketpair(AF_UNIX, SOCK_STREAM, 0, ends), 0);
    if (ends[0] != rig.descriptor) {
        ASSERT_EQ(::dup2(ends[0], rig.descriptor), rig.descriptor);
    }
    rig.port->write("ATI\r");
    std::string bytes;
    EXPECT_FALSE(rig.port->pull(bytes, soon(0ms)));
    EXPECT_FALSE(rig.port->isUp());
    pollfd state{ends[1], POLLIN, 0};
    EXPECT_EQ(::poll(&state, 1, 0), 0);
    rig.port.reset();
    EXPECT_EQ(::write(ends[1], "x", 1), 1) << "and closes it not again";
    ::close(ends[0]);
    ::close(ends[1]);
    if (ends[0] != rig.descriptor) {
        ::close(rig.descriptor);
    }
}

TEST(InterruptedPull, IsOneAloneAndTheNextWaitsWithoutTurning)
{
    EndsRig rig;
    std::string bytes;
    rig.port->interrupt();
    EXPECT_TRUE(rig.port->pull(bytes, soon(20s)));
    EXPECT_EQ(bytes, "");
    rusage before{};
    rusage after{};
    ::getrusage(RUSAGE_THREAD, &before);
    EXPECT_TRUE(rig.port->pull(bytes, soon(100ms)));
    ::getrusage(RUSAGE_THREAD, &after);
    auto const used = [](rusage const& usage) {
        return (usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) * 1000 +
               (usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) / 1000;
    };
    EXPECT_LT(used(after) - used(before), 50) << "milliseconds of the processor";
    EXPECT_EQ(bytes, "");
    asio::write(rig.other, asio::buffer(std::string("41 0C>")));
    EXPECT_TRUE(rig.port->pull(bytes, soon(20s)));
    EXPECT_EQ(bytes, "41 0C>");
}

TEST(InterruptedPull, EndsFromAnotherThread)
{
    EndsRig rig;
    auto const start = std::chrono::steady_clock::now();
    std::thread other([&rig] {
        std::string bytes;
        EXPECT_TRUE(rig.port->pull(bytes, soon(20s)));
        EXPECT_EQ(bytes, "");
    });
    rig.port->interrupt();
    other.join();
    EXPECT_LT(std::chrono::steady_clock::now() - start, 10s);
}

} // namespace
