#include "libobd/dispatch/query.h"
#include "tests/support/dispatcherrig.h"
#include "tests/support/fakequery.h"
#include "tests/support/logcapture.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

namespace {

using support::FakeQuery;
using Status = obd::IQuery::UpdateStatus;

class Query : public testing::Test
{
protected:
    support::LogCapture log;
    support::DispatcherRig rig;
    std::shared_ptr<FakeQuery> parameter = std::make_shared<FakeQuery>();
    std::shared_ptr<obd::Query<FakeQuery>> query = std::make_shared<obd::Query<FakeQuery>>(parameter);
    std::vector<bool> outcomes;

    obd::Query<FakeQuery>::Function record()
    {
        return [this](bool success, std::shared_ptr<FakeQuery> const& /*parameter*/) { outcomes.push_back(success); };
    }

    // Waits until the worker has done the executes of that many runs.
    void awaitExecutes(int runs) { ASSERT_TRUE(rig.loop.awaitRequested(runs)); }
};

TEST_F(Query, SuccessComesBackWithTheParameterThroughDispatch)
{
    std::shared_ptr<FakeQuery> delivered;
    ASSERT_TRUE(query->start([&](bool success, std::shared_ptr<FakeQuery> const& result) {
        outcomes.push_back(success);
        delivered = result;
    }));
    awaitExecutes(1);
    EXPECT_TRUE(outcomes.empty());
    rig.loop.runPending();
    EXPECT_EQ(outcomes, std::vector<bool>{true});
    EXPECT_EQ(delivered, parameter);
}

TEST_F(Query, FailureComesBackAsFalse)
{
    for (Status const status : {Status::UpdateNoData, Status::UpdateFailed}) {
        parameter->onUpdate = [status] { return status; };
        ASSERT_TRUE(query->start(record()));
        ASSERT_TRUE(rig.loop.runUntil([this] { return !outcomes.empty(); }));
        EXPECT_EQ(outcomes, std::vector<bool>{false});
        outcomes.clear();
    }
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(Query, ExceptionOfTheParameterComesBackAsFalseAndTheQueryMayRunAgain)
{
    parameter->onUpdate = []() -> Status { throw std::runtime_error("no"); };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
    parameter->onUpdate = [] { return Status::UpdateOk; };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 2; }));
    EXPECT_EQ(outcomes, (std::vector<bool>{false, true}));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"FATAL Dispatchable threw an exception"});
}

TEST_F(Query, StartClearsTheParameterBeforeItRuns)
{
    parameter->onUpdate = [this] {
        EXPECT_EQ(parameter->clears, 1);
        return Status::UpdateOk;
    };
    ASSERT_TRUE(query->start(record()));
    awaitExecutes(1);
    EXPECT_EQ(parameter->clears, 1);
}

TEST_F(Query, StartLeavesTheHistoryOfAParameterThatKeepsOne)
{
    parameter->history = true;
    for (std::size_t runs = 1; runs <= 3; ++runs) {
        ASSERT_TRUE(query->start(record()));
        ASSERT_TRUE(rig.loop.runUntil([&] { return outcomes.size() == runs; }));
    }
    EXPECT_EQ(parameter->updates, 3);
    EXPECT_EQ(parameter->clears, 0);
}

TEST_F(Query, StartOnARunningQueryIsFalseAndLeavesTheFirstCallbackInPlace)
{
    ASSERT_TRUE(query->start(record()));
    bool second = false;
    EXPECT_FALSE(query->start([&second](bool, std::shared_ptr<FakeQuery> const&) { second = true; }));
    EXPECT_EQ(parameter->clears, 1);
    awaitExecutes(1);
    EXPECT_FALSE(query->start(record())) << "running until its finish";
    rig.loop.runPending();
    EXPECT_EQ(outcomes, std::vector<bool>{true});
    EXPECT_FALSE(second);
    EXPECT_EQ(parameter->updates, 1);
}

