#include "libobd/powertrain/batteryvoltage.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/fuelconsumption.h"
#include "libobd/powertrain/torque.h"
#include "tests/support/fakeecu.h"
#include "tests/support/payload/payload.h"
#include "tests/support/payload/payloadproperty.h"

#include <obd/sensorinfo.h>

#include <gtest/gtest.h>

namespace {

using obd::UnitSystem;

struct Range
{
    int unit;
    double minimum;
    double maximum;
};

struct Case
{
    std::shared_ptr<obd::PowertrainParameter> parameter;
    int id;
    char const* title;
    int decimals;
    Range metric;
    Range imperial;
    bool keepsHistory;
};

// Units: 4 V, 14 kPa, 37 psi, 49 l/100 km, 50 mpg, 51 Nm, 53 kW, 54 hp.
std::vector<Case> cases()
{
    support::FakeEcu const ecu;
    return {
        {std::make_shared<obd::GasConsumption>(ecu), 0xF0, "Fuel consumption", 1, {49, 0, 500}, {50, 0, 500}, true},
        {std::make_shared<obd::GasConsumptionMap>(ecu), 0xF0, "Fuel consumption", 1, {49, 0, 500}, {50, 0, 500}, true},
        {std::make_shared<obd::DieselConsumption>(ecu), 0xF0, "Fuel consumption", 1, {49, 0, 500}, {50, 0, 500}, true},
        {std::make_shared<obd::BatteryVoltage>(), 0xF4, "Battery voltage", 1, {4, 0, 24}, {4, 0, 24}, false},
        {std::make_shared<obd::EnginePower>(1500), 0xF5, "Engine power", 0, {53, 0, 1000}, {54, 0, 1300}, true},
        {std::make_shared<obd::Torque>(1500), 0xF6, "Engine torque", 0, {51, 0, 2000}, {51, 0, 2000}, true},
        {std::make_shared<obd::BoostPressure>(), 0xF7, "Boost pressure", 1, {14, 0, 255}, {37, 0, 36.9846135}, true},
    };
}

void expectRange(obd::SensorInfo const& info, UnitSystem system, Range const& range)
{
    EXPECT_EQ(info.unit(system), range.unit);
    EXPECT_EQ(info.minValue(system), range.minimum);
    EXPECT_DOUBLE_EQ(info.maxValue(system), range.maximum);
}

TEST(DerivedParameter, TellsItsSensor)
{
    support::FakeEcu const ecu;
    for (Case const& each : cases()) {
        SCOPED_TRACE(each.title);
        EXPECT_EQ(each.parameter->pid(), each.id);
        EXPECT_EQ(each.parameter->description(ecu), each.title);
        EXPECT_EQ(each.parameter->keepsHistory(), each.keepsHistory);
        EXPECT_EQ(each.parameter->timeout(), 1500U);
        EXPECT_EQ(each.parameter->mode(), obd::ObdMode::CurrentData);
        auto const infos = each.parameter->sensorInfo(ecu);
        ASSERT_EQ(infos.size(), 1U);
        EXPECT_EQ(infos[0]->uid(), each.id * 10);
        EXPECT_EQ(infos[0]->description(), each.title);
        EXPECT_TRUE(infos[0]->isNumeric());
        expectRange(*infos[0], UnitSystem::Metric, each.metric);
        expectRange(*infos[0], UnitSystem::Imperial, each.imperial);
    }
}

TEST(DerivedParameter, HasOneNumberInItsDecimals)
{
    support::FakeEcu const stranger(0x123);
    for (Case const& each : cases()) {
        for (UnitSystem const system : {UnitSystem::Metric, UnitSystem::Imperial}) {
            EXPECT_EQ(support::texts(*each.parameter, stranger, system), each.decimals == 1 ? "0.0" : "0")
                << each.title;
        }
        EXPECT_EQ(support::brokenReading(*each.parameter, stranger), "");
    }
}

TEST(DerivedParameter, HasNoRequestAndTakesNoReply)
{
    auto const ecu = std::make_shared<support::FakeEcu>();
    for (Case const& each : cases()) {
        support::Bytes request{0x01};
        each.parameter->requestData(request);
        EXPECT_TRUE(request.empty());
        for (support::Bytes const& reply : {support::Bytes{}, support::Bytes{0x41, 0xF5, 0x10, 0x20}}) {
            EXPECT_FALSE(each.parameter->setResponseData(ecu, reply)) << each.title;
        }
    }
}

} // namespace
