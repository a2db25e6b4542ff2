// Values that are worked out of others, or told by the adapter.

#include "libvelmora/read/oxygencurrent.h"
#include "tests/libvelmora/poll/pollcyclefixture.h"
#include "tests/support/memorysettings.h"

#include <obd/iobdvelmora.h>
#include <obd/obdvelmorabuilder.h>

namespace {

using support::FakeProxy;
using velmora::test::careful;
using velmora::test::fastSix;
using DerivedPoll = velmora::test::PollCycleTest;

// Consumption without air: a mass air flow that is claimed and never told made 0.5 l/100 km of nothing.
TEST_F(DerivedPoll, ADerivedValueNeedsFreshInputsOfItsOwnModule)
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
TEST_F(DerivedPoll, ConsumptionIsInTheGallonsOfTheUnits)
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

TEST_F(DerivedPoll, InputsOfADerivedValueAreFetchedTogether)
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

TEST_F(DerivedPoll, TheBatteryIsTheAdaptersAffair)
{
    want(obd::ParameterIdentifier::BatteryVoltage);
    m_proxy->setBatteryVoltage(12.4F);
    run(careful, 100);
    EXPECT_EQ(last(0x7E8, obd::ParameterIdentifier::BatteryVoltage), "12.4");
}

TEST_F(DerivedPoll, TheCurrentOfAnOxygenSensorIsThatOfTheStandard)
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
    EXPECT_EQ(velmora::shownText(0x34 * 10 + 1, "200"), "72");
    for (char const* const text : {"on", "5 mA", "1.5x"}) {
        EXPECT_EQ(velmora::shownText(0x34 * 10 + 1, text), text);
    }
}

} // namespace
