// Who waits at a port is woken by what happens there, and asks no more of it than it must.

#include "libvelmora/channel/plainchannel.h"
#include "libvelmora/channel/portwire.h"
#include "libvelmora/channel/turn.h"
#include "tests/support/wire/scriptedwire.h"

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <future>

namespace velmora {

namespace {

using namespace std::chrono_literals;

// What happens to a port with a thread of its own.
struct PortEvents
{
    IPort::Receiver say;
    IPort::LossHandler lose;
    std::atomic<int> closings{0};
};

class WatchedPort : public IPort
{
public:
    explicit WatchedPort(PortEvents& events) : m_events(events) {}
    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_events.say = std::move(onBytes);
        m_events.lose = std::move(onLost);
    }
    void write(std::string_view /*bytes*/) override {}
    void close() override { ++m_events.closings; }

private:
    PortEvents& m_events;
};

// What a read brings that has waited for an event, and whether it ended by it.
std::string readDuring(PortWire& wire, std::function<void()> const& event)
{
    auto const start = std::chrono::steady_clock::now();
    auto reading = std::async(std::launch::async, [&wire] { return wire.read(wire.now() + WireTime(8000)); });
    EXPECT_EQ(reading.wait_for(20ms), std::future_status::timeout) << "there is nothing yet";
    event();
    std::string const text = reading.get();
    return text + (std::chrono::steady_clock::now() - start < 5s ? "|in time" : "|late");
}

TEST(WaitingRead, EndsByBytesByALossAndByGivingUp)
{
    PortEvents events;
    {
        PortWire wire(std::make_unique<WatchedPort>(events));
        EXPECT_EQ(readDuring(wire, [&] { events.say("41 0C>"); }), "41 0C>|in time");
        EXPECT_EQ(readDuring(wire, [&] { wire.giveUp(); }), "|in time");
        EXPECT_EQ(wire.read(wire.now() + WireTime(8000)), "") << "nor does the next one wait";
        EXPECT_TRUE(wire.resume());
        EXPECT_EQ(readDuring(wire, [&] { events.lose(); }), "|in time");
        EXPECT_FALSE(wire.isUp());
        EXPECT_TRUE(wire.lost());
        EXPECT_FALSE(wire.resume());
        EXPECT_EQ(events.closings, 0);
    }
    EXPECT_EQ(events.closings, 1);
}

TEST(WaitingRead, WaitsNoLongerThanToldAndLooksWithoutWaiting)
{
    PortEvents events;
    PortWire wire(std::make_unique<WatchedPort>(events));
    WireTime const start = wire.now();
    EXPECT_EQ(wire.read(start + WireTime(30)), "");
    EXPECT_GE(wire.now() - start, WireTime(30));
    events.say("a");
    events.say("b");
    EXPECT_EQ(wire.read(WireTime(0)), "ab") << "what is there is brought, whatever the time";
    wire.giveUp();
    events.lose();
    EXPECT_FALSE(wire.lost()) << "it was given up before";
}

TEST(WaitingRead, AMegabyteThatNobodyReadsIsJustNotTooMuch)
{
    PortEvents events;
    PortWire wire(std::make_unique<WatchedPort>(events));
    events.say(std::string(1U << 20U, '>'));
    EXPECT_TRUE(wire.isUp());
    events.say(">");
    EXPECT_FALSE(wire.isUp());
    EXPECT_FALSE(wire.resume());
}

// A port that counts who asks for its link.
class AskedPort : public IPulledPort
{
public:
    explicit AskedPort(std::atomic<int>& asked) : m_asked(asked) {}
    void start(Receiver /*onBytes*/, LossHandler /*onLost*/) override {}
    void write(std::string_view /*bytes*/) override {}
    void close() override {}
    bool pull(std::string& /*bytes*/, Moment /*until*/) override { return true; }
    void interrupt() override {}
    bool isUp() override { return ++m_asked > 0; }

private:
    std::atomic<int>& m_asked;
};

TEST(WaitingRead, TheLinkOfAPortWithoutAThreadIsLookedAfterNowAndThen)
{
    for (bool const reads : {true, false}) {
        std::atomic<int> asked{0};
        PortWire wire(std::make_unique<AskedPort>(asked));
        auto const start = std::chrono::steady_clock::now();
        if (reads) {
            wire.read(wire.now());
        }
        for (int i = 0; i < 500; ++i) {
            EXPECT_TRUE(wire.isUp());
        }
        auto const passed = std::chrono::steady_clock::now() - start;
        EXPECT_LE(asked, passed / 99ms + (reads ? 0 : 1)) << "a read tells as well";
        EXPECT_GE(asked, reads ? 0 : 1);
    }
}

// A wire whose reads may end before their time, without a byte.
class RestlessWire : public support::TimedWire
{
public:
    void write(std::string_view /*bytes*/) override {}
    std::string read(WireTime until) override
    {
        if (++m_reads % 2 != 0 && isUp()) {
            return {};
        }
        return isUp() ? TimedWire::read(until) : std::string();
    }

private:
    int m_reads = 0;
};

TEST(PlainReceive, GoesOnBehindAReadThatBroughtNothing)
{
    auto const wire = std::make_shared<RestlessWire>();
    PlainChannel channel(wire);
    std::vector<unsigned char> bytes;
    wire->say("41 0C\r>", WireTime(50));
    EXPECT_TRUE(channel.receive(bytes, 100));
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()), "41 0C\r");
    WireTime const before = wire->now();
    EXPECT_FALSE(channel.receive(bytes, 100));
    EXPECT_EQ(wire->now() - before, WireTime(100));
    EXPECT_FALSE(channel.receive(bytes, -5));
    EXPECT_EQ(wire->now() - before, WireTime(100));
    wire->giveUp();
    EXPECT_FALSE(channel.receive(bytes, 100)) << "a link that is gone ends it at once";
    EXPECT_EQ(wire->now() - before, WireTime(100));
}

