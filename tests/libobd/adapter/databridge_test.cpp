#include "tests/support/bytes.h"
#include "tests/support/logcapture.h"

#include <obd/databridge.h>
#include <obd/idataconnection.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <latch>
#include <memory>
#include <thread>

namespace {

using namespace std::chrono_literals;
using support::bytes;
using support::text;
using testing::ElementsAre;
using testing::IsEmpty;
using Bytes = std::vector<unsigned char>;

struct NamedTap : obd::IConnectionLogger
{
    explicit NamedTap(std::vector<std::string>& sink, std::string tag = {}) : lines(sink), name(std::move(tag)) {}
    void onDataSent(Bytes const& data) override { lines.push_back(name + ">" + text(data)); }
    void onDataReceived(Bytes const& data) override { lines.push_back(name + "<" + text(data)); }

    std::vector<std::string>& lines;
    std::string name;
};

class DataBridge : public testing::Test
{
protected:
    DataBridge() { m_bridge.setDelimiter('>'); }

    // Everything that is queued, without waiting.
    std::vector<std::string> received()
    {
        std::vector<std::string> all;
        for (Bytes message; m_bridge.receive(message, 0);) {
            all.push_back(text(message));
        }
        return all;
    }

    std::string taken()
    {
        Bytes out;
        m_bridge.get(out);
        return text(out);
    }

