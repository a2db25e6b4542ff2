#include "libobd/dispatch/callback.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/fakework.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <chrono>
#include <stdexcept>
#include <thread>

namespace {

using support::FakeWork;

class Dispatcher : public testing::Test
{
protected:
    support::LogCapture log;
    support::DispatcherRig rig;
    obd::Dispatcher& dispatcher = rig.dispatcher;

    // Queues work and waits until the worker has been through it.
    void execute(std::shared_ptr<FakeWork> const& work)
    {
        int const requested = rig.loop.requested();
        ASSERT_TRUE(dispatcher.update(work));
        ASSERT_TRUE(rig.loop.awaitRequested(requested + 1));
    }
};

TEST_F(Dispatcher, IsOneForTheProcess)
{
    EXPECT_EQ(&obd::Dispatcher::getInstance(), &obd::Dispatcher::getInstance());
}

TEST_F(Dispatcher, UpdateBeforeAnyConnectionIsRefusedAndTheWorkIsNotRunLater)
{
    auto const early = std::make_shared<FakeWork>();
    rig.proxy->setConnected(false);
    EXPECT_FALSE(dispatcher.update(early));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Proxy not connected"});
    rig.proxy->setConnected(true);
    execute(std::make_shared<FakeWork>());
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    rig.loop.runPending();
    EXPECT_EQ(early->executed, 0);
    EXPECT_EQ(early->finished, 0);
}

TEST_F(Dispatcher, UpdateWithoutAProxyIsRefused)
{
    dispatcher.setProxy(nullptr);
    EXPECT_FALSE(dispatcher.update(std::make_shared<FakeWork>()));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Proxy not connected"});
}

TEST_F(Dispatcher, ExecutesOnTheWorkerAndFinishesOnTheThreadThatDispatches)
{
    auto const work = std::make_shared<FakeWork>();
    std::thread::id executor;
    std::thread::id finisher;
    work->onExecute = [&executor] { executor = std::this_thread::get_id(); };
    work->onFinish = [&finisher] { finisher = std::this_thread::get_id(); };
    execute(work);
    EXPECT_EQ(work->finished, 0);
    rig.loop.runPending();
    EXPECT_EQ(work->executed, 1);
    EXPECT_EQ(work->finished, 1);
    EXPECT_NE(executor, std::this_thread::get_id());
    EXPECT_EQ(finisher, std::this_thread::get_id());
    EXPECT_EQ(work->lastProxy.lock(), rig.proxy);
}

TEST_F(Dispatcher, OneNotificationComesForEachCompletedWork)
{
    for (int i = 1; i <= 3; ++i) {
        execute(std::make_shared<FakeWork>());
        EXPECT_EQ(rig.loop.requested(), i);
    }
}

TEST_F(Dispatcher, SecondUpdateWhileTheFirstRunsIsQueuedAndTheTwoNeverOverlap)
{
    support::Gate gate;
    std::atomic<int> inside{0};
    std::atomic<int> most{0};
    std::vector<int> order;
    auto const first = std::make_shared<FakeWork>();
    auto const second = std::make_shared<FakeWork>();
    auto const body = [&](int number) {
        most = std::max(most.load(), ++inside);
        gate.pass();
        order.push_back(number);
        --inside;
    };
    first->onExecute = [&body] { body(1); };
    second->onExecute = [&body] { body(2); };
    ASSERT_TRUE(dispatcher.update(first));
    ASSERT_TRUE(gate.awaitWaiting());
    EXPECT_TRUE(dispatcher.update(second));
    EXPECT_EQ(second->executed, 0);
    gate.open();
    ASSERT_TRUE(rig.loop.awaitRequested(2));
    EXPECT_EQ(order, (std::vector<int>{1, 2}));
    EXPECT_EQ(most, 1);
}

TEST_F(Dispatcher, RunningWorkerTakesWorkThoughTheLinkIsLost)
{
    execute(std::make_shared<FakeWork>());
    rig.proxy->setConnected(false);
    auto const work = std::make_shared<FakeWork>();
    execute(work);
    EXPECT_EQ(work->executed, 1);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(Dispatcher, WorkWhoseLastReferenceIsDroppedWhileQueuedIsNeitherExecutedNorFinished)
{
    support::Gate gate;
    auto const busy = std::make_shared<FakeWork>();
    busy->onExecute = [&gate] { gate.pass(); };
    ASSERT_TRUE(dispatcher.update(busy));
    ASSERT_TRUE(gate.awaitWaiting());
    std::atomic<int> calls{0};
    auto doomed = std::make_shared<FakeWork>();
    doomed->onExecute = [&calls] { ++calls; };
    doomed->onFinish = [&calls] { ++calls; };
    ASSERT_TRUE(dispatcher.update(doomed));
    doomed.reset();
    gate.open();
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    rig.loop.runPending();
    EXPECT_EQ(calls, 0);
    EXPECT_EQ(rig.loop.requested(), 1) << "work that is gone is skipped without a word";
}

TEST_F(Dispatcher, CancelWhileWorkIsRunningReturnsOnlyAfterItsExecuteEnded)
{
    support::Gate gate;
    auto const running = std::make_shared<FakeWork>();
    auto const queued = std::make_shared<FakeWork>();
    running->onExecute = [&gate] { gate.pass(); };
    ASSERT_TRUE(dispatcher.update(running));
    ASSERT_TRUE(gate.awaitWaiting());
    ASSERT_TRUE(dispatcher.update(queued));
    std::atomic<bool> returned{false};
    std::thread canceller([&] {
        dispatcher.cancel();
        EXPECT_EQ(running->executed, 1);
        returned = true;
    });
    // Once the new worker refuses for want of a proxy, the cancel is on its way to join the old one.
    auto const refused = std::make_shared<FakeWork>();
    auto const end = std::chrono::steady_clock::now() + support::patience;
    while (dispatcher.update(refused) && std::chrono::steady_clock::now() < end) {
        std::this_thread::yield();
    }
    EXPECT_FALSE(returned);
    EXPECT_TRUE(log.contains("ERROR Proxy not connected"));
    gate.open();
    canceller.join();
    rig.loop.runPending();
    EXPECT_EQ(running->executed, 1);
    EXPECT_EQ(running->finished, 0);
    EXPECT_EQ(queued->executed, 0);
    EXPECT_EQ(queued->finished, 0);
    EXPECT_EQ(refused->executed, 0);
}

TEST_F(Dispatcher, CancelDropsTheFinishOfCompletedWork)
{
    auto const work = std::make_shared<FakeWork>();
    execute(work);
    dispatcher.cancel();
    rig.loop.runPending();
    EXPECT_EQ(work->finished, 0);
}

TEST_F(Dispatcher, CancelWithoutAWorkerAndTwiceDoesNoHarm)
{
    dispatcher.cancel();
    dispatcher.cancel();
    auto const work = std::make_shared<FakeWork>();
    execute(work);
    EXPECT_EQ(work->executed, 1);
}

TEST_F(Dispatcher, AfterCancelUpdateOnALiveConnectionStartsANewWorker)
{
    std::vector<std::thread::id> workers;
    auto const work = std::make_shared<FakeWork>();
    work->onExecute = [&workers] { workers.push_back(std::this_thread::get_id()); };
    execute(work);
    dispatcher.cancel();
    execute(work);
    ASSERT_EQ(workers.size(), 2U);
    EXPECT_EQ(work->lastProxy.lock(), rig.proxy);
    dispatcher.cancel();
    rig.proxy->setConnected(false);
    EXPECT_FALSE(dispatcher.update(work)) << "the next worker looks at the connection again";
}

TEST_F(Dispatcher, SetProxyHandsTheNewProxyToTheNextWork)
{
    auto const work = std::make_shared<FakeWork>();
    execute(work);
    auto const other = std::make_shared<support::FakeProxy>();
    dispatcher.setProxy(other);
    execute(work);
    EXPECT_EQ(work->lastProxy.lock(), other);
}

TEST_F(Dispatcher, ExpiredEntryAtTheHeadOfCompletedLetsTheLiveWorkBehindItFinishAtTheFollowingDispatch)
{
    auto doomed = std::make_shared<FakeWork>();
    auto const live = std::make_shared<FakeWork>();
    execute(doomed);
    execute(live);
    ASSERT_TRUE(rig.clock.awaitIdleRound()) << "the worker has let go of both";
    doomed.reset();
    dispatcher.dispatch();
    EXPECT_EQ(live->finished, 0);
    dispatcher.dispatch();
    EXPECT_EQ(live->finished, 1);
}

TEST_F(Dispatcher, ExpiredEntryAtTheHeadOfTheUiQueueEndsItsDrain)
{
    auto doomed = std::make_shared<FakeWork>();
    auto const live = std::make_shared<FakeWork>();
    EXPECT_TRUE(dispatcher.scheduleUiTask(doomed));
    EXPECT_TRUE(dispatcher.scheduleUiTask(live));
    EXPECT_EQ(rig.loop.requested(), 2);
    doomed.reset();
    dispatcher.dispatch();
    EXPECT_EQ(live->finished, 0);
    dispatcher.dispatch();
    EXPECT_EQ(live->finished, 1);
    EXPECT_EQ(live->executed, 0);
}

TEST_F(Dispatcher, UiTasksGoBeforeCompletedWork)
{
    std::vector<std::string> order;
    auto const completed = std::make_shared<FakeWork>();
    auto const posted = std::make_shared<FakeWork>();
    completed->onFinish = [&order] { order.emplace_back("completed"); };
    posted->onFinish = [&order] { order.emplace_back("posted"); };
    execute(completed);
    dispatcher.scheduleUiTask(posted);
    dispatcher.dispatch();
    EXPECT_EQ(order, (std::vector<std::string>{"posted", "completed"}));
}

TEST_F(Dispatcher, UiTasksSurviveACancel)
{
    auto const posted = std::make_shared<FakeWork>();
    dispatcher.scheduleUiTask(posted);
    dispatcher.cancel();
    dispatcher.dispatch();
    EXPECT_EQ(posted->finished, 1);
}

TEST_F(Dispatcher, DispatchFinishesNoMoreThanWhatWasCompletedAtItsStart)
{
    auto const work = std::make_shared<FakeWork>();
    // Repeats itself, and is completed again before its finish returns, as a query on a dead link may be.
    work->onFinish = [&] {
        if (work->finished < 100) {
            execute(work);
        }
    };
    execute(work);
    dispatcher.dispatch();
    EXPECT_EQ(work->finished, 1);
    dispatcher.dispatch();
    EXPECT_EQ(work->finished, 2);
}

TEST_F(Dispatcher, FinishMayCancelAndQueueAnew)
{
    auto const first = std::make_shared<FakeWork>();
    auto const behind = std::make_shared<FakeWork>();
    auto const next = std::make_shared<FakeWork>();
    first->onFinish = [&] {
        dispatcher.cancel();
        EXPECT_TRUE(dispatcher.update(next));
    };
    execute(first);
    execute(behind);
    dispatcher.dispatch();
    EXPECT_EQ(first->finished, 1);
    EXPECT_EQ(behind->finished, 0) << "dropped by the cancel";
    EXPECT_TRUE(rig.loop.runUntil([&] { return next->finished == 1; }));
}

TEST_F(Dispatcher, FinishMayPostAndQueue)
{
    auto const callback = std::make_shared<obd::Callback>();
    auto const work = std::make_shared<FakeWork>();
    auto const next = std::make_shared<FakeWork>();
    bool called = false;
    work->onFinish = [&] {
        callback->post([&called] { called = true; });
        EXPECT_TRUE(dispatcher.update(next));
    };
    execute(work);
    EXPECT_TRUE(rig.loop.runUntil([&] { return called && next->finished == 1; }));
}

TEST_F(Dispatcher, ExecuteMayQueueMoreWork)
{
    auto const first = std::make_shared<FakeWork>();
    auto const second = std::make_shared<FakeWork>();
    first->onExecute = [&] { EXPECT_TRUE(dispatcher.update(second)); };
    execute(first);
    EXPECT_TRUE(rig.loop.runUntil([&] { return first->finished == 1 && second->finished == 1; }));
}

TEST_F(Dispatcher, ExceptionOfExecuteIsLoggedAndTheWorkFinishedAsAfterANormalExecute)
{
    auto const work = std::make_shared<FakeWork>();
    work->onExecute = [] { throw std::runtime_error("no"); };
    execute(work);
    rig.loop.runPending();
    EXPECT_EQ(work->finished, 1);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"FATAL Dispatchable threw an exception"});
    auto const next = std::make_shared<FakeWork>();
    execute(next);
    EXPECT_EQ(next->executed, 1);
}