TEST(PlainReceive, HandsOnWhatHasNoEndInPiecesOfAMegabyte)
{
    constexpr std::size_t piece = 1U << 20U;
    auto const wire = std::make_shared<support::ScriptedWire>();
    PlainChannel channel(wire);
    std::vector<unsigned char> bytes;
    wire->say(std::string(piece, 'A'), WireTime(5));
    EXPECT_TRUE(channel.receive(bytes, 100));
    EXPECT_EQ(bytes.size(), piece);
    wire->say(std::string(piece - 1, 'A'), WireTime(5));
    EXPECT_FALSE(channel.receive(bytes, 100));
    wire->say(">b>", WireTime(5));
    EXPECT_TRUE(channel.receive(bytes, 100));
    EXPECT_EQ(bytes.size(), piece - 1);
    EXPECT_TRUE(channel.receive(bytes, 100));
    EXPECT_EQ(bytes, std::vector<unsigned char>{'b'});
}

TEST(Turn, IsOnesUntilItIsGivenBack)
{
    Turn turn;
    turn.lock();
    EXPECT_FALSE(turn.try_lock_for(1ms));
    auto const start = std::chrono::steady_clock::now();
    auto waiting = std::async(std::launch::async, [&turn] { return turn.try_lock_for(8s); });
    auto locking = std::async(std::launch::async, [&turn] { turn.lock(); });
    EXPECT_EQ(waiting.wait_for(20ms), std::future_status::timeout);
    EXPECT_EQ(locking.wait_for(1ms), std::future_status::timeout);
    turn.unlock();
    while (waiting.wait_for(1ms) == std::future_status::timeout &&
           locking.wait_for(1ms) == std::future_status::timeout) {
    }
    bool const waiterFirst = waiting.wait_for(0ms) == std::future_status::ready;
    EXPECT_FALSE(turn.try_lock_for(1ms)) << "one of them has it";
    turn.unlock();
    EXPECT_TRUE(waiting.get());
    locking.get();
    EXPECT_FALSE(turn.try_lock_for(1ms)) << (waiterFirst ? "the second" : "the first");
    turn.unlock();
    EXPECT_TRUE(turn.try_lock_for(1ms));
    EXPECT_LT(std::chrono::steady_clock::now() - start, 5s);
}

} // namespace

} // namespace velmora
