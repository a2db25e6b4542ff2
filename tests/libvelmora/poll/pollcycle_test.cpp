#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/read/oxygencurrent.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeproxy.h"
#include "tests/support/memorysettings.h"

#include <obd/iobdvelmora.h>
#include <obd/obdvelmorabuilder.h>
#include <obd/parameterfactory.h>

#include <gtest/gtest.h>

namespace {

using support::FakeEcu;
using support::FakeProxy;
using velmora::PollCycle;
using velmora::PollPace;
using velmora::PollResult;

constexpr PollPace careful{};
constexpr PollPace fastSingle{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 1};
constexpr PollPace fastSix{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 6};
constexpr PollPace fastAddressed{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 1, true};

// Notes which module requests go to.
struct FakeChannel : velmora::IChannelControl
{
    void addressModule(std::optional<unsigned int> id) override { module = id; }
    void address(std::optional<velmora::RequestAddress> const& /*address*/) override {}
    std::string refusedAddress() const override { return {}; }
    velmora::AddressedReply takeReply() override { return {}; }
    void onConnected() override {}
    velmora::ChannelStatistics statistics() const override { return {}; }

    std::optional<unsigned int> module;
};

// A vehicle whose modules answer in 12 ms, and a poller on it that runs in a time of its own.
class PollCycleTest : public testing::Test
{
protected:
    PollCycleTest()
    {
        m_proxy->during([this] { m_clock.advance(12); });
        m_engine->setSupported(obd::ObdMode::CurrentData, {0x04, 0x05, 0x0B, 0x0C, 0x0D, 0x10, 0x11, 0x33});
        m_proxy->setEcus({m_engine, m_gearbox});
    }

    void want(std::shared_ptr<FakeEcu> const& ecu, int pid, std::optional<double> hertz = {})
    {
        auto const id = obd::ParameterIdentifier(pid).id();
        m_sources.push_back({ecu, obd::ParameterFactory().createParameter(id), hertz});
    }
    void want(int pid) { want(m_engine, pid); }

    // For so many milliseconds from the start of the cycle, or from where it was.
    void run(PollPace const& pace, unsigned int ms)
    {
        if (m_cycle == nullptr) {
            m_cycle = std::make_unique<PollCycle>(
                m_proxy, m_sources, pace,
                [](unsigned char pid) { return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id()); },
                m_units, [this](PollResult const& result) { m_results.push_back(result); }, &m_channel);
        }
        unsigned int const end = m_clock.millis() + ms;
        while (m_clock.millis() < end) {
            if (auto const wait = m_cycle->wait(); wait.count() > 0) {
                m_clock.advance(static_cast<unsigned int>(wait.count()));
            } else {
                m_cycle->step();
            }
        }
    }

    // Texts of what was read last from a module.
    std::string last(unsigned int module, int pid) const
    {
        std::string text;
        for (PollResult const& result : m_results) {
            if (result.module == module && result.id == pid) {
                text = result.values.front()->value;
            }
        }
        return text;
    }
    std::size_t count(unsigned int module, int pid) const
    {
        return static_cast<std::size_t>(std::count_if(m_results.begin(), m_results.end(), [&](auto const& result) {
            return result.module == module && result.id == pid;
        }));
    }

    // Modules answer in so many milliseconds, and at their own addresses in so many; 0: not at all. Notes how requests
    // go.
    void answerIn(unsigned int broadcast, unsigned int addressed)
    {
        m_proxy->during([this, broadcast, addressed] {
            m_way += m_channel.module ? 'a' : 'b';
            m_clock.advance(m_channel.module ? std::max(addressed, 20U) : broadcast);
            if (addressed == 0) {
                m_channel.module ? m_proxy->fail("01 0C", FakeProxy::Status::NoResponse)
                                 : m_proxy->answer("01 0C", "41 0C 1A F8");
            }
        });
    }

    support::FakeClock m_clock;
    FakeChannel m_channel;
    std::string m_way;
    std::shared_ptr<FakeProxy> m_proxy = std::make_shared<FakeProxy>();
    std::shared_ptr<FakeEcu> m_engine = std::make_shared<FakeEcu>(0x7E8);
    std::shared_ptr<FakeEcu> m_gearbox = std::make_shared<FakeEcu>(0x7E9);
    std::vector<velmora::PollSource> m_sources;
    std::unique_ptr<PollCycle> m_cycle;
    std::vector<PollResult> m_results;
    velmora::Units m_units = velmora::Units::Metric;
};

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
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 05", "41 05 7B");
    run(fastSix, 400);
    EXPECT_EQ(last(0x7E8, 0x0C), "1726");
    EXPECT_EQ(last(0x7E8, 0x0D), "80");
    EXPECT_EQ(last(0x7E8, 0x05), "83");
    EXPECT_LE(m_proxy->count("01 0C 0D") + m_proxy->count("01 0C 05"), 2);
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

