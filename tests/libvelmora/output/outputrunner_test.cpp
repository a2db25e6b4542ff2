#include "libvelmora/output/outputrunner.h"
#include "tests/support/records.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ctime>
#include <latch>
#include <thread>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::reading;
using velmora::OutputLimits;
using velmora::OutputRunner;

// What an output was given, and when it may go on.
struct Witness
{
    std::mutex mutex;
    std::condition_variable changed;
    std::vector<double> values; // protected by mutex, as are the others
    std::vector<std::string> told;
    int failOpens = 0;
    int failWrites = 0;
    bool held = false; // writes wait
    int waiting = 0;   // writes that do
    bool closed = false;

    void waitFor(std::function<bool()> const& condition)
    {
        std::unique_lock lock(mutex);
        changed.wait(lock, condition);
    }
    void set(bool& flag, bool value)
    {
        std::lock_guard const lock(mutex);
        flag = value;
        changed.notify_all();
    }
};

class WitnessOutput : public velmora::IOutput
{
public:
    explicit WitnessOutput(Witness& witness) : m_witness(witness) {}

    void open() override
    {
        if (m_witness.failOpens-- > 0) {
            throw velmora::Error(velmora::ErrorKind::Failed, "no room to open");
        }
    }
    void write(velmora::Records records) override
    {
        std::unique_lock lock(m_witness.mutex);
        ++m_witness.waiting;
        m_witness.changed.notify_all();
        m_witness.changed.wait(lock, [this] { return !m_witness.held; });
        --m_witness.waiting;
        if (m_witness.failWrites > 0) {
            --m_witness.failWrites;
            throw velmora::Error(velmora::ErrorKind::Failed, "disk full");
        }
        for (velmora::SharedRecord const& each : records) {
            m_witness.values.push_back(std::get<double>(std::get<velmora::Reading>(*each).value));
        }
        m_witness.changed.notify_all();
    }
    void close() override { m_witness.set(m_witness.closed, true); }

private:
    Witness& m_witness;
};

OutputLimits withoutWaiting()
{
    OutputLimits limits;
    limits.interval = std::chrono::milliseconds(0);
    limits.firstPause = std::chrono::milliseconds(0);
    limits.longestPause = std::chrono::milliseconds(0);
    return limits;
}

OutputRunner::Tell tellTo(Witness& witness)
{
    return [&witness](std::string const& text) {
        std::lock_guard const lock(witness.mutex);
        witness.told.push_back(text);
    };
}

void pushValue(OutputRunner& runner, double value)
{
    runner.push(std::make_shared<velmora::Record const>(reading("RPM", value)));
}

TEST(OutputRunner, WritesInOrderAndClosesAtTheEnd)
{
    Witness witness;
    OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), withoutWaiting());
    runner.start();
    pushValue(runner, 1.0);
    pushValue(runner, 2.0);
    runner.stop();
    EXPECT_THAT(witness.values, ElementsAre(1.0, 2.0));
    EXPECT_TRUE(witness.closed);
    EXPECT_TRUE(witness.told.empty());
    EXPECT_EQ(runner.counts().accepted, 2U);
    EXPECT_EQ(runner.counts().written, 2U);
    EXPECT_EQ(runner.counts().queued, 0U);
}

std::chrono::nanoseconds processorTime()
{
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec);
}

TEST(OutputRunner, CostsNothingWhileThereIsNothingToWrite)
{
    Witness witness;
    OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), withoutWaiting());
    runner.start();
    pushValue(runner, 1.0);
    witness.waitFor([&witness] { return !witness.values.empty(); });
    auto const before = processorTime();
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    EXPECT_LT(processorTime() - before, std::chrono::milliseconds(10));
    runner.stop();
}

