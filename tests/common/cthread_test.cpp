#include "tests/support/logcapture.h"

#include <common/cthread.h>

#include <gtest/gtest.h>

#include <atomic>
#include <optional>

namespace {

using tervex::CThread;

TEST(CThread, RunsTheFunctionWithItsArgument)
{
    CThread thread("worker");
    std::atomic<int> result{0};
    EXPECT_TRUE(thread.start([](std::atomic<int>* out) { *out = 42; }, &result));
    thread.join();
    EXPECT_EQ(result, 42);
}

TEST(CThread, JoinWithoutAThreadDoesNothing)
{
    support::LogCapture log;
    CThread thread("worker");
    thread.join();
    EXPECT_TRUE(log.lines().empty());
}

TEST(CThread, StartOnARunningThreadIsRefused)
{
    CThread thread("worker");
    std::atomic<bool> stop{false};
    std::atomic<int> ran{0};
    auto const body = [&](std::atomic<bool>* flag) {
        ++ran;
        while (!*flag) {
            std::this_thread::yield();
        }
    };
    EXPECT_TRUE(thread.start(body, &stop));
    EXPECT_FALSE(thread.start(body, &stop));
    stop = true;
    thread.join();
    EXPECT_EQ(ran, 1);
    EXPECT_TRUE(thread.start(body, &stop));
    thread.join();
    EXPECT_EQ(ran, 2);
}

TEST(CThread, DestroyedWhileJoinableTellsItsNameAndWaits)
{
    support::LogCapture log;
    std::atomic<bool> finished{false};
    {
        std::optional<CThread> thread;
        thread.emplace("worker");
        ASSERT_TRUE(thread->start(
            [](std::atomic<bool>* flag) {
                for (int i = 0; i < 1000; ++i) {
                    std::this_thread::yield();
                }
                *flag = true;
            },
            &finished));
    }
    EXPECT_TRUE(finished);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR worker still joinable"});
}

} // namespace
