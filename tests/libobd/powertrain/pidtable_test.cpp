#include "tests/support/fakeecu.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload/payload.h"
#include "tests/support/tablefile.h"

#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

#include <set>

// Compares what the classes publish with pid_table.txt.
namespace {

using obd::UnitSystem;

struct ScaleCells
{
    int unit;
    double minimum;
    double maximum;
    std::string type;
    std::string decimals;
};

struct TableRow
{
    explicit TableRow(std::vector<std::string> const& cells)
        : pid(std::stoi(cells.at(0), nullptr, 16)), className(cells.at(1)), bytes(std::stoul(cells.at(2))),
          index(std::stoul(cells.at(3))), title(cells.at(4)), sensor(cells.at(5) == "=" ? title : cells.at(5)),
          metric(scale(cells, 6)), imperial(cells.at(11) == "same" ? metric : scale(cells, 11))
    {}

    static ScaleCells scale(std::vector<std::string> const& cells, std::size_t at)
    {
        return {std::stoi(cells.at(at)), std::stod(cells.at(at + 1)), std::stod(cells.at(at + 2)), cells.at(at + 3),
                cells.at(at + 4)};
    }

    int pid;
    std::string className;
    std::size_t bytes;
    std::size_t index;
    std::string title;
    std::string sensor;
    ScaleCells metric;
    ScaleCells imperial;
};

std::vector<TableRow> tableRows()
{
    std::vector<TableRow> result;
    for (auto const& cells : support::readTable("tests/libobd/powertrain/pid_table.txt")) {
        result.emplace_back(cells);
    }
    return result;
}

class PidTable : public ::testing::Test
{
protected:
    void SetUp() override { obd::FuelTrim::setByteBInUse(false); }

    std::shared_ptr<support::FakeEcu> m_ecu = std::make_shared<support::FakeEcu>();
};

void expectScale(obd::SensorInfo const& info, UnitSystem system, ScaleCells const& expected)
{
    EXPECT_EQ(info.unit(system), expected.unit);
    EXPECT_DOUBLE_EQ(info.minValue(system), expected.minimum);
    EXPECT_DOUBLE_EQ(info.maxValue(system), expected.maximum);
    EXPECT_EQ(info.isNumeric(), expected.type != "text");
}

std::string typeName(obd::SensorValue const& value)
{
    if (dynamic_cast<obd::ConcreateNumericSensorValue<int> const*>(&value) != nullptr) {
        return "int";
    }
    if (dynamic_cast<obd::ConcreateNumericSensorValue<unsigned int> const*>(&value) != nullptr) {
        return "unsigned";
    }
    return dynamic_cast<obd::NumericSensorValue const*>(&value) != nullptr ? "double" : "text";
}

std::string decimals(obd::SensorValue const& value)
{
    auto const* const number = dynamic_cast<obd::NumericSensorValue const*>(&value);
    if (number == nullptr) {
        return "-";
    }
    std::string const text = number->toString(0.0);
    std::size_t const point = text.find('.');
    return std::to_string(point == std::string::npos ? 0 : text.size() - point - 1);
}

// Hands a parameter a reply by which all its sensors have a value: first byte FF where it tells which sensors are
// there, and 80 where it is a state of one bit.
void replyOfAllSensors(obd::PowertrainParameter& parameter, std::shared_ptr<obd::IEcu> const& ecu, std::size_t bytes)
{
    std::size_t const sensors = parameter.sensorInfo(*ecu).size();
    for (int const first : {0xFF, 0x80}) {
        support::Bytes payload(bytes, 0x80);
        payload[0] = static_cast<unsigned char>(first);
        ASSERT_TRUE(support::reply(parameter, ecu, payload));
        if (parameter.values(*ecu, UnitSystem::Metric).size() == sensors) {
            return;
        }
    }
    FAIL() << "some of the sensors have no value";
}

TEST_F(PidTable, EverySensorIsCalledAndScaledAsTheTableSays)
{
    for (TableRow const& row : tableRows()) {
        SCOPED_TRACE(row.className + " sensor " + std::to_string(row.index));
        auto const parameter = support::liveParameter(row.className);
        EXPECT_EQ(parameter->pid(), row.pid);
        EXPECT_EQ(parameter->description(*m_ecu), row.title);
        auto const infos = parameter->sensorInfo(*m_ecu);
        ASSERT_LT(row.index, infos.size());
        obd::SensorInfo const& info = *infos[row.index];
        EXPECT_EQ(info.uid(), row.pid * 10 + static_cast<int>(row.index));
        EXPECT_EQ(info.description(), row.sensor);
        expectScale(info, UnitSystem::Metric, row.metric);
        expectScale(info, UnitSystem::Imperial, row.imperial);
    }
}

TEST_F(PidTable, EverySensorPublishesTheTypeAndDecimalsThatTheTableSays)
{
    obd::FuelTrim::setByteBInUse(true);
    for (TableRow const& row : tableRows()) {
        SCOPED_TRACE(row.className + " sensor " + std::to_string(row.index));
        auto const parameter = support::liveParameter(row.className);
        ASSERT_NO_FATAL_FAILURE(replyOfAllSensors(*parameter, m_ecu, row.bytes + 1));
        for (auto const& [system, scale] :
             {std::pair(UnitSystem::Metric, row.metric), {UnitSystem::Imperial, row.imperial}}) {
            auto const values = parameter->values(*m_ecu, system);
            ASSERT_LT(row.index, values.size());
            EXPECT_EQ(values[row.index]->uid(), row.pid * 10 + static_cast<int>(row.index));
            EXPECT_EQ(typeName(*values[row.index]), scale.type);
            EXPECT_EQ(decimals(*values[row.index]), scale.decimals);
        }
    }
    obd::FuelTrim::setByteBInUse(false);
}

TEST_F(PidTable, PayloadsShorterThanTheTableSaysAreRefused)
{
    for (TableRow const& row : tableRows()) {
        SCOPED_TRACE(row.className);
        auto const parameter = support::liveParameter(row.className);
        EXPECT_FALSE(support::reply(*parameter, m_ecu, support::Bytes(row.bytes - 1, 0xFE)));
        EXPECT_TRUE(support::reply(*parameter, m_ecu, support::Bytes(row.bytes, 0xFE)));
    }
}

TEST_F(PidTable, NoClassAndNoSensorIsMissingFromTheTable)
{
    std::set<std::pair<std::string, std::size_t>> told;
    for (TableRow const& row : tableRows()) {
        told.emplace(row.className, row.index);
    }
    std::size_t sensors = 0;
    for (auto const& [name, make] : support::parameterClasses()) {
        std::size_t const count = support::liveParameter(name)->sensorInfo(*m_ecu).size();
        EXPECT_GT(count, 0u) << name;
        for (std::size_t i = 0; i < count; ++i) {
            EXPECT_EQ(told.count({name, i}), 1u) << name << " sensor " << i;
        }
        sensors += count;
    }
    EXPECT_EQ(sensors, told.size());
}

} // namespace