TEST(OutputRunner, AFailedBatchComesAgainAsItWas)
{
    Witness witness;
    witness.failWrites = 3;
    witness.failOpens = 1;
    OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), withoutWaiting());
    runner.start();
    pushValue(runner, 1.0);
    pushValue(runner, 2.0);
    witness.waitFor([&] { return witness.values.size() == 2; });
    runner.stop();
    EXPECT_THAT(witness.values, ElementsAre(1.0, 2.0));
    EXPECT_EQ(runner.counts().failures, 4U);
    EXPECT_EQ(runner.counts().dropped, 0U);
    EXPECT_THAT(witness.told, ElementsAre("csv:a: no room to open", "csv:a: works again"));
}

TEST(OutputRunner, ASlowOneDropsTheOldestAndSaysSo)
{
    Witness witness;
    witness.held = true;
    OutputLimits limits = withoutWaiting();
    limits.queue = 3;
    limits.batch = 1;
    OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), limits);
    runner.start();
    pushValue(runner, 0.0);
    witness.waitFor([&] { return witness.waiting == 1; });
    for (int i = 1; i <= 8; ++i) {
        pushValue(runner, i); // returns although the output stands still
    }
    EXPECT_EQ(runner.counts().dropped, 5U);
    witness.set(witness.held, false);
    runner.stop();
    EXPECT_THAT(witness.values, ElementsAre(0.0, 6.0, 7.0, 8.0));
    EXPECT_THAT(witness.told, ElementsAre("csv:a: too slow, 5 records dropped so far"));
    EXPECT_EQ(runner.counts().accepted, runner.counts().written + runner.counts().dropped);
}

TEST(OutputRunner, TheEndWaitsForNoPauseAndTellsWhatIsLeft)
{
    Witness witness;
    witness.failWrites = 1000000;
    OutputLimits limits = withoutWaiting();
    limits.firstPause = std::chrono::hours(1);
    limits.longestPause = std::chrono::hours(1);
    OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), limits);
    runner.start();
    pushValue(runner, 1.0);
    witness.waitFor([&] { return witness.failWrites < 1000000; });
    runner.stop();
    EXPECT_TRUE(witness.values.empty());
    EXPECT_THAT(witness.told,
                ElementsAre("csv:a: disk full", HasSubstr("1 records could not be written before the end")));
    EXPECT_EQ(witness.failWrites, 999998) << "once before the pause, once at the end";
    EXPECT_TRUE(runner.counts().failing);
    EXPECT_EQ(runner.counts().lastError, "disk full");
}

TEST(OutputRunner, OneThatHangsIsLeftBehind)
{
    static Witness witness; // outlives the thread
    witness.held = true;
    {
        OutputRunner runner("csv:a", std::make_unique<WitnessOutput>(witness), tellTo(witness), withoutWaiting());
        runner.start();
        pushValue(runner, 1.0);
        witness.waitFor([&] { return witness.waiting == 1; });
        EXPECT_FALSE(runner.stopWithin(std::chrono::milliseconds(1)));
    }
    witness.set(witness.held, false); // its thread goes on without the runner
    witness.waitFor([&] { return witness.closed; });
    EXPECT_THAT(witness.values, ElementsAre(1.0));
    Witness quick;
    OutputRunner runner("csv:b", std::make_unique<WitnessOutput>(quick), tellTo(quick), withoutWaiting());
    runner.start();
    EXPECT_TRUE(runner.stopWithin(std::chrono::hours(1)));
    EXPECT_TRUE(quick.closed);
}

TEST(OutputRunner, WhatMakesNoSenseIsToldAtOnce)
{
    class Senseless : public WitnessOutput
    {
    public:
        using WitnessOutput::WitnessOutput;
        void open() override { throw velmora::Error(velmora::ErrorKind::WrongUse, "no such thing"); }
    };
    Witness witness;
    OutputRunner runner("csv:a", std::make_unique<Senseless>(witness), tellTo(witness), withoutWaiting());
    EXPECT_THROW(runner.start(), velmora::Error);
}

} // namespace
