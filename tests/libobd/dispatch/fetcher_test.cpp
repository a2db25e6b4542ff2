#include "libobd/dispatch/fetcher.h"
#include "libobd/powertrain/monitorstatus.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakequery.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <limits>
#include <set>
#include <stdexcept>
#include <thread>

namespace {

using support::FakeQuery;
using Status = obd::IQuery::UpdateStatus;
using Lines = std::vector<std::string>;

class Fetch : public testing::Test
{
protected:
    support::LogCapture log;
    support::DispatcherRig rig;
    std::shared_ptr<FakeQuery> query = std::make_shared<FakeQuery>();
};

TEST_F(Fetch, IsTrueWhenTheQueryRanAndReportedSuccess)
{
    EXPECT_TRUE(obd::fetch(query));
    EXPECT_EQ(query->updates, 1);
    EXPECT_EQ(query->clears, 0);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(Fetch, LeavesTheValueInTheParameter)
{
    rig.proxy->answer("01 01", "41 01 82 07 65 00");
    auto const parameter = std::make_shared<obd::MonitorStatus>();
    ASSERT_TRUE(obd::fetch(parameter));
    EXPECT_TRUE(parameter->isMalfunctionIndicatorLightOn(*rig.proxy->firstEcu()));
    EXPECT_EQ(parameter->getNumberOfErrors(*rig.proxy->firstEcu()), 2U);
}

TEST_F(Fetch, IsFalseWhenTheQueryReportedAFailure)
{
    for (Status const status : {Status::UpdateNoData, Status::UpdateFailed}) {
        log.clear();
        query->onUpdate = [status] { return status; };
        EXPECT_FALSE(obd::fetch(query));
        EXPECT_EQ(log.lines(), Lines{"ERROR Fetch done with failure"});
    }
}

TEST_F(Fetch, QueryThatThrowsIsAFailureAtOnce)
{
    query->limit = std::numeric_limits<int>::max();
    query->onUpdate = []() -> Status { throw std::runtime_error("no"); };
    EXPECT_FALSE(obd::fetch(query));
    ASSERT_TRUE(rig.loop.awaitRequested(1));
    EXPECT_TRUE(log.contains("ERROR Fetch done with failure"));
    EXPECT_TRUE(log.contains("FATAL Dispatchable threw an exception"));
}

TEST_F(Fetch, OnAClosedConnectionWithNoRunningWorkerIsFalseAtOnce)
{
    rig.proxy->setConnected(false);
    query->limit = std::numeric_limits<int>::max();
    EXPECT_FALSE(obd::fetch(query));
    EXPECT_EQ(log.lines(), Lines{"ERROR Proxy not connected"});
    EXPECT_EQ(query->updates, 0);
}

TEST_F(Fetch, OnAWorkerWithoutAProxyFails)
{
    ASSERT_TRUE(obd::fetch(query));
    rig.dispatcher.setProxy(nullptr);
    EXPECT_FALSE(obd::fetch(query));
    EXPECT_EQ(log.lines(), Lines{"ERROR Fetch done with failure"});
    EXPECT_EQ(query->updates, 1);
}

TEST_F(Fetch, ParameterWhoseTimeoutIsZeroGivesUpAfter50Milliseconds)
{
    support::Gate gate;
    query->limit = 0;
    query->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateOk;
    };
    auto const start = std::chrono::steady_clock::now();
    EXPECT_FALSE(obd::fetch(query));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(50));
    EXPECT_EQ(log.lines(), Lines{"ERROR Future not ready"});
    gate.open();
    EXPECT_TRUE(rig.loop.awaitRequested(1)) << "the worker sets a value that nobody reads";
}

TEST_F(Fetch, LastOnesInALongQueueTimeOutWithoutEverHavingRun)
{
    support::Gate gate;
    auto const slow = std::make_shared<FakeQuery>();
    slow->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateOk;
    };
    std::thread first([&slow] { EXPECT_TRUE(obd::fetch(slow)); });
    ASSERT_TRUE(gate.awaitWaiting());
    query->limit = 0;
    EXPECT_FALSE(obd::fetch(query));
    gate.open();
    first.join();
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    EXPECT_EQ(query->updates, 0) << "a task that is still queued vanishes with its fetch";
    EXPECT_EQ(log.lines(), Lines{"ERROR Future not ready"});
}

TEST_F(Fetch, BesideACancelEndsWithFalseAndNeverRuns)
{
    support::Gate gate;
    auto const slow = std::make_shared<FakeQuery>();
    slow->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateOk;
    };
    std::thread first([&slow] { EXPECT_TRUE(obd::fetch(slow)); });
    ASSERT_TRUE(gate.awaitWaiting());
    query->limit = 0;
    std::thread second([this] { EXPECT_FALSE(obd::fetch(query)); });
    std::thread canceller([this] { rig.dispatcher.cancel(); });
    second.join();
    gate.open();
    first.join();
    canceller.join();
    EXPECT_EQ(query->updates, 0);
}

