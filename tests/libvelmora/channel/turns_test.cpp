// Receiving and sending: what is waited for, and whose turn it is.

#include "tests/libvelmora/channel/channelrig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <condition_variable>
#include <future>
#include <mutex>

namespace velmora {

namespace {

using test::ChannelRig;
using testing::ElementsAre;
using testing::Optional;
using Parts = support::ScriptedWire::Reply;

// How far a receive moves the clock, and whether it brought something.
std::string receiveIn(ChannelRig& rig, int timeoutMs)
{
    WireTime const before = rig.wire->now();
    std::vector<unsigned char> bytes;
    bool const came = rig.channel.receive(bytes, timeoutMs);
    return std::to_string((rig.wire->now() - before).count()) + (came ? "+" : "-");
}

TEST(Receive, WaitsForAnAdapterThatMayBeStarting)
{
    ChannelRig rig;
    EXPECT_EQ(receiveIn(rig, 200), "200-") << "its banner may come";
    rig.ask("ATE0");
    EXPECT_EQ(receiveIn(rig, 200), "1-") << "nothing can, but for a second piece";
    EXPECT_EQ(receiveIn(rig, 0), "0-");
    EXPECT_EQ(receiveIn(rig, -7), "0-");
    rig.ask("ATZ");
    EXPECT_EQ(receiveIn(rig, 200), "200-") << "it starts anew";
    rig.ask("ATE0");
    EXPECT_EQ(receiveIn(rig, 200), "1-");
}

TEST(Receive, OfWhatIsUnderWayTakesItsTimeAndNoMore)
{
    ChannelRig rig;
    rig.wire->on("ATDP", Parts{{"AUTO\r", WireTime(250)}, {"\r>", WireTime(0)}});
    std::string const line = "ATDP\r";
    rig.channel.send({line.begin(), line.end()});
    EXPECT_TRUE(rig.channel.statistics().unanswered);
    EXPECT_EQ(receiveIn(rig, 0), "0-");
    EXPECT_EQ(receiveIn(rig, -5), "0-");
    EXPECT_EQ(receiveIn(rig, 250), "250+") << "all that comes in the last moment";
    EXPECT_FALSE(rig.channel.statistics().unanswered);
}

// A grace is lost where nothing could come; four of them are enough, those of exchanges do not count.
TEST(Receive, HurriesOnceGracesWereInVain)
{
    ChannelRig rig;
    rig.ask("ATE0");
    for (int i = 0; i < 6; ++i) {
        EXPECT_EQ(receiveIn(rig, 0), "0-");
    }
    rig.wire->on("ATDP", Parts{{"AUTO\r\r>", WireTime(500)}});
    std::string const line = "ATDP\r";
    rig.channel.send({line.begin(), line.end()});
    for (int i = 0; i < 5; ++i) {
        EXPECT_EQ(receiveIn(rig, 10), "10-");
    }
    EXPECT_EQ(receiveIn(rig, 500), "450+");
    for (int i = 0; i < 4; ++i) {
        EXPECT_EQ(receiveIn(rig, 200), "1-") << i;
    }
    EXPECT_EQ(receiveIn(rig, 200), "0-");
    rig.wire->say("late\r>", WireTime(0));
    EXPECT_EQ(receiveIn(rig, 0), "0-") << "the next command finds it";
    EXPECT_EQ(receiveIn(rig, 1), "0+") << "unless it is waited for";
    rig.wire->say("late", WireTime(0));
    rig.ask("ATE0");
    EXPECT_EQ(rig.met(Habit::StaleReply), 1U);
    EXPECT_EQ(receiveIn(rig, 200), "1-") << "an adapter that says things unasked is listened to";
}

TEST(Receive, OfARememberedReplyLeavesTheHasteAsItIs)
{
    ChannelRig rig;
    rig.bringUp();
    rig.ask("0100");
    for (int i = 0; i < 2; ++i) {
        EXPECT_THAT(rig.ask("0100"), Optional(std::string("7E8064100BE3EA813")));
    }
    EXPECT_EQ(rig.channel.statistics().fromMemory, 2U);
    for (int i = 0; i < 5; ++i) {
        receiveIn(rig, 200);
    }
    EXPECT_EQ(receiveIn(rig, 200), "0-");
}

TEST(Send, LeavesNoOlderReplyBehind)
{
    ChannelRig rig;
    rig.bringUp();
    rig.ask("0100");
    std::string const remembered = "0100\r";
    rig.channel.send({remembered.begin(), remembered.end()}); // whose reply nobody takes
    rig.wire->on("ATRV", "12.6V");
    std::string const line = "ATRV\r";
    rig.channel.send({line.begin(), line.end()});
    std::vector<unsigned char> bytes;
    ASSERT_TRUE(rig.channel.receive(bytes, 500));
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()), "12.6V\r");
    EXPECT_FALSE(rig.channel.receive(bytes, 500));
}

