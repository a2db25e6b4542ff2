// What the thread of an output does by itself: when it wakes, how long it pauses, what it counts and tells.
#include "libvelmora/output/backoff.h"
#include "libvelmora/output/outputworker.h"
#include "tests/support/records.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <ctime>
#include <thread>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::IsEmpty;
using velmora::OutputLimits;
using velmora::OutputWorker;

// A worker whose output's calls are scripted and noted. One thread at a time.
struct Worked
{
    std::vector<std::string> calls;
    std::string trouble; // of the call that it names first: "write: disk full"
    std::function<void()> onWrite = [] {};
    std::vector<std::string> told;
    OutputWorker worker;

    explicit Worked(OutputLimits const& limits, std::string theTrouble = "")
        : trouble(std::move(theTrouble)), worker(
                                              "csv:a", std::make_unique<Output>(*this),
                                              [this](std::string const& text) { told.push_back(text); }, limits)
    {}
    void note(std::string const& call, std::string const& what)
    {
        calls.push_back(what);
        if (trouble.starts_with(call + ": ")) {
            throw velmora::Error(velmora::ErrorKind::Failed, trouble.substr(call.size() + 2));
        }
    }
    void push(int count)
    {
        for (int i = 0; i < count; ++i) {
            worker.push(std::make_shared<velmora::Record const>(testsupport::reading("RPM", 1.0)));
        }
    }
    // All that is left to do at the end.
    void finish()
    {
        worker.beginStop();
        worker.run();
    }

private:
    struct Output : velmora::IOutput
    {
        explicit Output(Worked& theWork) : work(theWork) {}
        void open() override { work.note("open", "open"); }
        void write(velmora::Records records) override
        {
            work.onWrite();
            work.note("write", "write " + std::to_string(records.size()));
        }
        void close() override { work.note("close", "close"); }
        velmora::OutputState state() override
        {
            work.note("state", "state");
            return {true, 7};
        }

        Worked& work;
    };
};

OutputLimits slowLimits()
{
    OutputLimits limits;
    limits.interval = 1h;
    limits.batch = 2;
    return limits;
}

TEST(OutputWorker, HasLimitsOfItsOwnAccord)
{
    OutputLimits const usual;
    EXPECT_EQ(usual.queue, 10000U);
    EXPECT_EQ(usual.batch, 1000U);
    EXPECT_EQ(usual.interval, 1s);
    EXPECT_EQ(nextPause(0ms, usual), 1s);
    EXPECT_EQ(nextPause(1s, usual), 2s);
    EXPECT_EQ(nextPause(20s, usual), 40s);
    EXPECT_EQ(nextPause(40s, usual), 60s);
    EXPECT_EQ(nextPause(60s, usual), 60s);
}

TEST(OutputWorker, WritesWhatIsLeftInBatchesAndOpensOnce)
{
    Worked work(slowLimits());
    work.worker.open();
    work.push(5);
    EXPECT_EQ(work.worker.counts().accepted, 5U);
    work.finish();
    EXPECT_THAT(work.calls, ElementsAre("open", "write 2", "state", "write 2", "state", "write 1", "state", "close"));
    EXPECT_EQ(work.worker.counts().written, 5U);
    EXPECT_EQ(work.worker.counts().queued, 0U);
    EXPECT_FALSE(work.worker.counts().failing);
    EXPECT_EQ(work.worker.counts().state.up, true);
    EXPECT_EQ(work.worker.counts().state.waiting, 7U);
    EXPECT_THAT(work.told, IsEmpty());
    EXPECT_TRUE(work.worker.waitForEnd(0ms));
}

