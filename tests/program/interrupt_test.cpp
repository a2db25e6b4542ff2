// What signals do to a command that runs, and no more to one that has ended.
#include "program/command/commandcar.h"
#include "program/command/lastresort.h"
#include "program/terminal/interrupt.h"
#include "tests/program/terminal/terminalinput.h"

#include <chrono>
#include <future>
#include <thread>

namespace {

using namespace velmora::cli;
using std::chrono::hours;
using std::chrono::milliseconds;
using std::chrono::seconds;

constexpr seconds untilItComes{10};

class Interrupted : public testing::Test
{
protected:
    // Whether the object has heard of it in time.
    bool isRaised() const
    {
        auto const end = std::chrono::steady_clock::now() + untilItComes;
        while (!m_interrupt->raised() && std::chrono::steady_clock::now() < end) {
            std::this_thread::yield();
        }
        return m_interrupt->raised();
    }

    SignalsAsBefore const m_signals;
    std::optional<Interrupt> m_interrupt{std::in_place};
};

TEST_F(Interrupted, TheHandlerIsCalledOnceASignalComes)
{
    for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
        m_interrupt.reset();
        m_interrupt.emplace();
        EXPECT_FALSE(m_interrupt->raised());
        std::promise<void> called;
        m_interrupt->setHandler([&called] { called.set_value(); });
        ::kill(::getpid(), signal);
        EXPECT_EQ(called.get_future().wait_for(untilItComes), std::future_status::ready) << signal;
        EXPECT_TRUE(m_interrupt->raised());
        int late = 0;
        m_interrupt->setHandler([&late] { ++late; });
        EXPECT_EQ(late, 1) << "who comes later is told at once";
        m_interrupt->setHandler(nullptr);
        EXPECT_EQ(late, 1);
    }
}

TEST_F(Interrupted, AHangUpThatIsHandledEndsNothing)
{
    std::promise<void> first;
    m_interrupt->setHangUpHandler([&first] { first.set_value(); });
    int ends = 0;
    m_interrupt->setHandler([&ends] { ++ends; });
    ::kill(::getpid(), SIGHUP);
    EXPECT_EQ(first.get_future().wait_for(untilItComes), std::future_status::ready);
    std::promise<void> second;
    m_interrupt->setHangUpHandler([&second] { second.set_value(); });
    ::kill(::getpid(), SIGHUP);
    EXPECT_EQ(second.get_future().wait_for(untilItComes), std::future_status::ready) << "as often as it comes";
    EXPECT_FALSE(m_interrupt->raised());
    m_interrupt->setHangUpHandler(nullptr);
    ::kill(::getpid(), SIGHUP);
    EXPECT_TRUE(isRaised());
    m_interrupt.reset();
    EXPECT_EQ(ends, 1);
}

TEST_F(Interrupted, ACommandIsStoppedWhileItRuns)
{
    InterruptStop const stop;
    std::promise<void> stopped;
    std::stop_callback const callback(stop.token(), [&stopped] { stopped.set_value(); });
    ::kill(::getpid(), SIGINT);
    EXPECT_EQ(stopped.get_future().wait_for(untilItComes), std::future_status::ready);
}

TEST_F(Interrupted, ACommandThatHasEndedHearsNothing)
{
    std::optional<InterruptStop> stop(std::in_place);
    std::stop_token const token = stop->token();
    stop.reset();
    ::kill(::getpid(), SIGINT);
    EXPECT_TRUE(isRaised());
    m_interrupt.reset(); // no handler runs behind it
    EXPECT_FALSE(token.stop_requested());
}

TEST(LastResort, ActsWhenAnEndTakesTooLong)
{
    std::promise<void> acted;
    LastResort resort;
    resort.arm(milliseconds(1), [&acted] { acted.set_value(); });
    EXPECT_EQ(acted.get_future().wait_for(untilItComes), std::future_status::ready);
}

TEST(LastResort, IsCalledOffByAnEnd)
{
    int acts = 0;
    auto const start = std::chrono::steady_clock::now();
    {
        LastResort resort;
        resort.arm(hours(1), [&acts] { ++acts; });
        resort.arm(milliseconds(0), [&acts] { ++acts; });
    }
    EXPECT_EQ(acts, 0) << "the first one counts";
    EXPECT_LT(std::chrono::steady_clock::now() - start, untilItComes);
}

} // namespace
