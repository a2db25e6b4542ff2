#include "libobd/powertrain/numericparameters.h"
#include "tests/support/fakeecu.h"

#include <obd/parameterdescriptor.h>

#include <gtest/gtest.h>

namespace {

using obd::ObdMode;
using obd::ParameterDescriptor;
using obd::UnitSystem;

// A parameter whose sensors a test picks.
class MixedParameter : public obd::PowertrainParameter
{
public:
    explicit MixedParameter(std::vector<bool> const& numeric) : PowertrainParameter(ObdMode::CurrentData, 0)
    {
        for (bool const isNumeric : numeric) {
            int const index = static_cast<int>(m_infos.size());
            m_infos.push_back(
                std::make_shared<obd::SensorInfo>(30 + index, "Sensor " + std::to_string(index), isNumeric));
        }
    }

    obd::ParameterIdentifier::Id pid() const override { return obd::ParameterIdentifier::Id(3); }
    std::string description(obd::IEcu const& ecu) override { return "of " + ecu.name(); }
    std::vector<std::shared_ptr<obd::SensorInfo const>> sensorInfo(obd::IEcu const& /*ecu*/) override
    {
        return m_infos;
    }
    std::vector<std::shared_ptr<obd::SensorValue>> values(obd::IEcu const& /*ecu*/, UnitSystem /*system*/) override
    {
        return {};
    }

protected:
    bool fromPayload(std::shared_ptr<obd::IEcu> const& /*ecu*/, std::vector<unsigned char> const& /*payload*/) override
    {
        return false;
    }

private:
    std::vector<std::shared_ptr<obd::SensorInfo const>> m_infos;
};

ParameterDescriptor describe(std::vector<bool> const& numeric)
{
    return {std::make_shared<MixedParameter>(numeric), std::make_shared<support::FakeEcu>(), UnitSystem::Metric};
}

TEST(ParameterDescriptor, ForwardsToTheParameterForItsModule)
{
    ParameterDescriptor const descriptor = describe({true, false});
    EXPECT_EQ(descriptor.pid(), 3);
    EXPECT_EQ(descriptor.description(), "of ECM");
    auto const sensors = descriptor.sensors();
    ASSERT_EQ(sensors.size(), 2u);
    EXPECT_EQ(sensors[0]->uid(), 30);
    EXPECT_EQ(sensors[1]->uid(), 31);
    EXPECT_EQ(sensors[1]->description(), "Sensor 1");
}

TEST(ParameterDescriptor, HandsItsUnitSystemToTheSensors)
{
    auto const speed = std::make_shared<obd::VehicleSpeed>(ObdMode::CurrentData, 0);
    auto const ecu = std::make_shared<support::FakeEcu>();
    EXPECT_EQ(ParameterDescriptor(speed, ecu, UnitSystem::Metric).sensors()[0]->unit(), UnitKmPerHour);
    EXPECT_EQ(ParameterDescriptor(speed, ecu, UnitSystem::Imperial).sensors()[0]->unit(), UnitMilesPerHour);
}

TEST(ParameterDescriptor, TextualSensorsAloneAreNotNumeric)
{
    EXPECT_FALSE(describe({}).hasNumericSensors());
    EXPECT_FALSE(describe({false, false}).hasNumericSensors());
    EXPECT_TRUE(describe({false, true}).hasNumericSensors());
}

} // namespace
