#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/fuelconsumption.h"
#include "tests/libobd/powertrain/derivedrig.h"

namespace {

using derived::UnitSystem;
using obd::chooseConsumption;
using obd::ConsumptionKind;
using obd::createConsumption;
using obd::IgnitionType;

class ConsumptionChoice : public derived::Rig
{
protected:
    ConsumptionKind choice(IgnitionType type, std::vector<unsigned char> const& pids)
    {
        support(pids);
        return chooseConsumption(*ecu, type);
    }
};

TEST_F(ConsumptionChoice, GoesByIgnitionAndInputs)
{
    EXPECT_EQ(choice(IgnitionType::Compression, {0x04, 0x0D, 0x10}), ConsumptionKind::Diesel);
    EXPECT_EQ(choice(IgnitionType::Spark, {0x04, 0x0D, 0x10}), ConsumptionKind::GasMaf);
    EXPECT_EQ(choice(IgnitionType::Spark, {0x0B, 0x0C, 0x0D, 0x0F}), ConsumptionKind::GasMap);
    EXPECT_EQ(choice(IgnitionType::Spark, {0x0B, 0x0C, 0x0D, 0x0F, 0x10}), ConsumptionKind::GasMaf)
        << "measured air goes before calculated";
    EXPECT_EQ(choice(IgnitionType::Spark, {0x0B, 0x0C, 0x0D}), ConsumptionKind::None);
    EXPECT_EQ(choice(IgnitionType::Compression, {0x0D, 0x10}), ConsumptionKind::None)
        << "the gasoline model is not for a diesel";
    EXPECT_EQ(choice(IgnitionType::Compression, {0x0B, 0x0C, 0x0D, 0x0F}), ConsumptionKind::None);
}

TEST_F(ConsumptionChoice, MakesTheChosenClass)
{
    support({0x04, 0x0D, 0x10});
    EXPECT_NE(std::dynamic_pointer_cast<obd::DieselConsumption>(createConsumption(*ecu, IgnitionType::Compression, {})),
              nullptr);
    EXPECT_NE(std::dynamic_pointer_cast<obd::GasConsumption>(createConsumption(*ecu, IgnitionType::Spark, {})),
              nullptr);
    support({0x0B, 0x0C, 0x0D, 0x0F});
    EXPECT_NE(std::dynamic_pointer_cast<obd::GasConsumptionMap>(createConsumption(*ecu, IgnitionType::Spark, {})),
              nullptr);
    support({});
    log.clear();
    EXPECT_EQ(createConsumption(*ecu, IgnitionType::Spark, {}), nullptr);
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(ConsumptionChoice, SettingsReachTheModel)
{
    support({0x0B, 0x0C, 0x0D, 0x0F});
    answer("01 0B", "41 0B 3C");    // 60 kPa
    answer("01 0F", "41 0F 41");    // 25 degrees
    answer("01 0C", "41 0C 25 80"); // 2400 rpm
    drive(80);
    auto const parameter = createConsumption(*ecu, IgnitionType::Spark, {1.5, 42.5, 2.0});
    parameter->clear();
    parameter->update(proxy);
    auto const model = std::dynamic_pointer_cast<obd::FuelConsumption>(parameter);
    EXPECT_NEAR(model->consumption(*ecu, UnitSystem::Metric), 9.79464338632937 / 2 * 1.5, 1e-9);
}

TEST_F(ConsumptionChoice, SettingsReachTheOtherModels)
{
    support({0x04, 0x0D, 0x10});
    answer("01 10", "41 10 07 D0"); // 20 g/s
    answer("01 04", "41 04 66");    // 40 %
    drive(90);
    struct
    {
        IgnitionType type;
        double litres;
    } const cases[] = {{IgnitionType::Spark, 20.0 / 14.7 / 0.745 / 90.0 * 360.0},
                       {IgnitionType::Compression, 2.6525198938992043}};
    for (auto const& each : cases) {
        auto const parameter = createConsumption(*ecu, each.type, {2.0, 85.0, 2.0});
        parameter->clear();
        parameter->update(proxy);
        auto const model = std::dynamic_pointer_cast<obd::FuelConsumption>(parameter);
        EXPECT_NEAR(model->consumption(*ecu, UnitSystem::Metric), each.litres * 2.0, 1e-9);
    }
}

} // namespace
