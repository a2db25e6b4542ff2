#include "libvelmora/poll/deadlinescheduler.h"
#include "libvelmora/poll/ratemeter.h"

#include <gtest/gtest.h>

#include <map>
#include <vector>

namespace {

using std::chrono::milliseconds;
using velmora::DeadlineScheduler;
using velmora::PollTime;

// A bus on which each turn takes as long as the test says.
class Bus
{
public:
    explicit Bus(std::vector<std::optional<double>> const& rates)
    {
        for (std::optional<double> const& hertz : rates) {
            m_scheduler.add(hertz, m_now);
        }
    }

    void run(milliseconds length, milliseconds turn)
    {
        PollTime const end = m_now + length;
        while (m_now < end) {
            DeadlineScheduler::Turn const next = *m_scheduler.next(m_now);
            if (next.start >= end) {
                m_now = end;
                return;
            }
            m_now = next.start;
            m_scheduler.started(next.task, m_now);
            m_starts[next.task].push_back(m_now);
            m_now += turn;
        }
    }

    std::size_t count(std::size_t task) const { return m_starts.contains(task) ? m_starts.at(task).size() : 0; }
    milliseconds longestPause(std::size_t task) const
    {
        milliseconds longest{0};
        std::vector<PollTime> const& starts = m_starts.at(task);
        for (std::size_t i = 1; i < starts.size(); ++i) {
            longest = std::max(longest, std::chrono::duration_cast<milliseconds>(starts[i] - starts[i - 1]));
        }
        return longest;
    }
    DeadlineScheduler& scheduler() { return m_scheduler; }
    PollTime now() const { return m_now; }

private:
    DeadlineScheduler m_scheduler;
    PollTime m_now{std::chrono::hours(1)};
    std::map<std::size_t, std::vector<PollTime>> m_starts;
};

TEST(DeadlineScheduler, RatesThatCanBeReachedAre)
{
    Bus bus({10.0, 5.0, 0.2});
    bus.run(milliseconds(10000), milliseconds(30));
    EXPECT_EQ(bus.count(0), 100U);
    EXPECT_EQ(bus.count(1), 50U);
    EXPECT_EQ(bus.count(2), 2U);
}

TEST(DeadlineScheduler, ASlowCrowdDoesNotHoldUpAFastSensor)
{
    std::vector<std::optional<double>> rates(21, 0.2);
    rates[0] = 10.0;
    Bus bus(rates);
    bus.run(milliseconds(20000), milliseconds(30));
    EXPECT_GE(bus.count(0), 199U);
    EXPECT_LE(bus.longestPause(0), milliseconds(130)); // its period and the turn that was on its way
    for (std::size_t slow = 1; slow < rates.size(); ++slow) {
        EXPECT_EQ(bus.count(slow), 4U) << slow;
    }
}

TEST(DeadlineScheduler, WhoAsksForLittleGetsItAndTheOthersShareEvenly)
{
    Bus bus({100.0, 50.0, 5.0, 1.0});
    bus.run(milliseconds(20000), milliseconds(40)); // 25 turns a second
    EXPECT_NEAR(static_cast<double>(bus.count(3)) / 20.0, 1.0, 0.06);
    EXPECT_NEAR(static_cast<double>(bus.count(2)) / 20.0, 5.0, 0.3);
    EXPECT_NEAR(static_cast<double>(bus.count(0)) / 20.0, 9.5, 0.5);
    EXPECT_NEAR(static_cast<double>(bus.count(1)) / 20.0, 9.5, 0.5);
}

TEST(DeadlineScheduler, WithoutARateTheRestIsSharedInTurn)
{
    Bus bus({10.0, std::nullopt, std::nullopt});
    bus.run(milliseconds(10000), milliseconds(25)); // 40 turns a second
    EXPECT_NEAR(static_cast<double>(bus.count(0)), 100.0, 1.0);
    EXPECT_NEAR(static_cast<double>(bus.count(1)), 150.0, 2.0);
    EXPECT_NEAR(static_cast<double>(bus.count(2)), 150.0, 2.0);
}

TEST(DeadlineScheduler, RatesBeyondTheBusLeaveAQuarterToTheRest)
{
    Bus bus({100.0, std::nullopt});
    bus.run(milliseconds(10000), milliseconds(25));
    EXPECT_NEAR(static_cast<double>(bus.count(0)), 300.0, 2.0);
    EXPECT_NEAR(static_cast<double>(bus.count(1)), 100.0, 2.0);
}

TEST(DeadlineScheduler, AStallIsNotMadeUpForInABurst)
{
    Bus bus({10.0});
    bus.run(milliseconds(1000), milliseconds(10));
    bus.run(milliseconds(1), milliseconds(5000)); // one request that took 5 s
    std::size_t const before = bus.count(0);
    bus.run(milliseconds(1000), milliseconds(10));
    EXPECT_LE(bus.count(0) - before, 12U);
}

TEST(DeadlineScheduler, APostponedTaskWaitsAndTheOthersGoOn)
{
    Bus bus({std::nullopt, std::nullopt});
    bus.scheduler().postpone(0, bus.now() + milliseconds(500));
    bus.run(milliseconds(480), milliseconds(20));
    EXPECT_EQ(bus.count(0), 0U);
    EXPECT_EQ(bus.count(1), 24U);
    bus.run(milliseconds(60), milliseconds(20));
    EXPECT_GE(bus.count(0), 1U);
}

TEST(DeadlineScheduler, NothingIsNext)
{
    EXPECT_FALSE(DeadlineScheduler().next(PollTime()).has_value());
}

TEST(RateMeter, TellsTheRateOfLateAndFallsInSilence)
{
    velmora::RateMeter meter;
    PollTime now{std::chrono::hours(1)};
    EXPECT_EQ(meter.hertz(now), 0.0);
    for (int i = 0; i < 50; ++i) {
        now += milliseconds(i < 10 ? 1000 : 100);
        meter.count(now);
    }
    EXPECT_NEAR(meter.hertz(now), 10.0, 0.01);
    EXPECT_NEAR(meter.hertz(now + milliseconds(150)), 10.0, 0.01);
    EXPECT_LT(meter.hertz(now + milliseconds(30000)), 1.0);
}

} // namespace