// Consumption without air: a mass air flow that is claimed and never told made 0.5 l/100 km of nothing.
TEST_F(PollCycleTest, ADerivedValueNeedsFreshInputsOfItsOwnModule)
{
    auto const obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
    auto const id = obd::ParameterIdentifier::FuelConsumption;
    m_sources.push_back({m_engine, obd::ParameterFactory().createParameter(*m_engine, *obd->getSettings(), id), {}});
    m_proxy->answer("01 0D", {{0x7E8, "41 0D 50"}, {0x7E9, "41 0D 50"}});
    m_proxy->answer("01 10", {{0x7E9, "41 10 07 D0"}}); // the air of another module is not that of the engine
    run(careful, 1000);
    EXPECT_EQ(count(0x7E8, id), 0U);
    m_proxy->answer("01 10", {{0x7E8, "41 10 07 D0"}});
    run(careful, 1000);
    std::size_t const told = count(0x7E8, id);
    EXPECT_GT(told, 10U);
    EXPECT_EQ(m_results.back().readings.front().sensor, "CONSUMPTION");
    EXPECT_EQ(m_results.back().readings.front().pid, "");
    // A lost reply now and then does no harm, but air of more than 5 s ago is none.
    m_proxy->fail("01 10", FakeProxy::Status::NoResponse);
    run(careful, 6000);
    std::size_t const stale = count(0x7E8, id);
    EXPECT_GT(stale, told + 60U);
    run(careful, 6000);
    EXPECT_EQ(count(0x7E8, id), stale);
}

// 20 g/s of air burn 1.36 g/s of petrol (14.7 to 1), 6.57 l/h at 745 g/l: at 80 km/h 8.22 l/100 km, 28.6 miles on 3.785
// l and 34.4 miles on 4.546 l.
TEST_F(PollCycleTest, ConsumptionIsInTheGallonsOfTheUnits)
{
    for (auto const& [units, unit, number] : {std::tuple(velmora::Units::Metric, "l/100 km", 8.22),
                                              {velmora::Units::Imperial, "mpg", 28.62},
                                              {velmora::Units::ImperialUk, "mpg (UK)", 34.37}}) {
        auto const obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<support::MemorySettings>());
        auto const id = obd::ParameterIdentifier::FuelConsumption;
        m_units = units;
        m_cycle = nullptr;
        m_sources = {{m_engine, obd::ParameterFactory().createParameter(*m_engine, *obd->getSettings(), id), {}}};
        m_proxy->answer("01 0D", "41 0D 50");
        m_proxy->answer("01 10", "41 10 07 D0");
        run(careful, 500);
        velmora::Reading const& reading = m_results.back().readings.front();
        EXPECT_EQ(reading.unit, unit);
        EXPECT_NEAR(std::get<double>(reading.value), number, 0.06) << unit;
        EXPECT_NEAR(std::stod(m_results.back().values.front()->mean), number, 0.06) << unit;
    }
}

TEST_F(PollCycleTest, InputsOfADerivedValueAreFetchedTogether)
{
    want(obd::ParameterIdentifier::Torque);
    m_proxy->answer("01 0C", "41 0C 1A F8");
    m_proxy->answer("01 0D", "41 0D 50");
    m_proxy->answer("01 0C 0D", "41 0C 1A F8 0D 50");
    run(fastSix, 240);
    EXPECT_EQ(m_proxy->count("01 0C"), 1); // at first what it needs is not known
    EXPECT_EQ(m_proxy->count("01 0D"), 1);
    EXPECT_EQ(m_proxy->count("01 0C 0D"), 18);
    EXPECT_EQ(count(0x7E8, obd::ParameterIdentifier::Torque), 19U);
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

TEST_F(PollCycleTest, TheBatteryIsTheAdaptersAffair)
{
    want(obd::ParameterIdentifier::BatteryVoltage);
    m_proxy->setBatteryVoltage(12.4F);
    run(careful, 100);
    EXPECT_EQ(last(0x7E8, obd::ParameterIdentifier::BatteryVoltage), "12.4");
}

TEST_F(PollCycleTest, TheCurrentOfAnOxygenSensorIsThatOfTheStandard)
{
    want(0x34);
    m_proxy->answer("01 34", "41 34 80 00 80 00"); // in the middle of both ranges
    run(careful, 100);
    ASSERT_EQ(m_results.front().readings.size(), 2U);
    EXPECT_EQ(std::get<double>(m_results.front().readings[1].value), 0.0);
    EXPECT_EQ(m_results.front().readings[1].sensor, "PID_34_2");
    EXPECT_EQ(m_results.front().values[1]->value, "0.00");
    EXPECT_EQ(m_results.front().values[1]->minimum, "0.00");
    EXPECT_EQ(m_results.front().values[0]->value, "1.000");
}

TEST(OxygenCurrent, TheOffsetIsOfTheCurrentsAlone)
{
    EXPECT_EQ(velmora::shownText(0x34 * 10 + 1, "128.50"), "0.50");
    EXPECT_EQ(velmora::shownText(0x3B * 10 + 1, "0.00"), "-128.00");
    EXPECT_EQ(velmora::shownText(0x34 * 10, "1.00"), "1.00");
    EXPECT_EQ(velmora::shownText(0x33 * 10 + 1, "5.00"), "5.00");
    EXPECT_EQ(velmora::shownText(0x3C * 10 + 1, "5.00"), "5.00");
    EXPECT_EQ(velmora::shownText(0x34 * 10 + 1, ""), "");
}

} // namespace
