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
            adapter.say = std::move(onBytes);
            adapter.drop = std::move(onLost);
        }
        void write(std::string_view bytes) override
        {
            adapter.written.emplace_back(bytes);
            adapter.say(adapter.answers[std::string(bytes)]);
        }
        void close() override {}

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
    adapter.reachable = true;
    EXPECT_TRUE(nap.isOver());
    EXPECT_EQ(adapter.written.size(), 2U);
}

TEST(AdapterNap, OneThatKnowsNoSleepIsToldApart)
{
    NapAdapter adapter;
    adapter.answers["STSLEEP\r"] = adapter.answers["ATLP\r"] = "?\r\r>";
    EXPECT_FALSE(AdapterNap(adapter.opener(), 1ms).sleeps());
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
}

} // namespace
