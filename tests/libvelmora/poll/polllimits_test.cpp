// The parts of the poller at their limits: whose turn it is, how fresh an answer is, what a request may ask.
#include "libvelmora/poll/addresstrial.h"
#include "libvelmora/poll/deadlinescheduler.h"
#include "libvelmora/poll/lentproxy.h"
#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/poll/pollpace.h"
#include "libvelmora/poll/ratemeter.h"
#include "libvelmora/poll/sensorwish.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeecu.h"
#include "tests/support/fakeproxy.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace velmora {

namespace {

using std::chrono::milliseconds;
using LentStatus = obd::IDevice::Status;

PollTime pollAt(int ms)
{
    return PollTime(std::chrono::hours(1)) + milliseconds(ms);
}

TEST(PollOrder, EqualsGoInTheOrderInWhichTheyWereAdded)
{
    DeadlineScheduler rest;
    EXPECT_EQ(rest.add({}, pollAt(0)), 0U);
    EXPECT_EQ(rest.add({}, pollAt(0)), 1U);
    EXPECT_EQ(rest.next(pollAt(0))->task, 0U);
    rest.postpone(0, pollAt(50));
    rest.postpone(1, pollAt(50));
    EXPECT_EQ(rest.next(pollAt(0))->task, 0U) << "nothing is due";
    EXPECT_EQ(rest.next(pollAt(0))->start, pollAt(50));
    DeadlineScheduler rates;
    rates.add(10.0, pollAt(0));
    rates.add(10.0, pollAt(0));
    EXPECT_EQ(rates.next(pollAt(0))->task, 0U);
    EXPECT_EQ(rates.next(pollAt(500))->task, 0U) << "both are late";
    EXPECT_EQ(rates.next(pollAt(500))->start, pollAt(500));
}

TEST(PollOrder, WhoWaitedLongerGoesFirstAmongEqualDeadlines)
{
    DeadlineScheduler scheduler;
    scheduler.add(10.0, pollAt(0));
    scheduler.add(10.0, pollAt(0));
    scheduler.started(0, pollAt(5));
    scheduler.started(1, pollAt(4));
    EXPECT_EQ(scheduler.next(pollAt(150))->task, 1U);
    scheduler.started(1, pollAt(150));
    EXPECT_EQ(scheduler.next(pollAt(150))->task, 0U) << "the earlier deadline, whoever waited";
    DeadlineScheduler mixed;
    mixed.add(1.0, pollAt(0));
    mixed.add(10.0, pollAt(0));
    mixed.started(1, pollAt(0));
    EXPECT_EQ(mixed.next(pollAt(150))->task, 1U) << "its deadline is at 200 ms, though the other has never been asked";
}

TEST(PollOrder, ADeadlineOfThisMomentIsNotMissed)
{
    DeadlineScheduler scheduler;
    scheduler.add(1.0, pollAt(0));
    scheduler.add(10.0, pollAt(0));
    scheduler.started(0, pollAt(0)); // released at 1000, to be done by 2000
    scheduler.started(1, pollAt(1800));
    EXPECT_EQ(scheduler.next(pollAt(2000))->task, 1U) << "it alone is late";
    EXPECT_EQ(scheduler.next(pollAt(2001))->task, 0U) << "now it has waited longer";
}

TEST(PollOrder, RatesGoFirstAndEachFourthTurnBelongsToTheRest)
{
    DeadlineScheduler scheduler;
    scheduler.add({}, pollAt(0));
    scheduler.add(1000.0, pollAt(0));
    std::string order;
    for (int i = 0; i < 9; ++i) {
        std::size_t const task = scheduler.next(pollAt(i * 10))->task;
        scheduler.started(task, pollAt(i * 10));
        order += std::to_string(task);
    }
    EXPECT_EQ(order, "111011101");
}

TEST(PollOrder, WhatIsReleasedAtThisMomentMayGo)
{
    DeadlineScheduler scheduler;
    for (int i = 0; i < 4; ++i) {
        scheduler.add(1000.0, pollAt(0));
    }
    scheduler.add({}, pollAt(100));
    for (std::size_t i = 0; i < 3; ++i) {
        scheduler.started(i, pollAt(100));
    }
    EXPECT_EQ(scheduler.next(pollAt(100))->task, 4U);
}

TEST(PollOrder, ANewRateBeginsAtOnce)
{
    RateMeter two;
    two.count(pollAt(0));
    EXPECT_EQ(two.hertz(pollAt(100)), 0.0) << "one event has no rate";
    two.count(pollAt(4000));
    EXPECT_EQ(two.hertz(pollAt(4000)), 0.25);
    EXPECT_EQ(two.hertz(pollAt(9000)), 0.25) << "the next one may be on its way";
    EXPECT_EQ(two.hertz(pollAt(12000)), 0.25);
    EXPECT_EQ(two.hertz(pollAt(14000)), 1.0 / 14) << "beyond two intervals silence counts";
    RateMeter same;
    same.count(pollAt(0));
    same.count(pollAt(0));
    EXPECT_EQ(same.hertz(pollAt(0)), 0.0);
    RateMeter many;
    many.count(pollAt(0));
    for (int i = 0; i < 31; ++i) {
        many.count(pollAt(10000 + i * 1000));
    }
    EXPECT_EQ(many.hertz(pollAt(40000)), 31 / 40.0) << "32 events are kept";
    many.count(pollAt(41000));
    EXPECT_EQ(many.hertz(pollAt(41000)), 1.0) << "and no more";
}

TEST(AnswerNotes, AreFreshUpToTheirAge)
{
    AnswerNotes notes;
    notes.note(0x7E8, 0x0C, pollAt(0));
    notes.note(0x7E8, 0x0D, pollAt(100));
    EXPECT_TRUE(notes.areFresh(0x7E8, {0x0C, 0x0D}, pollAt(5000), milliseconds(5000)));
    EXPECT_FALSE(notes.areFresh(0x7E8, {0x0C, 0x0D}, pollAt(5001), milliseconds(5000)));
    EXPECT_TRUE(notes.areFresh(0x7E8, {0x0D}, pollAt(5001), milliseconds(5000)));
    EXPECT_FALSE(notes.areFresh(0x7E8, {0x05}, pollAt(0), milliseconds(5000)));
    EXPECT_FALSE(notes.areFresh(0x7E9, {0x0C}, pollAt(0), milliseconds(5000))) << "of another module";
    EXPECT_TRUE(notes.areFresh(0x7E9, {}, pollAt(0), milliseconds(0)));
}

TEST(AddressTrial, ATenthExactlyIsNotWorthIt)
{
    AddressTrial trial;
    for (int const took : {1, 1, 1, 10, 10, 10, 1, 1, 1, 9, 9, 9}) {
        trial.answered(milliseconds(took));
    }
    EXPECT_FALSE(trial.isAddressed());
}

// A wire to two modules, of which the lent proxy shows one.
class LentProxyTest : public testing::Test
{
protected:
    std::pair<LentStatus, std::string> ask(std::vector<unsigned char> const& request)
    {
        obd::ResponseMap responses;
        LentStatus const status = m_lent.execute(request, responses, 100);
        std::string text;
        for (auto const& [module, payload] : responses) {
            text += std::to_string(module) + ":" + std::to_string(payload.back()) + " ";
        }
        return {status, text};
    }

