#include "tests/libvelmora/poll/pollcyclefixture.h"

namespace {

using support::FakeProxy;
using velmora::test::careful;
using velmora::test::fastAddressed;
using velmora::test::fastSingle;
using velmora::test::fastSix;
using velmora::test::PollCycleTest;

TEST_F(PollCycleTest, ReadsAsTheLibraryDoesAndKeepsTheFloor)
{
    m_proxy->answerOnce("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0C", "41 0C 0B B8");
    want(0x0C);
    run(careful, 300);
    ASSERT_EQ(m_results.size(), 10U); // one each 30 ms, though the answer is there after 12
    velmora::Reading const& reading = m_results.front().readings.front();
    EXPECT_EQ(reading.module, 0x7E8U);
    EXPECT_EQ(reading.sensor, "RPM");
    EXPECT_EQ(reading.pid, "010C");
    EXPECT_EQ(reading.name, "Engine RPM");
    EXPECT_EQ(std::get<double>(reading.value), 1726.0);
    EXPECT_EQ(reading.unit, "rpm");
    EXPECT_EQ(reading.precision, 0);
    EXPECT_EQ(reading.raw, support::hexBytes("41 0C 1A F8"));
    obd::SensorValueDataModel const& values = *m_results.back().values.front();
    EXPECT_EQ(values.value, "750");
    EXPECT_EQ(values.minimum, "750");
    EXPECT_EQ(values.maximum, "1726");
    EXPECT_EQ(values.mean, "848"); // (1726 + 9 * 750) / 10
    EXPECT_NEAR(m_cycle->rates().front().reached, 33.3, 0.1);
}

TEST_F(PollCycleTest, FastLeavesTheFloorOut)
{
    m_proxy->answer("01 0C", "41 0C 1A F8");
    want(0x0C);
    run(fastSingle, 300);
    EXPECT_EQ(m_results.size(), 25U);
}

TEST_F(PollCycleTest, SeveralPidsComeAsFarAsTheModuleProvesIt)
{
    for (int const pid : {0x0C, 0x0D, 0x05, 0x04, 0x11}) {
        want(pid);
    }
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D 05", "41 0D 50 05 7B");
    m_proxy->answer("01 0C 0D", "41 0C 1A F8 0D 50");
    m_proxy->answer("01 05 04 11", "41 11 33 05 7B 04 80");
    m_proxy->answer("01 0C 0D 05 04 11", "41 0C 1A F8 0D 50 05 7B 04 80 11 33");
    run(fastSix, 240);
    EXPECT_EQ(last(0x7E8, 0x0C), "1726");
    EXPECT_EQ(last(0x7E8, 0x0D), "80");
    EXPECT_EQ(last(0x7E8, 0x05), "83");
    EXPECT_EQ(last(0x7E8, 0x11), "20.0");
    auto const requests = m_proxy->requests();
    ASSERT_GE(requests.size(), 10U);
    EXPECT_EQ(requests[1], support::hexBytes("01 0D 05"));
    EXPECT_EQ(requests[3], support::hexBytes("01 05 04 11"));
    EXPECT_EQ(requests.back(), support::hexBytes("01 0C 0D 05 04 11"));
    EXPECT_GE(count(0x7E8, 0x0C), 14U); // in 240 ms: alone they would come 4 times
}

TEST_F(PollCycleTest, AModuleThatRefusesOrAnswersShortIsAskedSingly)
{
    for (char const* reply : {"7F 01 12", "41 0C 1A F8 0D", "41 0C 1A F8 00 00 00"}) {
        m_proxy->forgetRequests();
        m_results.clear();
        m_sources.clear();
        m_cycle.reset();
        want(0x0C);
        want(0x0D);
        m_proxy->answer("01 0C", "41 0C 1A F8");
        m_proxy->answer("01 0D", "41 0D 50");
        m_proxy->answer("01 0C 0D", reply);
        run(fastSix, 240);
        EXPECT_EQ(m_proxy->count("01 0C 0D"), 1) << reply;
        EXPECT_GE(count(0x7E8, 0x0C), 9U) << reply;
        EXPECT_EQ(last(0x7E8, 0x0C), "1726") << reply;
        EXPECT_EQ(last(0x7E8, 0x0D), "80") << reply;
    }
}

TEST_F(PollCycleTest, WhatAModuleLeavesOutIsAskedAlone)
{
    // An adapter that cuts the request after its first PID.
    for (int const pid : {0x0C, 0x0D, 0x05}) {
        want(pid);
    }
    m_proxy->answer("01 0C 0D", "41 0C 1A F8");
    m_proxy->answer("01 0C 05", "41 0C 1A F8");
    m_proxy->answer("01 0D 05", "41 0D 50");
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 05", "41 05 7B");
    run(fastSix, 400);
    EXPECT_EQ(last(0x7E8, 0x0C), "1726");
    EXPECT_EQ(last(0x7E8, 0x0D), "80");
    EXPECT_EQ(last(0x7E8, 0x05), "83");
    EXPECT_LE(m_proxy->count("01 0C 0D") + m_proxy->count("01 0C 05"), 2);
    EXPECT_EQ(m_proxy->count("01 0D 05"), 1) << "one answer tells that it leaves the second out";
}

TEST_F(PollCycleTest, ALostReplyDoesNotEndWhatIsProved)
{
    want(0x0C);
    want(0x0D);
    m_proxy->answerOnce("01 0C 0D", "41 0C 1A F8 0D 50");
    m_proxy->answerOnce("01 0C 0D", FakeProxy::Replies{});
    m_proxy->answer("01 0C 0D", "41 0C 1A F8 0D 50");
    run(fastSix, 240);
    EXPECT_EQ(m_proxy->count("01 0C"), 0);
    EXPECT_EQ(count(0x7E8, 0x0C), 19U);
}

TEST_F(PollCycleTest, EachModuleGetsItsOwnReply)
{
    want(m_engine, 0x0C);
    want(m_gearbox, 0x0C);
    want(m_gearbox, 0x05);
    m_proxy->answer("01 0C", {{0x7E8, "41 0C 1A F8"}, {0x7E9, "41 0C 0B B8"}});
    m_proxy->answer("01 05", {{0x7E8, "41 05 7B"}, {0x7E9, "41 05 5A"}});
    run(careful, 120);
    EXPECT_EQ(last(0x7E8, 0x0C), "1726");
    EXPECT_EQ(last(0x7E9, 0x0C), "750");
    EXPECT_EQ(last(0x7E9, 0x05), "50");
    EXPECT_EQ(count(0x7E8, 0x05), 0U); // it was not asked for
    // The engine falls silent: its value is not read from the other's reply, and not from what it once said.
    m_proxy->answer("01 0C", {{0x7E9, "41 0C 0B B8"}});
    std::size_t const before = count(0x7E8, 0x0C);
    run(careful, 120);
    EXPECT_EQ(count(0x7E8, 0x0C), before);
    EXPECT_GE(m_cycle->rates()[0].silent, 2);
    EXPECT_EQ(m_cycle->rates()[1].silent, 0);
}

TEST_F(PollCycleTest, RatesAreKeptAndTold)
{
    want(m_engine, 0x0C, 10.0);
    want(m_engine, 0x05, 1.0);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 05", "41 05 7B");
    run(careful, 5000);
    EXPECT_EQ(count(0x7E8, 0x0C), 50U);
    EXPECT_EQ(count(0x7E8, 0x05), 5U);
    EXPECT_EQ(m_cycle->rates()[0].asked, 10.0);
    EXPECT_NEAR(m_cycle->rates()[0].reached, 10.0, 0.5);
    EXPECT_NEAR(m_cycle->rates()[1].reached, 1.0, 0.05);
}

TEST_F(PollCycleTest, ASilentSensorDoesNotHoldUpTheOthers)
{
    want(0x0C);
    want(0x0D);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->during([this] { m_clock.advance(m_proxy->requests().back()[1] == 0x0D ? 400 : 12); });
    run(careful, 10000);
    EXPECT_LE(m_proxy->count("01 0D"), 8);
    EXPECT_GE(m_proxy->count("01 0D"), 5); // but it is asked again and again
    EXPECT_GT(count(0x7E8, 0x0C), 220U);
}

TEST_F(PollCycleTest, TheGapOfOldBusesHoldsForAllRequests)
{
    want(0x0C);
    want(obd::ParameterIdentifier::Torque); // asks for two inputs
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    run({std::chrono::milliseconds(30), std::chrono::milliseconds(100), 1}, 3000);
    EXPECT_LE(m_proxy->count(), 32);
    EXPECT_GE(m_proxy->count(), 27);
}

TEST_F(PollCycleTest, OneModulesValuesGoTheQuickerWay)
{
    want(0x0C);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    answerIn(40, 25);
    run(fastAddressed, 600);
    EXPECT_EQ(m_way.substr(0, 20), "bbbbbbaaaaaaaaaaaaaa");
    EXPECT_EQ(m_channel.module, std::nullopt) << "for the scope of a request only";
    m_way.clear();
    m_cycle.reset();
    answerIn(40, 38);
    run(fastAddressed, 800);
    EXPECT_EQ(m_way.substr(0, 20), "bbbbbbaaaaaabbbbbbbb") << "what it gains is not worth the traffic";
    m_way.clear();
    m_cycle.reset();
    answerIn(40, 0);
    run(fastAddressed, 800);
    EXPECT_EQ(m_way.substr(0, 14), "bbbbbbaabbbbbb") << "it answers requests to all only";
}

TEST_F(PollCycleTest, OnlyRequestsOfOneModuleAmongSeveralAreAddressed)
{
    m_proxy->answer("01 0C", {{0x7E8, "41 0C 1A F8"}, {0x7E9, "41 0C 0B B8"}});
    answerIn(40, 25);
    want(0x0C);
    run(careful, 1000);
    EXPECT_EQ(m_way.find('a'), std::string::npos) << "not unasked";
    m_cycle.reset();
    want(m_gearbox, 0x0C);
    run(fastAddressed, 1000);
    EXPECT_EQ(m_way.find('a'), std::string::npos) << "both are wanted";
    m_cycle.reset();
    m_sources.pop_back();
    m_proxy->setEcus({m_engine});
    run(fastAddressed, 1000);
    EXPECT_EQ(m_way.find('a'), std::string::npos) << "nobody else answers";
}

} // namespace