TEST_F(Dispatcher, ExceptionOfAFinishReachesTheCallerAndLeavesTheRest)
{
    auto const bad = std::make_shared<FakeWork>();
    auto const good = std::make_shared<FakeWork>();
    bad->onFinish = [] { throw std::runtime_error("no"); };
    execute(bad);
    execute(good);
    EXPECT_THROW(dispatcher.dispatch(), std::runtime_error);
    dispatcher.dispatch();
    EXPECT_EQ(good->finished, 1);
    EXPECT_EQ(bad->finished, 1);
}

TEST_F(Dispatcher, RunnerThatThrowsOnTheWorkerIsLoggedAndHarmsNothing)
{
    struct Thrower : tervex::Observer<obd::IDispatchRunner>
    {
        void onDispatchRequested() override { throw std::runtime_error("no"); }
    } thrower;
    dispatcher.attach(&thrower);
    auto const work = std::make_shared<FakeWork>();
    execute(work);
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    dispatcher.cancel();
    dispatcher.detach(&thrower);
    EXPECT_EQ(work->executed, 1);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"FATAL Dispatch runner threw an exception"});
}

TEST_F(Dispatcher, DispatchWithNothingDueDoesNothing)
{
    dispatcher.dispatch();
    EXPECT_EQ(rig.loop.requested(), 0);
    EXPECT_TRUE(log.lines().empty());
}

} // namespace
