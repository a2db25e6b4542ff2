#include "libobd/dispatch/keepalivedispatchable.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/fakework.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <limits>

namespace {

class KeepAlive : public testing::TestWithParam<unsigned int>
{
protected:
    support::LogCapture log;
    support::DispatcherRig rig{GetParam()};

    void SetUp() override { rig.proxy->answer("01 01", "41 01 00 07 65 00"); }

    // Starts the worker, and leaves it idle with nothing open for the application.
    void startWorker()
    {
        auto const work = std::make_shared<support::FakeWork>();
        ASSERT_TRUE(rig.dispatcher.update(work));
        ASSERT_TRUE(rig.loop.awaitRequested(1));
        ASSERT_TRUE(rig.clock.awaitIdleRound());
        rig.loop.runPending();
    }

    int sent() { return rig.proxy->count("01 01"); }
};

// The counter of milliseconds somewhere, just before it wraps, and where 0 is "long ago".
INSTANTIATE_TEST_SUITE_P(At, KeepAlive,
                         testing::Values(1000U, std::numeric_limits<unsigned int>::max() - 2000U, 900000U));

TEST_P(KeepAlive, GoesOutOnceAfter5001MillisecondsWithoutWorkThroughDispatch)
{
    startWorker();
    ASSERT_TRUE(rig.clock.advanceIdle(5000));
    EXPECT_EQ(rig.loop.requested(), 1) << "not yet";
    ASSERT_TRUE(rig.clock.advanceIdle(1));
    EXPECT_EQ(rig.loop.requested(), 2);
    EXPECT_EQ(sent(), 0) << "only through the application's thread";
    rig.dispatcher.dispatch();
    ASSERT_TRUE(rig.loop.awaitRequested(3));
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    EXPECT_EQ(sent(), 1);
    rig.dispatcher.dispatch();
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    EXPECT_EQ(sent(), 1);
    EXPECT_TRUE(log.lines().empty());
}

TEST_P(KeepAlive, WithoutDispatchNoneGoesOutAndTheRequestComesOnceIn5Seconds)
{
    startWorker();
    for (int i = 1; i <= 10; ++i) {
        ASSERT_TRUE(rig.clock.advanceIdle(5000));
        EXPECT_EQ(rig.loop.requested(), i);
        ASSERT_TRUE(rig.clock.advanceIdle(1));
        EXPECT_EQ(rig.loop.requested(), i + 1);
    }
    EXPECT_EQ(sent(), 0);
    rig.dispatcher.dispatch();
    ASSERT_TRUE(rig.loop.awaitRequested(12));
    EXPECT_EQ(sent(), 1) << "however many came due, one goes out";
}

TEST_P(KeepAlive, DoesNotGoOutBecauseTheWorkerHasJustStarted)
{
    // The first work is gone, so that the worker finds an empty queue before it has completed anything.
    ASSERT_TRUE(rig.dispatcher.update(std::weak_ptr<support::FakeWork>()));
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    ASSERT_TRUE(rig.clock.advanceIdle(5000));
    rig.loop.runPending();
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    EXPECT_EQ(rig.loop.requested(), 0);
    EXPECT_EQ(sent(), 0);
}

TEST_P(KeepAlive, OtherWorkPutsItOff)
{
    startWorker();
    ASSERT_TRUE(rig.clock.advanceIdle(4000));
    auto const work = std::make_shared<support::FakeWork>();
    ASSERT_TRUE(rig.dispatcher.update(work));
    ASSERT_TRUE(rig.loop.awaitRequested(2));
    ASSERT_TRUE(rig.clock.advanceIdle(4000));
    EXPECT_EQ(rig.loop.requested(), 2);
    ASSERT_TRUE(rig.clock.advanceIdle(1001));
    EXPECT_EQ(rig.loop.requested(), 3);
}

TEST_P(KeepAlive, OneGoesOutAfterEachIdlePeriodAlsoAfterAFailure)
{
    rig.proxy->answerOnce("01 01", "7F 01 12");
    startWorker();
    for (int i = 1; i <= 3; ++i) {
        ASSERT_TRUE(rig.clock.advanceIdle(5001));
        ASSERT_TRUE(rig.loop.runUntil([&] { return sent() == i; }));
        ASSERT_TRUE(rig.clock.awaitIdleRound());
        rig.loop.runPending();
    }
    std::vector<std::string> const lines = log.lines();
    EXPECT_EQ(std::count(lines.begin(), lines.end(), "ERROR Keep alive dispatch failed"), 1);
    EXPECT_EQ(rig.proxy->lastTimeout(), 2500U);
}

TEST_P(KeepAlive, ThatIsDueIsDroppedByACancel)
{
    startWorker();
    ASSERT_TRUE(rig.clock.advanceIdle(5001));
    rig.dispatcher.cancel();
    rig.loop.runPending();
    startWorker();
    EXPECT_EQ(sent(), 0);
}

TEST(KeepAliveDispatchable, AsksTheVehicleOnlyWithAProxyAndUntilItIsCancelled)
{
    support::LogCapture const log;
    auto const proxy = std::make_shared<support::FakeProxy>();
    proxy->answer("01 01", "41 01 00 07 65 00");
    obd::KeepAliveDispatchable keepAlive;
    keepAlive.execute(nullptr);
    EXPECT_EQ(proxy->count(), 0);
    keepAlive.execute(proxy);
    EXPECT_EQ(proxy->count("01 01"), 1);
    keepAlive.finish();
    keepAlive.cancel();
    keepAlive.execute(proxy);
    EXPECT_EQ(proxy->count("01 01"), 1);
    EXPECT_TRUE(log.lines().empty());
}

TEST(KeepAliveDispatchable, FailureIsTold)
{
    support::LogCapture const log;
    auto const proxy = std::make_shared<support::FakeProxy>();
    obd::KeepAliveDispatchable keepAlive;
    keepAlive.execute(proxy);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Keep alive dispatch failed"});
}

} // namespace