    support::FakeClock m_clock;
    std::shared_ptr<support::FakeProxy> m_proxy = std::make_shared<support::FakeProxy>();
    std::shared_ptr<support::FakeEcu> m_engine = std::make_shared<support::FakeEcu>(0x7E8);
    PollWire m_wire{m_proxy, milliseconds(0)};
    LentProxy m_lent{m_wire, m_engine};
};

TEST_F(LentProxyTest, ShowsItsOwnModuleOnly)
{
    EXPECT_FALSE(m_lent.initialize());
    EXPECT_TRUE(m_lent.isConnected());
    EXPECT_EQ(m_lent.protocol(), obd::ObdProtocolCan11);
    EXPECT_EQ(m_lent.ecus().size(), 1U);
    EXPECT_EQ(m_lent.firstEcu(), m_engine);
    EXPECT_EQ(m_lent.ecu(0x7E8), m_engine);
    EXPECT_EQ(m_lent.ecu(0x7E9), nullptr);
    m_proxy->answer("01 0C", {{0x7E8, "41 0C 00 01"}, {0x7E9, "41 0C 00 02"}});
    m_proxy->answer("01 0D", {{0x7E9, "41 0D 02"}});
    m_proxy->fail("01 05", LentStatus::NotSent);
    EXPECT_EQ(ask({1, 0x0C}), std::pair(LentStatus::Ok, std::string("2024:1 ")));
    EXPECT_EQ(ask({1, 0x0D}), std::pair(LentStatus::NoResponse, std::string())) << "the other one's is not its own";
    EXPECT_EQ(ask({1, 0x05}), std::pair(LentStatus::NotSent, std::string()));
}

TEST_F(LentProxyTest, AnswersFromWhatWasLentUntilTheNextRun)
{
    m_proxy->answer("01 0C", "41 0C 00 01");
    m_lent.lend(0x0C, {0x41, 0x0C, 0, 7});
    m_lent.lend(0x0D, {});
    EXPECT_EQ(ask({1, 0x0C}), std::pair(LentStatus::Ok, std::string("2024:7 ")));
    EXPECT_EQ(ask({1, 0x0D}), std::pair(LentStatus::NoResponse, std::string()));
    EXPECT_EQ(m_proxy->count(), 0) << "neither is asked for again";
    ask({2, 0x0C});
    ask({1, 0x0C, 0x0D});
    EXPECT_EQ(m_proxy->count(), 2) << "what was lent is one PID of service 01";
    EXPECT_EQ(m_lent.asked(), (std::set<unsigned char>{0x0C, 0x0D}));
    m_lent.begin();
    EXPECT_TRUE(m_lent.asked().empty());
    EXPECT_EQ(ask({1, 0x0C}).second, "2024:1 ") << "from the vehicle";
}

TEST_F(LentProxyTest, OnlyWholeAnswersAreNoted)
{
    for (auto const& [reply, noted] : {std::pair("41 0C 00 01", true), std::pair("41 0C", false),
                                       std::pair("7F 01 12", false), std::pair("41 0D 05", false)}) {
        PollWire wire(m_proxy, milliseconds(0));
        m_proxy->answer("01 0C", reply);
        obd::ResponseMap responses;
        wire.execute({1, 0x0C}, responses, 100);
        EXPECT_EQ(wire.notes().last(0x7E8, 0x0C).has_value(), noted) << reply;
    }
    auto const ask = [](PollWire& wire, std::vector<unsigned char> const& request) {
        obd::ResponseMap responses;
        wire.execute(request, responses, 100);
        EXPECT_FALSE(responses.empty());
    };
    m_proxy->answer("02 0C", "42 0C 00 01");
    ask(m_wire, {2, 0x0C});
    EXPECT_FALSE(m_wire.notes().last(0x7E8, 0x0C)) << "of a freeze frame";
    m_proxy->answer("02 0C", "41 0C 00 01");
    ask(m_wire, {2, 0x0C});
    EXPECT_FALSE(m_wire.notes().last(0x7E8, 0x0C)) << "of a request before";
    m_proxy->answer("01 0C 0D", "41 0C 00 01 0D");
    ask(m_wire, {1, 0x0C, 0x0D});
    EXPECT_FALSE(m_wire.notes().last(0x7E8, 0x0C)) << "who takes the reply apart notes what came whole";
    PollWire gapped(m_proxy, milliseconds(100));
    unsigned int const start = m_clock.millis();
    for (int i = 0; i < 3; ++i) {
        ask(gapped, {1, 0x0C});
    }
    EXPECT_EQ(m_clock.millis() - start, 200U) << "from the start of one to that of the next";
    EXPECT_EQ(gapped.now() - m_wire.now(), milliseconds(0));
}

TEST(PollPace, IsNoHigherThanTheBusTakesUnasked)
{
    EXPECT_EQ(PollWill().pidsPerRequest, 6U);
    EXPECT_FALSE(PollWill().fast);
    PollPace const can = choosePace({true, 4}, obd::ObdProtocolCan11, 1990);
    EXPECT_EQ(can.gap.count(), 0) << "model years count on SAE J1850 only";
    EXPECT_EQ(can.floor.count(), 0);
    EXPECT_EQ(can.pidsPerRequest, 4U);
    EXPECT_TRUE(can.addresses);
    PollPace const old = choosePace({true, 6}, obd::ObdProtocolJ1850, 2002);
    EXPECT_EQ(old.floor.count(), 30);
    PollPace const unasked = choosePace({}, obd::ObdProtocolJ1850, 2010);
    EXPECT_EQ(unasked.floor.count(), 30);
    EXPECT_EQ(unasked.gap.count(), 0);
    PollPace const fastJ1850 = choosePace({true, 6}, obd::ObdProtocolJ1850, 2010);
    EXPECT_FALSE(fastJ1850.addresses);
    for (obd::ObdProtocol const other : {obd::ObdProtocolIso9141, obd::ObdProtocolIso14230, obd::ObdProtocolUnknown}) {
        PollPace const pace = choosePace({true, 6}, other, 2010);
        EXPECT_EQ(pace.gap.count(), 0);
        EXPECT_EQ(pace.floor.count(), 30);
        EXPECT_FALSE(pace.addresses);
    }
}

TEST(SensorWish, WordsAreCutWhereModuleAndRateBegin)
{
    EXPECT_EQ(parseSensorWish("A:05").module, std::nullopt) << "one digit is no module";
    EXPECT_EQ(parseSensorWish("A:05").sensor, "A:05");
    EXPECT_EQ(parseSensorWish("7e8:05").module, 0x7E8U);
    EXPECT_EQ(parseRate("5  Hz"), 5.0);
    EXPECT_EQ(parseRate("0.0009"), std::nullopt);
    EXPECT_EQ(parseRate("1000.1"), std::nullopt);
    EXPECT_EQ(parseRate("hz"), std::nullopt);
    auto const problem = [](std::string const& word) {
        try {
            parseSensorWish(word);
        } catch (Error const& error) {
            return std::string(error.what());
        }
        return std::string("none");
    };
    EXPECT_EQ(problem("RPM@x"), "\"x\" is no rate of a sensor (\"RPM@x\")");
    EXPECT_EQ(problem("7E8:"), "\"7E8:\" names no sensor");
}

TEST(PollChoice, SaysWhichModulesThereAre)
{
    auto const offer = [](unsigned int id) { return ModuleOffer{std::make_shared<support::FakeEcu>(id), {}, true}; };
    try {
        choosePolled({"7EA:RPM"}, {offer(0x7E8), offer(0x7E9)}, {});
        ADD_FAILURE() << "it was chosen";
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "The vehicle has no control module 7EA");
        EXPECT_EQ(error.hints(), std::vector<std::string>{"these answer: 7E8, 7E9"});
    }
    EXPECT_FALSE(ModuleOffer().meant);
    try {
        choosePolled({"RPM"}, {{std::make_shared<support::FakeEcu>(0x7E8), {}, false}}, {});
        ADD_FAILURE() << "it was chosen";
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "No control module is chosen");
    }
}

} // namespace

} // namespace velmora