    obd::DataBridge m_bridge;
};

TEST_F(DataBridge, DelimiterEndsAMessageAndIsNoPartOfIt)
{
    m_bridge.set(bytes("41 00\r\r>"));
    EXPECT_THAT(received(), ElementsAre("41 00\r\r"));
    m_bridge.set(bytes(">"));
    EXPECT_THAT(received(), ElementsAre("")) << "nothing may have been left over";
}

TEST_F(DataBridge, TwoDelimitersAreTwoEmptyMessages)
{
    m_bridge.set(bytes(">>"));
    Bytes out = bytes("old");
    EXPECT_TRUE(m_bridge.receive(out, 0));
    EXPECT_THAT(out, IsEmpty());
    out = bytes("old");
    EXPECT_TRUE(m_bridge.receive(out, 0));
    EXPECT_THAT(out, IsEmpty());
    EXPECT_FALSE(m_bridge.receive(out, 0));
}

TEST_F(DataBridge, PiecesAreJoinedToOneMessage)
{
    m_bridge.set(bytes("OK"));
    EXPECT_THAT(received(), IsEmpty());
    m_bridge.set(bytes("\r>"));
    EXPECT_THAT(received(), ElementsAre("OK\r"));
}

TEST_F(DataBridge, SeveralMessagesInOnePieceComeOutOldestFirst)
{
    m_bridge.set(bytes("a>b>>c"));
    EXPECT_THAT(received(), ElementsAre("a", "b", ""));
    m_bridge.set(bytes(">"));
    EXPECT_THAT(received(), ElementsAre("c"));
}

TEST_F(DataBridge, NothingDeliveredQueuesNothing)
{
    m_bridge.set({});
    EXPECT_THAT(received(), IsEmpty());
}

TEST_F(DataBridge, EveryOtherByteValueIsData)
{
    Bytes all;
    for (int value = 0; value < 256; ++value) {
        if (value != '>') {
            all.push_back(static_cast<unsigned char>(value));
        }
    }
    m_bridge.set(all);
    m_bridge.set(bytes(">"));
    Bytes out;
    ASSERT_TRUE(m_bridge.receive(out, 0));
    EXPECT_EQ(out, all);
}

TEST_F(DataBridge, DelimiterAboveSevenBitsIsFound)
{
    m_bridge.setDelimiter('\xFC');
    m_bridge.set({0x41, 0xFC, 0x42});
    EXPECT_THAT(received(), ElementsAre("A"));
}

TEST_F(DataBridge, DelimiterIsNulUntilItIsSet)
{
    obd::DataBridge fresh;
    fresh.set({'O', 'K', 0, '>'});
    Bytes out;
    EXPECT_TRUE(fresh.receive(out, 0));
    EXPECT_EQ(text(out), "OK");
    EXPECT_FALSE(fresh.receive(out, 0));
}

TEST_F(DataBridge, ReceiveWithoutTimeReturnsAtOnce)
{
    Bytes out = bytes("untouched");
    EXPECT_FALSE(m_bridge.receive(out, 0));
    EXPECT_FALSE(m_bridge.receive(out, -1000));
    EXPECT_EQ(text(out), "untouched");

    m_bridge.set(bytes("first>second>"));
    EXPECT_TRUE(m_bridge.receive(out, 0));
    EXPECT_EQ(text(out), "first");
    EXPECT_TRUE(m_bridge.receive(out, -1000));
    EXPECT_EQ(text(out), "second");
}

TEST_F(DataBridge, ReceiveWaitsItsTimeOut)
{
    Bytes out = bytes("untouched");
    auto const start = std::chrono::steady_clock::now();
    EXPECT_FALSE(m_bridge.receive(out, 5));
    EXPECT_GE(std::chrono::steady_clock::now() - start, 5ms);
    EXPECT_EQ(text(out), "untouched");
}

TEST_F(DataBridge, WaitingReceiverIsWokenByAMessage)
{
    auto const start = std::chrono::steady_clock::now();
    for (int round = 0; round < 50; ++round) { // in most of them it does wait
        std::latch there(1);
        std::thread port([&] {
            there.wait();
            m_bridge.set(bytes("41 0C"));
            m_bridge.set(bytes("\r>"));
        });
        Bytes out;
        there.count_down();
        EXPECT_TRUE(m_bridge.receive(out, 60'000));
        EXPECT_EQ(text(out), "41 0C\r");
        port.join();
    }
    EXPECT_LT(std::chrono::steady_clock::now() - start, 60s) << "by the end of its time instead";
}

TEST_F(DataBridge, GetTakesEverythingAtOnce)
{
    m_bridge.send(bytes("ATZ\r"));
    m_bridge.send(bytes("ATI\r"));
    Bytes out = bytes("old");
    EXPECT_TRUE(m_bridge.get(out));
    EXPECT_EQ(text(out), "ATZ\rATI\r");
}

TEST_F(DataBridge, GetOnAnIdleBridgeWaitsATenthOfASecond)
{
    Bytes out;
    auto const start = std::chrono::steady_clock::now();
    EXPECT_FALSE(m_bridge.get(out));
    EXPECT_GE(std::chrono::steady_clock::now() - start, 100ms);
    EXPECT_THAT(out, IsEmpty());

    out = bytes("mine");
    EXPECT_TRUE(m_bridge.get(out)) << "a full vector comes back as it was";
    EXPECT_EQ(text(out), "mine");
}

TEST_F(DataBridge, WaitingWriterIsWokenBySend)
{
    std::latch there(1);
    std::thread library([&] {
        there.wait();
        m_bridge.send(bytes("0100\r"));
    });
    // The writer loop of an application: it goes on looking until there is something.
    Bytes out;
    there.count_down();
    while (!m_bridge.get(out)) {
    }
    EXPECT_EQ(text(out), "0100\r");
    library.join();
}

TEST_F(DataBridge, InvalidateTellsWhoMadeTheChange)
{
    EXPECT_TRUE(m_bridge.isValid());
    EXPECT_TRUE(m_bridge.invalidate());
    EXPECT_FALSE(m_bridge.isValid());
    EXPECT_FALSE(m_bridge.invalidate());
    EXPECT_FALSE(m_bridge.isValid());
}

TEST_F(DataBridge, InvalidBridgeStillMovesBytes)
{
    m_bridge.invalidate();
    m_bridge.send(bytes("ATLP\r"));
    EXPECT_EQ(taken(), "ATLP\r");
    m_bridge.set(bytes("OK>"));
    EXPECT_THAT(received(), ElementsAre("OK"));
}

TEST_F(DataBridge, InvalidateFromManyThreadsSucceedsOnce)
{
    std::atomic<int> changes{0};
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i) {
        threads.emplace_back([&] { changes += m_bridge.invalidate() ? 1 : 0; });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(changes, 1);
}

TEST_F(DataBridge, ChangedDelimiterLeavesQueuedMessagesAndRescansTheRest)
{
    m_bridge.set(bytes("a\rb>c\rd\re"));
    m_bridge.setDelimiter('\r');
    EXPECT_THAT(received(), ElementsAre("a\rb")) << "queued before the change";
    m_bridge.set(bytes("f"));
    EXPECT_THAT(received(), ElementsAre("c", "d"));
    m_bridge.set(bytes("\r"));
    EXPECT_THAT(received(), ElementsAre("ef"));
}

TEST_F(DataBridge, TapsSeeWhatIsSentAndWhatIsTakenInTheOrderOfRegistration)
{
    std::vector<std::string> lines;
    NamedTap first(lines, "1");
    NamedTap second(lines, "2");
    m_bridge.addLogger(&first);
    m_bridge.addLogger(&second);
    m_bridge.send(bytes("ATI\r"));
    m_bridge.set(bytes("ELM327 v1.5\r\r>"));
    EXPECT_THAT(lines, ElementsAre("1>ATI\r", "2>ATI\r")) << "received messages are told when they are taken";
    received();
    EXPECT_THAT(lines, ElementsAre("1>ATI\r", "2>ATI\r", "1<ELM327 v1.5\r\r", "2<ELM327 v1.5\r\r"));
}

TEST_F(DataBridge, TapAddedTwiceIsCalledTwiceAndRemovedOneAtATime)
{
    std::vector<std::string> lines;
    NamedTap tap(lines);
    m_bridge.addLogger(&tap);
    m_bridge.addLogger(&tap);
    m_bridge.send(bytes("a"));
    EXPECT_THAT(lines, ElementsAre(">a", ">a"));
    m_bridge.removeLogger(&tap);
    m_bridge.send(bytes("b"));
    EXPECT_THAT(lines, ElementsAre(">a", ">a", ">b"));
    m_bridge.removeLogger(&tap);
    m_bridge.send(bytes("c"));
    EXPECT_THAT(lines, ElementsAre(">a", ">a", ">b"));
}

TEST_F(DataBridge, RemovingATapThatWasNeverAddedDoesNothing)
{
    std::vector<std::string> lines;
    NamedTap tap(lines);
    NamedTap stranger(lines);
    m_bridge.addLogger(&tap);
    m_bridge.removeLogger(&stranger);
    m_bridge.removeLogger(nullptr);
    m_bridge.send(bytes("a"));
    EXPECT_THAT(lines, ElementsAre(">a"));
}

TEST_F(DataBridge, TapsComeAndGoWhileTrafficFlows)
{
    // Plain fields on purpose: each side counts under that side's lock, and after its removal only this thread looks.
    struct Counter : obd::IConnectionLogger
    {
        int sent = 0;
        int taken = 0;
        void onDataSent(Bytes const& /*data*/) override { ++sent; }
        void onDataReceived(Bytes const& /*data*/) override { ++taken; }
    };
    std::atomic<bool> running{true};
    // Goes on until the last request is answered, so that nobody waits in vain.
    std::thread port([&] {
        while (m_bridge.isValid()) {
            Bytes out;
            if (m_bridge.get(out)) {
                out.push_back('>');
                m_bridge.set(out);
            }
        }
    });
    std::atomic<int> exchanges{0};
    std::thread library([&] {
        Bytes reply;
        while (running) {
            m_bridge.send(bytes("010C\r"));
            exchanges += m_bridge.receive(reply, 1000) ? 1 : 0;
        }
    });

    int seen = 0;
    for (int round = 0; round < 50; ++round) {
        auto counter = std::make_unique<Counter>();
        int const before = exchanges;
        m_bridge.addLogger(counter.get());
        while (exchanges < before + 2) { // the second of them began under the tap
            std::this_thread::yield();
        }
        m_bridge.removeLogger(counter.get());
        seen += counter->sent + counter->taken;
    }
    running = false;
    library.join();
    m_bridge.invalidate();
    m_bridge.send(bytes("\r")); // wakes the port
    port.join();
    EXPECT_GT(exchanges, 0);
    EXPECT_GT(seen, 0);
}

TEST_F(DataBridge, BothSidesKeepEveryByteInOrderUnderLoad)
{
    constexpr int count = 2000;
    std::thread port([this] {
        Bytes all;
        while (std::count(all.begin(), all.end(), '\r') < count) {
            Bytes out;
            if (m_bridge.get(out)) {
                all.insert(all.end(), out.begin(), out.end());
                std::replace(out.begin(), out.end(), static_cast<unsigned char>('\r'), static_cast<unsigned char>('>'));
                m_bridge.set(out);
            }
        }
    });
    for (int i = 0; i < count; ++i) {
        m_bridge.send(bytes(std::to_string(i) + "\r"));
    }
    for (int i = 0; i < count; ++i) {
        Bytes out;
        ASSERT_TRUE(m_bridge.receive(out, 60'000));
        ASSERT_EQ(text(out), std::to_string(i));
    }
    port.join();
}

// As an adapter at the wrong line rate, or none at all, may send without an end.
TEST_F(DataBridge, AFloodEndsTheChannelAndTakesNoMoreMemory)
{
    for (std::string const& piece : {std::string(4096, '>'), std::string(4096, 'x')}) {
        support::LogCapture log;
        obd::DataBridge bridge;
        bridge.setDelimiter('>');
        for (int i = 0; bridge.isValid(); ++i) {
            ASSERT_LT(i, 4200) << "16 MB in pieces of 4 KB";
            bridge.set(bytes(piece));
        }
        bridge.set(bytes(piece));
        EXPECT_THAT(log.lines(), ElementsAre("ERROR Too many unread bytes from the adapter: invalidate the channel"));
    }
}

// Looking through the kept bytes anew for each piece would take minutes.
TEST_F(DataBridge, ALongReplyMayComeByteByByte)
{
    for (int i = 0; i < 300000; ++i) {
        m_bridge.set({'x'});
    }
    m_bridge.set({'>'});
    EXPECT_EQ(received(), std::vector<std::string>{std::string(300000, 'x')});
}

TEST_F(DataBridge, WhatWasReadMakesRoom)
{
    Bytes const longReply(1024 * 1024, 'x');
    for (int i = 0; i < 40; ++i) {
        m_bridge.set(longReply);
        m_bridge.set(bytes(">"));
        Bytes out;
        ASSERT_TRUE(m_bridge.receive(out, 0));
        ASSERT_EQ(out, longReply);
    }
    EXPECT_TRUE(m_bridge.isValid());
}

} // namespace
