#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantities.h"
#include "libobd/powertrain/tableparameter.h"
#include "tests/support/fakeecu.h"
#include "tests/support/hexbytes.h"
#include "tests/support/payload/payload.h"

#include <gtest/gtest.h>

// The shapes that a row can take, on rows of the test's own.
namespace {

using namespace obd;
using support::hexBytes;
using support::reply;
using support::texts;

std::string loopText(unsigned int state)
{
    return state == 1 ? "Open loop" : state == 2 ? "Closed loop" : "Not defined";
}

formula::Decoded lowTwoBits(formula::Raw raw, IEcu const& /*ecu*/)
{
    return raw & 3U;
}

formula::Decoded unlessFilled(formula::Raw raw, IEcu const& ecu)
{
    return raw == 0xFF ? std::nullopt : formula::plain(raw, ecu);
}

constexpr Quantity loop{0.0, 0.0, {}, {}, nullptr, nullptr, loopText};
constexpr Quantity longSeconds = quantities::digits(UnitSecond, 4294967295.0);

constexpr ParameterRow rows[] = {
    {0x10,
     5,
     0,
     "By availability",
     {{"Sensor A", bit(0), wordAt(1), formula::timesTen, &quantities::absoluteRailPressure},
      {"Sensor B", bit(1), byteAt(3), formula::celsius, &quantities::temperature},
      {"Control", bit(2), byteAt(4), lowTwoBits, &loop}}},
    {0x20,
     2,
     0,
     "Narrow or wide",
     {{"Sensor", bit(0), byteAt(1), formula::plain, &quantities::barometricPressure, bit(4), formula::timesTen}}},
    {0x30, 5, 0, "Long", {{"Total", bit(7), longAt(1), formula::plain, &longSeconds}}},
    {0x40,
     2,
     1,
     "May be filled",
     {{"First", always, byteAt(0), formula::percent, &quantities::percent},
      {"Second", always, byteAt(1), unlessFilled, &quantities::count}}},
};
static_assert(pidsRise(rows));
static_assert(allHoldTheirFields(rows));

template <int id>
using TestParameter = RowParameter<TableParameter, rows, id>;

class TableParameterTest : public ::testing::Test
{
protected:
    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

TEST_F(TableParameterTest, PublishesTheAvailableSensorsOnly)
{
    TestParameter<0x10> parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("07 00 64 7B 06")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "1000 | 83 | Closed loop");
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Imperial), "145.0 | 181 | Closed loop");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("05 00 64 7B 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "1000 | 2: Open loop");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("F8 00 64 7B 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "");
}

TEST_F(TableParameterTest, ASensorThatIsNotAvailableHasNoNumber)
{
    TestParameter<0x10> parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("02 00 64 7B 06")));
    EXPECT_FALSE(parameter.stored(*m_ecu, 0));
    EXPECT_EQ(parameter.value(*m_ecu, UnitSystem::Metric, 0), 0.0);
    EXPECT_EQ(parameter.stored(*m_ecu, 1), 83.0);
    EXPECT_EQ(parameter.value(*m_ecu, UnitSystem::Imperial, 1), 181.0);
}

TEST_F(TableParameterTest, AnnouncesAllItsSensorsWhateverIsAvailable)
{
    TestParameter<0x10> parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(parameter.description(*m_ecu), "By availability");
    auto const infos = parameter.sensorInfo(*m_ecu);
    ASSERT_EQ(infos.size(), 3u);
    EXPECT_EQ(infos[0]->description(), "Sensor A");
    EXPECT_TRUE(infos[1]->isNumeric());
    EXPECT_EQ(infos[2]->uid(), 0x10 * 10 + 2);
    EXPECT_FALSE(infos[2]->isNumeric());
    EXPECT_EQ(infos[2]->unit(UnitSystem::Metric), UnitNone);
    EXPECT_EQ(infos[2]->maxValue(UnitSystem::Imperial), 0.0);
}

TEST_F(TableParameterTest, PublishesNothingForAModuleThatHasNotAnswered)
{
    TestParameter<0x10> parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "");
}

TEST_F(TableParameterTest, TheWideBitMakesASensorAvailableAndPicksItsFormula)
{
    TestParameter<0x20> parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("01 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "5");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("11 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "50");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("10 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "50");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("EE 05")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "");
}

TEST_F(TableParameterTest, LongFieldsKeepAllTheirDigits)
{
    TestParameter<0x30> parameter(ObdMode::CurrentData, 0);
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("80 FF FF FF FF")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "4294967295");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("80 01 02 03 04")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Imperial), "16909060");
}

TEST_F(TableParameterTest, ANumberThatStandsForNoReadingLeavesNone)
{
    TestParameter<0x40> parameter(ObdMode::CurrentData, 0);
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "0.0");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("FF 12")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "100.0 | 18");
    EXPECT_TRUE(reply(parameter, m_ecu, hexBytes("FF FF")));
    EXPECT_EQ(texts(parameter, *m_ecu, UnitSystem::Metric), "100.0");
}

TEST(ReadField, IsBigEndianAndNeverReadsPastTheEnd)
{
    support::Bytes const payload = hexBytes("01 02 03 04 05");
    EXPECT_EQ(readField(payload, byteAt(4)), 5u);
    EXPECT_EQ(readField(payload, wordAt(1)), 0x0203u);
    EXPECT_EQ(readField(payload, longAt(1)), 0x02030405u);
    EXPECT_FALSE(readField(payload, byteAt(5)));
    EXPECT_FALSE(readField(payload, wordAt(4)));
    EXPECT_FALSE(readField(payload, longAt(2)));
    EXPECT_FALSE(readField({}, byteAt(0)));
}

constexpr ParameterRow tooShort[] = {
    single(0x10, wordAt(0), formula::plain, quantities::count, "good"),
    {0x11, 1, 1, "bad", {{nullptr, always, wordAt(0), formula::plain, &quantities::count}}}};
constexpr ParameterRow empty[] = {{0x11, 1, 1, "no sensor", {}}};
constexpr ParameterRow twice[] = {tooShort[0], tooShort[0]};

// What the checks of the tables find, seen by the compiler.
static_assert(!allHoldTheirFields(tooShort));
static_assert(!allHoldTheirFields(empty));
static_assert(!pidsRise(twice));
static_assert(pidsRise(tooShort));
static_assert(rowIndex(rows, 0x30) == 2);

} // namespace
