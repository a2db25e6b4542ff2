// What the main thread waits for, and the half second that a link gets to end.
#include "libvelmora/session/deadline.h"
#include "libvelmora/session/dispatchloop.h"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

namespace {

using namespace std::chrono_literals;
using velmora::Deadline;
using velmora::DispatchLoop;

std::chrono::steady_clock::time_point in(std::chrono::milliseconds time)
{
    return std::chrono::steady_clock::now() + time;
}

TEST(DispatchLoop, AsksItsConditionAfterEachDispatchAndWake)
{
    DispatchLoop loop;
    int asked = 0;
    auto const holdsAt = [&asked](int time) { return [&asked, time] { return ++asked >= time; }; };
    EXPECT_TRUE(loop.runUntil(holdsAt(1), in(-1h))) << "what holds already needs no time";
    EXPECT_EQ(asked, 1);
    EXPECT_FALSE(loop.runUntil(holdsAt(99), in(2ms)));
    EXPECT_EQ(asked, 2) << "nothing has happened";
    loop.wake();
    loop.wake();
    EXPECT_FALSE(loop.runUntil(holdsAt(99), in(2ms)));
    EXPECT_EQ(asked, 4) << "once at the beginning, once for the wake";
    int heard = 0;
    loop.setListener([&heard] { ++heard; });
    loop.onDispatchRequested();
    loop.setListener(nullptr);
    loop.onDispatchRequested();
    EXPECT_EQ(heard, 1);
    EXPECT_FALSE(loop.runUntil(holdsAt(99), in(2ms)));
    EXPECT_EQ(asked, 6);
}

TEST(DispatchLoop, IsWokenFromAnotherThread)
{
    for (bool const limited : {false, true}) {
        DispatchLoop loop;
        std::atomic<bool> done = false;
        std::thread waker([&] {
            std::this_thread::sleep_for(1ms);
            done = true;
            limited ? loop.wake() : loop.onDispatchRequested();
        });
        EXPECT_TRUE(loop.runUntil([&done] { return done.load(); },
                                  limited ? in(1h) : std::chrono::steady_clock::time_point::max()));
        waker.join();
    }
}

TEST(Deadline, ExpiresOnceAfterHalfASecond)
{
    std::atomic<int> stopped = 0;
    Deadline early([&stopped] { ++stopped; });
    early.start();
    early.start();
    early.stop();
    early.start();
    std::atomic<int> expired = 0;
    {
        Deadline const never([&expired] { ++expired; });
    }
    auto const begin = std::chrono::steady_clock::now();
    Deadline late([&expired] { ++expired; });
    late.start();
    while (expired == 0) {
        std::this_thread::sleep_for(1ms);
    }
    EXPECT_GE(std::chrono::steady_clock::now() - begin, 500ms);
    late.stop();
    late.stop();
    EXPECT_EQ(expired, 1);
    EXPECT_EQ(stopped, 0);
}

} // namespace