TEST_F(Query, RefusedStartIsFalseAndMayBeTriedAgain)
{
    rig.proxy->setConnected(false);
    EXPECT_FALSE(query->start(record()));
    EXPECT_EQ(log.lines(), std::vector<std::string>{"ERROR Proxy not connected"});
    rig.proxy->setConnected(true);
    EXPECT_TRUE(query->start(record()));
    EXPECT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
}

TEST_F(Query, CancelBetweenExecuteAndFinishKeepsTheCallbackFromBeingCalled)
{
    ASSERT_TRUE(query->start(record()));
    awaitExecutes(1);
    query->cancel();
    rig.loop.runPending();
    EXPECT_TRUE(outcomes.empty());
    EXPECT_EQ(parameter->updates, 1);
}

TEST_F(Query, CancelledWhileQueuedIsPassedOver)
{
    support::Gate gate;
    auto const busy = std::make_shared<FakeQuery>();
    busy->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateOk;
    };
    obd::Query<FakeQuery> first(busy);
    ASSERT_TRUE(first.start(record()));
    ASSERT_TRUE(gate.awaitWaiting());
    ASSERT_TRUE(query->start(record()));
    query->cancel();
    gate.open();
    ASSERT_TRUE(rig.loop.runUntil([this] { return !outcomes.empty(); }));
    ASSERT_TRUE(rig.clock.awaitIdleRound());
    rig.loop.runPending();
    EXPECT_EQ(parameter->updates, 0);
    EXPECT_EQ(outcomes.size(), 1U);
}

TEST_F(Query, CancelInTheMiddleOfARunAndANewStartGiveOneCallbackOfTheNewRun)
{
    support::Gate gate;
    parameter->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateFailed;
    };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(gate.awaitWaiting());
    query->cancel();
    gate.open();
    awaitExecutes(1); // the worker is out of the parameter
    parameter->onUpdate = [] { return Status::UpdateOk; };
    ASSERT_TRUE(query->start(record()));
    awaitExecutes(2);
    rig.loop.runPending();
    EXPECT_EQ(outcomes, std::vector<bool>{true});
}

TEST_F(Query, CancelOfAnIdleQueryDoesNothing)
{
    query->cancel();
    EXPECT_TRUE(query->start(record()));
    EXPECT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
    query->cancel();
}

TEST_F(Query, CallbackMayStartTheNextRun)
{
    int runs = 0;
    std::function<void(bool, std::shared_ptr<FakeQuery> const&)> again =
        [&](bool success, std::shared_ptr<FakeQuery> const& /*parameter*/) {
            EXPECT_TRUE(success);
            if (++runs < 5) {
                EXPECT_TRUE(query->start(again));
            }
        };
    ASSERT_TRUE(query->start(again));
    EXPECT_TRUE(rig.loop.runUntil([&runs] { return runs == 5; }));
    EXPECT_EQ(parameter->updates, 5);
    EXPECT_EQ(parameter->clears, 5);
}

TEST_F(Query, RepeatingOnADeadLinkTellsEachFailureAndKeepsDispatchShort)
{
    parameter->onUpdate = [] { return Status::UpdateFailed; };
    int failures = 0;
    std::function<void(bool, std::shared_ptr<FakeQuery> const&)> again = [&](bool, std::shared_ptr<FakeQuery> const&) {
        ++failures;
        query->start(again);
        rig.loop.awaitRequested(failures + 1); // failed again before this returns
    };
    ASSERT_TRUE(query->start(again));
    awaitExecutes(1);
    rig.dispatcher.dispatch();
    EXPECT_EQ(failures, 1);
    rig.dispatcher.dispatch();
    EXPECT_EQ(failures, 2);
    query->cancel();
}

TEST_F(Query, DestroyedInTheMiddleOfARunIsLeftAloneByItsFinish)
{
    support::Gate gate;
    parameter->onUpdate = [&gate] {
        gate.pass();
        return Status::UpdateOk;
    };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(gate.awaitWaiting());
    query.reset();
    gate.open();
    awaitExecutes(1);
    rig.loop.runPending();
    EXPECT_TRUE(outcomes.empty());
}

