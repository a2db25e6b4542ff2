#include "tests/support/fakeecu.h"
#include "tests/support/parameterclasses.h"
#include "tests/support/payload/payload.h"
#include "tests/support/payload/payloadproperty.h"
#include "tests/support/tablefile.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <set>
#include <tuple>

// Replies of any length and content to every class.
namespace {

using obd::UnitSystem;
using support::Bytes;

using TextsByClass = std::map<std::string, std::set<std::string>>;

std::vector<std::string> split(std::string text, std::string const& separator)
{
    std::vector<std::string> parts;
    for (std::size_t at = text.find(separator); at != std::string::npos; at = text.find(separator)) {
        parts.push_back(text.substr(0, at));
        text.erase(0, at + separator.size());
    }
    parts.push_back(text);
    return parts;
}

// A sensor's text in the tables without the index that may stand before it, as in "2: Closed loop".
std::string withoutIndex(std::string const& text)
{
    return text.find(": ") == 1 ? text.substr(3) : text;
}

// What the tables of this directory say that the sensors of a class may read. An empty cell there is a reply without
// values, but for the list of places that have a sensor.
TextsByClass tableTexts()
{
    TextsByClass known;
    for (char const* file : {"state_table.txt", "multisensor_table.txt"}) {
        for (auto const& cells : support::readTable(std::string("tests/libobd/powertrain/") + file)) {
            for (std::string const& sensor : split(cells.at(3), " + ")) {
                if (!sensor.empty() || cells.at(1).find("OxygenSensorsPresent") == 0) {
                    known[cells.at(1)].insert(withoutIndex(sensor));
                }
            }
        }
    }
    return known;
}

std::map<std::string, std::size_t> shortestPayloads()
{
    std::map<std::string, std::size_t> shortest;
    for (auto const& cells : support::readTable("tests/libobd/powertrain/pid_table.txt")) {
        shortest[cells.at(1)] = std::stoul(cells.at(2));
    }
    return shortest;
}

bool isNumber(std::string const& text)
{
    return !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
}

// The names of places, which come in all combinations, are checked one by one.
bool isKnown(std::set<std::string> const& known, std::string const& text)
{
    std::vector<std::string> const parts = split(text, ", ");
    return known.contains(text) ||
           std::all_of(parts.begin(), parts.end(), [&known](auto const& part) { return known.contains(part); });
}

class Payloads : public ::testing::Test
{
protected:
    explicit Payloads(obd::ObdProtocol protocol = obd::ObdProtocolCan11)
        : m_ecu(std::make_shared<support::FakeEcu>(0x10, protocol))
    {}

    Bytes randomPayload(std::size_t length)
    {
        Bytes payload(length);
        std::generate(payload.begin(), payload.end(), [this] { return static_cast<unsigned char>(m_random()); });
        return payload;
    }

    std::size_t shortest(std::string const& name, obd::PowertrainParameter const& parameter) const
    {
        bool const isTrim = dynamic_cast<obd::FuelTrim const*>(&parameter) != nullptr;
        return m_shortest.at(name) + (isTrim && obd::FuelTrim::byteBInUse() ? 1 : 0);
    }

    void expectTextsOfTheTables(std::string const& name, obd::PowertrainParameter& parameter) const
    {
        for (auto const& value : parameter.values(*m_ecu, UnitSystem::Metric)) {
            std::string const text = value->textualValue();
            if (std::dynamic_pointer_cast<obd::NumericSensorValue>(value) == nullptr && !isNumber(text)) {
                auto const known = m_texts.find(name);
                ASSERT_NE(known, m_texts.end()) << name;
                EXPECT_TRUE(isKnown(known->second, text)) << name << ": " << text;
            }
        }
    }

    void expectNoHarm(std::string const& name, obd::PowertrainParameter& parameter, Bytes const& payload) const
    {
        SCOPED_TRACE(name + " of " + std::to_string(payload.size()) + " bytes");
        EXPECT_EQ(support::brokenBy(parameter, m_ecu, payload), "");
        EXPECT_EQ(support::reply(parameter, m_ecu, payload), payload.size() >= shortest(name, parameter));
        expectTextsOfTheTables(name, parameter);
    }

    std::shared_ptr<support::FakeEcu> m_ecu;
    std::map<std::string, std::size_t> m_shortest = shortestPayloads();
    TextsByClass m_texts = tableTexts();
    std::mt19937 m_random{1};
};

TEST_F(Payloads, WithAnyFirstByteReadAsTextsOfTheTables)
{
    for (auto const& [name, texts] : m_texts) {
        auto const parameter = support::liveParameter(name);
        for (int first = 0; first <= 0xFF; ++first) {
            Bytes payload(m_shortest.at(name), static_cast<unsigned char>(m_random()));
            payload[0] = static_cast<unsigned char>(first);
            expectNoHarm(name, *parameter, payload);
        }
    }
}

class AnyPayload : public Payloads, public ::testing::WithParamInterface<std::tuple<obd::ObdProtocol, bool>>
{
protected:
    AnyPayload() : Payloads(std::get<0>(GetParam())) {}

    void SetUp() override { obd::FuelTrim::setByteBInUse(std::get<1>(GetParam())); }
    void TearDown() override { obd::FuelTrim::setByteBInUse(false); }
};

TEST_P(AnyPayload, IsReadOrRefusedByEveryClassBeforeAndAfterAGoodOne)
{
    for (auto const& [name, make] : support::parameterClasses()) {
        for (std::size_t length = 0; length <= 40; ++length) {
            auto const parameter = support::liveParameter(name);
            Bytes const payload = randomPayload(length);
            expectNoHarm(name, *parameter, payload);
            ASSERT_TRUE(support::reply(*parameter, m_ecu, Bytes(40, 0x01))) << name;
            expectNoHarm(name, *parameter, payload);
        }
    }
}

INSTANTIATE_TEST_SUITE_P(
    OnEveryBus, AnyPayload,
    ::testing::Values(std::tuple(obd::ObdProtocolIso9141, false), std::tuple(obd::ObdProtocolIso14230, false),
                      std::tuple(obd::ObdProtocolJ1850, false), std::tuple(obd::ObdProtocolCan11, false),
                      std::tuple(obd::ObdProtocolCan11, true), std::tuple(obd::ObdProtocolCan29, false)));

} // namespace