TEST_F(Fetch, ManyFromSeveralThreadsRunStrictlyOneAfterAnother)
{
    std::atomic<int> inside{0};
    std::atomic<int> most{0};
    std::vector<std::thread::id> workers; // touched by one at a time, or the sanitizer tells
    auto const body = [&] {
        most = std::max(most.load(), ++inside);
        workers.push_back(std::this_thread::get_id());
        std::this_thread::yield();
        --inside;
        return Status::UpdateOk;
    };
    constexpr int threadCount = 8;
    constexpr int fetches = 10;
    std::vector<std::thread> threads;
    for (int i = 0; i < threadCount; ++i) {
        threads.emplace_back([&body] {
            for (int k = 0; k < fetches; ++k) {
                auto const own = std::make_shared<FakeQuery>();
                own->limit = 60000;
                own->onUpdate = body;
                EXPECT_TRUE(obd::fetch(own));
                EXPECT_EQ(own->updates, 1);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(most, 1);
    EXPECT_EQ(workers.size(), static_cast<std::size_t>(threadCount * fetches));
    EXPECT_EQ(std::set<std::thread::id>(workers.begin(), workers.end()).size(), 1U);
}

TEST(FetchLimit, IsTheTimeoutAndFiftyMillisecondsMore)
{
    using std::chrono::milliseconds;
    EXPECT_EQ(obd::fetchLimit(0), milliseconds(50));
    EXPECT_EQ(obd::fetchLimit(1500), milliseconds(1550));
    EXPECT_EQ(obd::fetchLimit(0x7FFFFFFF), milliseconds(2147483697));
    EXPECT_EQ(obd::fetchLimit(0x80000000), milliseconds(50)) << "a negative time-out is none";
    EXPECT_EQ(obd::fetchLimit(static_cast<unsigned int>(-1)), milliseconds(50));
}

class FetchTask : public testing::Test
{
protected:
    support::FakeClock clock;
    std::shared_ptr<obd::IObdProxy> proxy = std::make_shared<support::FakeProxy>();
    std::shared_ptr<FakeQuery> query = std::make_shared<FakeQuery>();
    std::shared_ptr<std::promise<bool>> promise = std::make_shared<std::promise<bool>>();
    std::future<bool> answer = promise->get_future();
    obd::FetchTask<FakeQuery> task{query, promise};

    // The milliseconds that the worker is at a query that takes `took` and comes out as `status`.
    unsigned int runFor(unsigned int took, Status status)
    {
        query->onUpdate = [this, took, status] {
            clock.advance(took);
            return status;
        };
        unsigned int const start = clock.millis();
        task.execute(proxy);
        return clock.millis() - start;
    }
};

TEST_F(FetchTask, FastSuccessOf5MillisecondsTakes30OnTheWorker)
{
    EXPECT_EQ(runFor(5, Status::UpdateOk), 30U);
    EXPECT_TRUE(answer.get());
}

TEST_F(FetchTask, SuccessOf29MillisecondsTakes30)
{
    EXPECT_EQ(runFor(29, Status::UpdateOk), 30U);
}

TEST_F(FetchTask, SuccessOf30MillisecondsIsNotHeldUp)
{
    EXPECT_EQ(runFor(30, Status::UpdateOk), 30U);
}

TEST_F(FetchTask, SlowSuccessIsNotHeldUp)
{
    EXPECT_EQ(runFor(4000, Status::UpdateOk), 4000U);
}

TEST_F(FetchTask, FailureOf5MillisecondsTakesOnlyItsFive)
{
    EXPECT_EQ(runFor(5, Status::UpdateNoData), 5U);
    EXPECT_FALSE(answer.get());
}

TEST_F(FetchTask, DurationSurvivesTheWrapOfTheCounter)
{
    clock.advance(std::numeric_limits<unsigned int>::max() - clock.millis() - 1);
    EXPECT_EQ(runFor(5, Status::UpdateOk), 30U);
}

TEST_F(FetchTask, CancelledOneFailsWithoutAskingTheVehicle)
{
    task.cancel();
    task.execute(proxy);
    EXPECT_FALSE(answer.get());
    EXPECT_EQ(query->updates, 0);
}

TEST_F(FetchTask, WithoutAProxyFailsWithoutAskingTheVehicle)
{
    task.execute(nullptr);
    EXPECT_FALSE(answer.get());
    EXPECT_EQ(query->updates, 0);
}

TEST_F(FetchTask, ExceptionPassesOnOnceTheCallerHasItsAnswer)
{
    query->onUpdate = []() -> Status { throw std::runtime_error("no"); };
    EXPECT_THROW(task.execute(proxy), std::runtime_error);
    ASSERT_EQ(answer.wait_for(std::chrono::seconds(0)), std::future_status::ready);
    EXPECT_FALSE(answer.get());
}

TEST_F(FetchTask, FinishDoesNothing)
{
    task.finish();
    EXPECT_EQ(answer.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
    EXPECT_EQ(query->updates, 0);
}

} // namespace