TEST_F(Query, CallbackMayDestroyItsQuery)
{
    ASSERT_TRUE(query->start([this](bool success, std::shared_ptr<FakeQuery> const& /*parameter*/) {
        query.reset();
        outcomes.push_back(success);
    }));
    ASSERT_TRUE(rig.loop.runUntil([this] { return !outcomes.empty(); }));
    EXPECT_EQ(query, nullptr);
}

TEST_F(Query, CallbackThatHoldsItsQueryLetsItGoAtTheEndOfTheRunAtARefusalAndAtACancel)
{
    std::weak_ptr<obd::Query<FakeQuery>> const watch = query;
    auto const holding = [this, self = query](bool success, std::shared_ptr<FakeQuery> const& /*parameter*/) {
        outcomes.push_back(success && self != nullptr);
    };
    ASSERT_TRUE(query->start(holding));
    ASSERT_TRUE(rig.loop.runUntil([this] { return !outcomes.empty(); }));
    EXPECT_EQ(query.use_count(), 2) << "this fixture and the function above";
    rig.dispatcher.cancel();
    rig.proxy->setConnected(false);
    EXPECT_FALSE(query->start(holding));
    EXPECT_EQ(query.use_count(), 2);
    rig.proxy->setConnected(true);
    ASSERT_TRUE(query->start(holding));
    EXPECT_EQ(query.use_count(), 3);
    query->cancel();
    EXPECT_EQ(query.use_count(), 2);
}

TEST_F(Query, CancelMayDropTheLastReferenceToTheQuery)
{
    std::weak_ptr<obd::Query<FakeQuery>> const watch = query;
    ASSERT_TRUE(query->start([self = query](bool, std::shared_ptr<FakeQuery> const&) { EXPECT_NE(self, nullptr); }));
    obd::Query<FakeQuery>& kept = *query;
    query.reset();
    ASSERT_FALSE(watch.expired());
    kept.cancel();
    EXPECT_TRUE(watch.expired());
}

TEST_F(Query, WorkDroppedByTheDispatcherLeavesTheQueryRunningUntilItIsCancelled)
{
    ASSERT_TRUE(query->start(record()));
    awaitExecutes(1);
    rig.dispatcher.cancel();
    rig.loop.runPending();
    EXPECT_TRUE(outcomes.empty());
    EXPECT_FALSE(query->start(record()));
    query->cancel();
    EXPECT_TRUE(query->start(record()));
    EXPECT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
}

TEST_F(Query, WithoutAProxyOnTheWorkerFailsThoughTheRunBeforeSucceeded)
{
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
    rig.dispatcher.setProxy(nullptr);
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 2; }));
    EXPECT_EQ(outcomes, (std::vector<bool>{true, false}));
    EXPECT_EQ(parameter->updates, 1);
}

TEST_F(Query, FastSuccessIsStretchedTo30MillisecondsAndAFailureIsNot)
{
    parameter->onUpdate = [this] {
        rig.clock.advance(5);
        return Status::UpdateFailed;
    };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 1; }));
    EXPECT_EQ(rig.clock.sleepsOf(25), 0);
    parameter->onUpdate = [this] {
        rig.clock.advance(5);
        return Status::UpdateOk;
    };
    ASSERT_TRUE(query->start(record()));
    ASSERT_TRUE(rig.loop.runUntil([this] { return outcomes.size() == 2; }));
    EXPECT_EQ(rig.clock.sleepsOf(25), 1);
}

TEST_F(Query, EmptyCallbackIsAllowed)
{
    ASSERT_TRUE(query->start(nullptr));
    awaitExecutes(1);
    EXPECT_NO_THROW(rig.loop.runPending());
    EXPECT_TRUE(query->start(record()));
}

} // namespace
