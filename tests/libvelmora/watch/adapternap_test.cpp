#include "libvelmora/watch/adapternap.h"
#include "libvelmora/watch/requestcount.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <map>
#include <vector>

namespace {

using namespace std::chrono_literals;
using velmora::AdapterNap;

// An adapter on a wire or in the air, as a script of answers.
struct NapAdapter
{
    std::map<std::string, std::string> answers = {{"\r", ">"}};
    std::vector<std::string> written;
    bool reachable = true;
    bool starts = true;
    int closed = 0;
    velmora::IPort::Receiver say;
    velmora::IPort::LossHandler drop;

    AdapterNap::Open opener()
    {
        return [this]() -> std::unique_ptr<velmora::IPort> {
            if (!reachable) {
                throw velmora::Error(velmora::ErrorKind::PortFailed, "out of reach");
            }
            return std::make_unique<Port>(*this);
        };
    }

private:
    struct Port : velmora::IPort
    {
        explicit Port(NapAdapter& theAdapter) : adapter(theAdapter) {}
        void start(Receiver onBytes, LossHandler onLost) override
        {
            if (!adapter.starts) {
                throw velmora::Error(velmora::ErrorKind::PortFailed, "breaks at once");
            }
            adapter.say = std::move(onBytes);
            adapter.drop = std::move(onLost);
        }
        void write(std::string_view bytes) override
        {
            adapter.written.emplace_back(bytes);
            adapter.say(adapter.answers[std::string(bytes)]);
        }
        void close() override { ++adapter.closed; }

        NapAdapter& adapter;
    };
};

TEST(AdapterNap, OneOnAWireSaysSomethingWhenItWakes)
{
    NapAdapter adapter;
    adapter.answers["STSLEEP\r"] = "?\r\r>";
    adapter.answers["ATLP\r"] = "OK\r\r>";
    AdapterNap nap(adapter.opener(), 1ms);
    EXPECT_TRUE(nap.sleeps());
    EXPECT_EQ(adapter.written, (std::vector<std::string>{"\r", "STSLEEP\r", "ATLP\r"}));
    EXPECT_FALSE(nap.isOver());
    EXPECT_FALSE(nap.isOver());
    EXPECT_EQ(adapter.written.size(), 3U); // any byte would wake it
    adapter.say("ELM327 v1.5");
    EXPECT_TRUE(nap.isOver());
}

TEST(AdapterNap, AWirelessOneCanBeReachedAgainWhenItWakes)
{
    NapAdapter adapter;
    adapter.answers["STSLEEP\r"] = "OK\r\r>";
    AdapterNap nap(adapter.opener(), 1ms);
    EXPECT_TRUE(nap.sleeps());
    adapter.reachable = false;
    adapter.drop();
    EXPECT_FALSE(nap.isOver());
    EXPECT_FALSE(nap.isOver());
    EXPECT_EQ(adapter.closed, 1);
    adapter.reachable = true;
    adapter.starts = false;
    EXPECT_FALSE(nap.isOver());
    EXPECT_FALSE(nap.isOver()) << "it did not come up";
    adapter.starts = true;
    EXPECT_TRUE(nap.isOver());
    EXPECT_EQ(adapter.written.size(), 2U);
}

TEST(AdapterNap, LetsGoOfThePortAtItsEnd)
{
    NapAdapter adapter;
    adapter.answers["STSLEEP\r"] = "OK\r\r>\r\n";
    {
        AdapterNap nap(adapter.opener(), 1ms);
        EXPECT_TRUE(nap.sleeps());
        EXPECT_FALSE(nap.isOver()) << "the rest of its answer wakes nobody";
        EXPECT_EQ(adapter.closed, 0);
    }
    EXPECT_EQ(adapter.closed, 1);
    {
        AdapterNap nap(adapter.opener(), 1ms);
        adapter.drop();
        EXPECT_FALSE(nap.isOver());
    }
    EXPECT_EQ(adapter.closed, 2) << "that was closed already";
}

TEST(AdapterNap, OneThatKnowsNoSleepIsToldApart)
{
    NapAdapter adapter;
    adapter.answers["STSLEEP\r"] = adapter.answers["ATLP\r"] = "?\r\r>";
    EXPECT_FALSE(AdapterNap(adapter.opener(), 1ms).sleeps());
    auto const begin = std::chrono::steady_clock::now();
    NapAdapter silent;
    silent.answers.clear();
    for (int i = 0; i < 4; ++i) {
        EXPECT_FALSE(AdapterNap(silent.opener(), 1ms).sleeps());
    }
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 1150ms) << "no longer than the limit each";
    adapter.reachable = false;
    EXPECT_THROW(AdapterNap(adapter.opener(), 1ms), velmora::Error);
}

TEST(RequestCount, CountsWhatGoesToControlModules)
{
    velmora::RequestCount count;
    auto const bytes = [](std::string const& text) { return std::vector<unsigned char>(text.begin(), text.end()); };
    for (char const* const sent : {"010C\r", "22 F1 90\r", "ATRV\r", "ATZ\r", "\r", "STSLEEP\r"}) {
        count.onDataSent(bytes(sent));
    }
    count.onDataReceived(bytes("NO DATA\r\r>"));
    count.onDataReceived(bytes("41 0C 1A F8\r\r>"));
    EXPECT_EQ(count.requests(), 2U);
    EXPECT_EQ(count.errors(), 1U);
    for (char const* const told :
         {"UNABLE TO CONNECT\r", "BUS ERROR\r", "NO DATA\rCAN ERROR\r", "UNABLE, ERROR", "OK"}) {
        count.onDataReceived(bytes(told));
    }
    EXPECT_EQ(count.errors(), 5U) << "one each, but for OK";
    count.onDataSent(bytes("5"));
    EXPECT_EQ(count.requests(), 2U) << "half a byte asks nothing";
}

TEST(RequestCount, PassesTheDialogueOn)
{
    std::string dialogue;
    velmora::RequestCount count(
        [&dialogue](bool sent, std::string_view text) { dialogue += (sent ? ">" : "<") + std::string(text); });
    count.onDataSent({'0', '1', '0', '0', '\r'});
    count.onDataReceived({'N', 'O', ' ', 'D', 'A', 'T', 'A'});
    EXPECT_EQ(dialogue, ">0100\r<NO DATA");
    EXPECT_EQ(count.requests() + count.errors(), 2U);
}

} // namespace