TEST(Send, OfTheFarewellIsAnsweredOnce)
{
    ChannelRig rig;
    rig.connect();
    std::string const farewell = "at lp\r";
    rig.channel.send({farewell.begin(), farewell.end()});
    std::vector<unsigned char> bytes;
    EXPECT_TRUE(rig.channel.receive(bytes, 0));
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()), "OK\r");
    EXPECT_FALSE(rig.channel.receive(bytes, 0));
    rig.channel.invalidate();
    rig.channel.send({'A', 'T', 'I', '\r'});
    EXPECT_THAT(rig.wire->takeCommands(), testing::IsEmpty());
}

// A wire whose reads last until they are let go.
class HeldWire : public support::ScriptedWire
{
public:
    std::string read(WireTime until) override
    {
        if (until > now()) {
            std::unique_lock lock(m_mutex);
            m_waits.set_value();
            m_waits = {};
            m_free.wait(lock, [this] { return m_isFree; });
        }
        return ScriptedWire::read(until);
    }
    bool isUp() const override { return m_isUp; }
    void giveUp() override { m_isUp = false; }
    std::future<void> nextWait()
    {
        std::lock_guard const lock(m_mutex);
        return m_waits.get_future();
    }
    void letGo()
    {
        std::lock_guard const lock(m_mutex);
        m_isFree = true;
        m_free.notify_all();
    }

private:
    std::atomic<bool> m_isUp{true}; // asked by all threads
    std::mutex m_mutex;
    std::condition_variable m_free;
    std::promise<void> m_waits; // protected by m_mutex, as what follows
    bool m_isFree = false;
};

TEST(Send, WaitsForAnotherThreadsExchangeButTheFarewellDoesNot)
{
    auto const wire = std::make_shared<HeldWire>();
    FastChannel channel(wire, {});
    wire->on("ATRV", "12.6V");
    auto waits = wire->nextWait();
    auto first = std::async(std::launch::async, [&channel] { return test::speak(channel, "ATI", 1000); });
    waits.wait();
    std::vector<unsigned char> bytes;
    EXPECT_FALSE(channel.receive(bytes, 5)) << "the reply is the other's";
    std::string const farewell = "ATLP\r";
    channel.send({farewell.begin(), farewell.end()});
    EXPECT_TRUE(channel.receive(bytes, 5));
    EXPECT_EQ(std::string(bytes.begin(), bytes.end()), "OK\r");
    auto second = std::async(std::launch::async, [&channel] {
        std::string const line = "ATRV\r";
        channel.send({line.begin(), line.end()});
    });
    EXPECT_EQ(second.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    wire->letGo();
    EXPECT_THAT(first.get(), Optional(std::string("OK")));
    second.get();
    EXPECT_THAT(wire->takeCommands(), ElementsAre("ATI", "ATRV"));
}

TEST(Send, ThatWaitsEndsWithTheLink)
{
    auto const wire = std::make_shared<HeldWire>();
    FastChannel channel(wire, {});
    auto waits = wire->nextWait();
    auto first = std::async(std::launch::async, [&channel] { return test::speak(channel, "ATI", 1000); });
    waits.wait();
    auto const start = std::chrono::steady_clock::now();
    auto second = std::async(std::launch::async, [&channel] {
        std::string const line = "ATRV\r";
        channel.send({line.begin(), line.end()});
    });
    EXPECT_EQ(second.wait_for(std::chrono::milliseconds(20)), std::future_status::timeout);
    channel.invalidate();
    second.get();
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(3));
    wire->letGo();
    first.get();
    EXPECT_THAT(wire->takeCommands(), ElementsAre("ATI"));
}

} // namespace

} // namespace velmora