TEST(OutputWorker, TellsAtTheEndWhatWentWrong)
{
    Worked closes(slowLimits(), "close: no room");
    closes.worker.open();
    closes.push(1);
    closes.finish();
    EXPECT_THAT(closes.told, ElementsAre("csv:a: no room"));

    Worked opens(slowLimits(), "open: no folder");
    opens.worker.open();
    opens.push(3);
    opens.finish();
    EXPECT_THAT(opens.calls, ElementsAre("open", "open")) << "what never was open is neither written to nor closed";
    EXPECT_EQ(opens.worker.counts().queued, 3U);
    EXPECT_EQ(opens.worker.counts().failures, 2U);
    EXPECT_EQ(opens.worker.counts().lastError, "no folder");
    EXPECT_THAT(opens.told, ElementsAre("csv:a: no folder", "csv:a: 3 records could not be written before the end"));

    Worked writes(slowLimits(), "write: disk full");
    writes.worker.open();
    writes.push(3);
    writes.finish();
    EXPECT_THAT(writes.calls, ElementsAre("open", "write 2", "close"));
    EXPECT_EQ(writes.worker.counts().queued, 3U);
    EXPECT_EQ(writes.worker.counts().written, 0U);

    Worked silent(slowLimits(), "state: no idea");
    silent.worker.open();
    silent.push(1);
    silent.finish();
    EXPECT_EQ(silent.worker.counts().written, 1U) << "what it tells of itself is no reason to fail";
    EXPECT_EQ(silent.worker.counts().state.up, std::nullopt);
    EXPECT_THAT(silent.told, IsEmpty());
}

std::chrono::nanoseconds workTime()
{
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec);
}

TEST(OutputWorker, WakesForAWholeBatchOrWhenItIsTold)
{
    Worked work(slowLimits());
    work.worker.open();
    std::thread thread([&work] { work.worker.run(); });
    auto const waitFor = [&work](std::uint64_t written) {
        while (work.worker.counts().written < written) {
            std::this_thread::sleep_for(1ms);
        }
    };
    work.push(2);
    waitFor(2);
    work.push(1);
    work.worker.flush();
    waitFor(3);
    auto const before = workTime();
    std::this_thread::sleep_for(100ms);
    EXPECT_LT(workTime() - before, 20ms) << "told once, it wakes once";
    work.worker.beginStop();
    thread.join();
    EXPECT_EQ(work.worker.counts().written, 3U);
}

TEST(OutputWorker, TellsOfDroppedRecordsAtEachTenfold)
{
    OutputLimits limits;
    limits.queue = 1;
    limits.batch = 1;
    limits.interval = 0ms;
    Worked work(limits);
    std::vector<int> const comeMeanwhile = {2, 9, 2, 90, 2}; // all but one of them are dropped
    std::vector<std::uint64_t> dropped;
    std::size_t writes = 0;
    work.onWrite = [&] {
        dropped.push_back(work.worker.counts().dropped);
        writes < comeMeanwhile.size() ? work.push(comeMeanwhile[writes++]) : work.worker.beginStop();
    };
    work.worker.open();
    work.push(1);
    work.worker.run();
    EXPECT_THAT(dropped, ElementsAre(0, 1, 9, 10, 99, 100, 100));
    EXPECT_THAT(work.told,
                ElementsAre("csv:a: too slow, 1 records dropped so far", "csv:a: too slow, 10 records dropped so far",
                            "csv:a: too slow, 100 records dropped so far"));
    EXPECT_EQ(work.worker.counts().accepted, 106U);
}

TEST(Backoff, DoublesUpToAMinuteAndIsNeverTheSameForAll)
{
    std::vector<std::chrono::milliseconds> const whole = {1s, 2s, 4s, 8s, 16s, 32s, 60s, 60s};
    std::vector<std::chrono::milliseconds> shortest(whole.size(), 1h);
    std::vector<std::chrono::milliseconds> longest(whole.size(), 0s);
    for (unsigned int seed = 1; seed <= 400; ++seed) {
        velmora::Backoff backoff(seed * 7919);
        for (std::size_t i = 0; i < whole.size(); ++i) {
            auto const pause = backoff.next();
            shortest[i] = std::min(shortest[i], pause);
            longest[i] = std::max(longest[i], pause);
        }
        backoff.reset();
        EXPECT_EQ(backoff.next(), 1s);
    }
    for (std::size_t i = 0; i < whole.size(); ++i) {
        EXPECT_GE(shortest[i], std::max<std::chrono::milliseconds>(1s, whole[i] / 2));
        EXPECT_LE(shortest[i], std::max<std::chrono::milliseconds>(1s, whole[i] * 55 / 100));
        EXPECT_LE(longest[i], whole[i]);
        EXPECT_GE(longest[i], whole[i] * 95 / 100);
    }
}

} // namespace
