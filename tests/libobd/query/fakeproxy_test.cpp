#include "tests/support/fakeproxy.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>

// The fake that the tests of queries and services lean on keeps its own word.

namespace {

using support::FakeProxy;
using DeviceStatus = obd::IDevice::Status;

class FakeProxyTest : public testing::Test
{
protected:
    FakeProxy proxy;
    obd::ResponseMap replies;

    DeviceStatus ask(std::vector<unsigned char> const& request)
    {
        replies.clear();
        return proxy.execute(request, replies, 1500);
    }
};

TEST_F(FakeProxyTest, StandingAnswersComeEachTime)
{
    proxy.answer("01 0C", "41 0C 1A F8");
    proxy.answer("01 0D", {{0x7E8, "41 0D 50"}, {0x7E9, "7F 01 12"}});
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(ask({0x01, 0x0C}), DeviceStatus::Ok);
        EXPECT_EQ(replies, (obd::ResponseMap{{0x7E8, {0x41, 0x0C, 0x1A, 0xF8}}}));
    }
    EXPECT_EQ(ask({0x01, 0x0D}), DeviceStatus::Ok);
    EXPECT_EQ(replies, (obd::ResponseMap{{0x7E8, {0x41, 0x0D, 0x50}}, {0x7E9, {0x7F, 0x01, 0x12}}}));
    EXPECT_EQ(proxy.count(), 3);
    EXPECT_EQ(proxy.count("010C"), 2);
    EXPECT_EQ(proxy.requests().back(), (std::vector<unsigned char>{0x01, 0x0D}));
    EXPECT_EQ(proxy.lastTimeout(), 1500U);
    EXPECT_EQ(proxy.mostAtOnce(), 1);
}

TEST_F(FakeProxyTest, AnswersForOnceGoFirstInTheirOrder)
{
    proxy.answer("03", "43 00");
    proxy.answerOnce("03", "43 01 01 33");
    proxy.failOnce("03", DeviceStatus::NotSent);
    EXPECT_EQ(ask({0x03}), DeviceStatus::Ok);
    EXPECT_EQ(replies[0x7E8].size(), 4U);
    EXPECT_EQ(ask({0x03}), DeviceStatus::NotSent);
    EXPECT_EQ(ask({0x03}), DeviceStatus::Ok);
    EXPECT_EQ(replies[0x7E8].size(), 2U);
}

TEST_F(FakeProxyTest, UnknownRequestsGetNoResponseOrWhatIsSaid)
{
    EXPECT_EQ(ask({0x09}), DeviceStatus::NoResponse);
    proxy.otherwise(DeviceStatus::Unparsed);
    EXPECT_EQ(ask({0x09}), DeviceStatus::Unparsed);
    proxy.fail("09", DeviceStatus::NotEnabled);
    EXPECT_EQ(ask({0x09}), DeviceStatus::NotEnabled);
    proxy.forgetAnswers();
    EXPECT_EQ(ask({0x09}), DeviceStatus::Unparsed);
    EXPECT_EQ(proxy.count(), 4);
    proxy.forgetRequests();
    EXPECT_EQ(proxy.count(), 0);
}

TEST_F(FakeProxyTest, ThrowsWhereTold)
{
    proxy.throwOnce("01 0C", "once");
    proxy.throwOn("01 0D", "always");
    EXPECT_THROW(ask({0x01, 0x0C}), std::runtime_error);
    EXPECT_EQ(ask({0x01, 0x0C}), DeviceStatus::NoResponse);
    EXPECT_THROW(ask({0x01, 0x0D}), std::runtime_error);
    EXPECT_THROW(ask({0x01, 0x0D}), std::runtime_error);
    EXPECT_EQ(proxy.mostAtOnce(), 1);
}

TEST_F(FakeProxyTest, CommandsHaveAnswersOfTheirOwn)
{
    proxy.answerCommand("ATRV", "12.4V");
    proxy.failCommand("ATXX", DeviceStatus::NotSent);
    std::string response = "before";
    EXPECT_EQ(proxy.execute("ATXX", response, 100), DeviceStatus::NotSent);
    EXPECT_EQ(proxy.execute("ATI", response, 100), DeviceStatus::NoResponse);
    EXPECT_EQ(response, "before");
    EXPECT_EQ(proxy.execute("ATRV", response, 100), DeviceStatus::Ok);
    EXPECT_EQ(response, "12.4V");
    EXPECT_EQ(proxy.commands(), (std::vector<std::string>{"ATXX", "ATI", "ATRV"}));
    EXPECT_EQ(proxy.count(), 0) << "commands are no requests";
}

TEST_F(FakeProxyTest, WithoutALinkNothingIsAsked)
{
    proxy.answer("01 0C", "41 0C 1A F8");
    proxy.setProtocol(obd::ObdProtocolJ1850);
    EXPECT_EQ(proxy.protocol(), obd::ObdProtocolJ1850);
    proxy.setConnected(false);
    EXPECT_FALSE(proxy.isConnected());
    EXPECT_EQ(proxy.protocol(), obd::ObdProtocolUnknown);
    EXPECT_EQ(ask({0x01, 0x0C}), DeviceStatus::Unparsed);
    EXPECT_EQ(proxy.count(), 0);
}

TEST_F(FakeProxyTest, HeldExchangesStayInsideUntilReleased)
{
    std::atomic<int> moved{0};
    proxy.during([&moved] { ++moved; });
    proxy.answer("01 0C", "41 0C 1A F8");
    proxy.hold();
    std::vector<std::thread> threads;
    for (int i = 0; i < 2; ++i) {
        threads.emplace_back([this] {
            obd::ResponseMap own;
            EXPECT_EQ(proxy.execute({0x01, 0x0C}, own, 100), DeviceStatus::Ok);
        });
        EXPECT_TRUE(proxy.awaitHeld(i + 1));
    }
    EXPECT_EQ(moved, 0);
    proxy.release();
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(moved, 2);
    EXPECT_EQ(proxy.mostAtOnce(), 2);
}

TEST_F(FakeProxyTest, ModulesComeInRisingOrderOfTheirId)
{
    EXPECT_EQ(proxy.firstEcu()->id(), 0x7E8U);
    proxy.setEcus({std::make_shared<support::FakeEcu>(0x7EA), std::make_shared<support::FakeEcu>(0x7E9)});
    ASSERT_EQ(proxy.ecus().size(), 2U);
    EXPECT_EQ(proxy.firstEcu()->id(), 0x7E9U);
    EXPECT_EQ(proxy.ecu(0x7EA)->id(), 0x7EAU);
    EXPECT_EQ(proxy.ecu(0x7E8), nullptr);
    proxy.setEcus({});
    EXPECT_EQ(proxy.firstEcu(), nullptr);
}

TEST_F(FakeProxyTest, TheRestIsAsSet)
{
    proxy.setBatteryVoltage(11.0F);
    EXPECT_EQ(proxy.batteryVoltage(), 11.0F);
    EXPECT_TRUE(proxy.initialize());
    proxy.setInitializeResult(false);
    EXPECT_FALSE(proxy.initialize());
    EXPECT_EQ(proxy.initializations(), 2);
    EXPECT_EQ(proxy.device(), nullptr);
}

} // namespace
