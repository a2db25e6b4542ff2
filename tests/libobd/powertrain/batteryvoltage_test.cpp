#include "libobd/powertrain/batteryvoltage.h"
#include "tests/libobd/powertrain/derivedrig.h"

namespace {

using derived::Status;
using derived::UnitSystem;

class BatteryVoltage : public derived::Rig
{
protected:
    obd::BatteryVoltage parameter;
};

TEST_F(BatteryVoltage, IsTheAdaptersReading)
{
    EXPECT_EQ(parameter.voltage(), 0.0);
    proxy->setBatteryVoltage(12.4F);
    EXPECT_EQ(parameter.update(proxy), Status::UpdateOk);
    EXPECT_EQ(parameter.voltage(), static_cast<double>(12.4F));
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Metric), "12.4");
    EXPECT_EQ(support::texts(parameter, *ecu, UnitSystem::Imperial), "12.4");
    EXPECT_EQ(proxy->count(), 0) << "no request goes to the bus";
}

TEST_F(BatteryVoltage, IsTheSameForEveryModule)
{
    proxy->setBatteryVoltage(13.8F);
    parameter.update(proxy);
    EXPECT_EQ(support::texts(parameter, support::FakeEcu(0x123), UnitSystem::Metric), "13.8");
}

TEST_F(BatteryVoltage, NoReadingFailsAndKeepsTheOldValue)
{
    proxy->setBatteryVoltage(12.4F);
    parameter.update(proxy);
    for (float const volts : {0.0F, -1.0F}) {
        proxy->setBatteryVoltage(volts);
        EXPECT_EQ(parameter.update(proxy), Status::UpdateFailed);
        EXPECT_EQ(parameter.voltage(), static_cast<double>(12.4F));
    }
}

TEST_F(BatteryVoltage, ClearForgets)
{
    proxy->setBatteryVoltage(12.4F);
    parameter.update(proxy);
    parameter.clear();
    EXPECT_EQ(parameter.voltage(), 0.0);
    EXPECT_FALSE(parameter.keepsHistory());
}

} // namespace
