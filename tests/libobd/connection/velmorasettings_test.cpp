#include "libobd/connection/velmorasettings.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"

#include <obd/iconnectionoptions.h>

#include <gtest/gtest.h>

#include <limits>

namespace {

using obd::VelmoraSettingsEvent;

struct SettingsEventRecorder : tervex::IEventListener<VelmoraSettingsEvent>
{
    std::vector<VelmoraSettingsEvent> events;
    void onEvent(VelmoraSettingsEvent const& event) override { events.push_back(event); }
};

class VelmoraSettings : public testing::Test
{
protected:
    std::shared_ptr<support::MemorySettings> store = std::make_shared<support::MemorySettings>();
    obd::VelmoraSettings settings{store};

    // What the store holds under a key, or the absurd value if nothing.
    int stored(std::string const& key) const
    {
        int value = std::numeric_limits<int>::min();
        store->getInt(key, value);
        return value;
    }
};

TEST_F(VelmoraSettings, NothingStoredReadsAsTheDefaults)
{
    EXPECT_EQ(settings.unitSystem(), obd::UnitSystem::Metric);
    EXPECT_EQ(settings.language(), 0);
    EXPECT_EQ(settings.fuelCorrectionFactor(), 1.0F);
    EXPECT_EQ(settings.volumetricEfficiency(), 85);
    EXPECT_EQ(settings.engineDisplacement(), 2.0F);
    EXPECT_EQ(settings.vehicleWeight(), 1500);
    EXPECT_FALSE(settings.fuelTypeOverride());
    EXPECT_EQ(settings.ignitionType(), obd::IgnitionType::Spark);
}

TEST_F(VelmoraSettings, VolumetricEfficiencyIsClampedWhenWrittenAndFallsBackWhenRead)
{
    settings.setVolumetricEfficiency(150);
    EXPECT_EQ(stored("common/volumetricefficiency"), 100);
    settings.setVolumetricEfficiency(-3);
    EXPECT_EQ(stored("common/volumetricefficiency"), 0);
    EXPECT_EQ(settings.volumetricEfficiency(), 0);
    store->setInt("common/volumetricefficiency", 150);
    EXPECT_EQ(settings.volumetricEfficiency(), 85);
    store->setInt("common/volumetricefficiency", -1);
    EXPECT_EQ(settings.volumetricEfficiency(), 85);
}

TEST_F(VelmoraSettings, EngineDisplacementReadsBackWithinAHundredth)
{
    settings.setEngineDisplacement(1.6F);
    EXPECT_TRUE(stored("common/enginedisplacement") == 160 || stored("common/enginedisplacement") == 159);
    EXPECT_NEAR(settings.engineDisplacement(), 1.6F, 0.01001);
}

TEST_F(VelmoraSettings, HundredthsAreCutOffNotRounded)
{
    settings.setFuelCorrectionFactor(1.239F);
    EXPECT_EQ(stored("common/fuelcorrectionfactor"), 123);
    EXPECT_FLOAT_EQ(settings.fuelCorrectionFactor(), 1.23F);
    settings.setFuelCorrectionFactor(-1.239F);
    EXPECT_EQ(stored("common/fuelcorrectionfactor"), -123);
}

TEST_F(VelmoraSettings, HundredthsBeyondAnIntegerAreLimited)
{
    settings.setEngineDisplacement(1e30F);
    EXPECT_EQ(stored("common/enginedisplacement"), std::numeric_limits<int>::max());
    settings.setEngineDisplacement(-std::numeric_limits<float>::infinity());
    EXPECT_EQ(stored("common/enginedisplacement"), std::numeric_limits<int>::min());
    settings.setEngineDisplacement(std::numeric_limits<float>::quiet_NaN());
    EXPECT_EQ(stored("common/enginedisplacement"), 0);
}

struct RangeCase
{
    char const* key;
    int stored;
    int read;
};

TEST_F(VelmoraSettings, ValuesOutsideTheirRangeReadAsTheDefault)
{
    auto const read = [this](std::string const& key) {
        if (key == "common/unitsystem") {
            return static_cast<int>(settings.unitSystem());
        }
        if (key == "common/language") {
            return settings.language();
        }
        if (key == "common/vehicleweight") {
            return settings.vehicleWeight();
        }
        return static_cast<int>(settings.ignitionType());
    };
    for (RangeCase const& row : {
             RangeCase{"common/unitsystem", 1, 1},
             {"common/unitsystem", 2, 0},
             {"common/unitsystem", -1, 0},
             {"common/language", 19, 19},
             {"common/language", 20, 0},
             {"common/language", -1, 0},
             {"common/vehicleweight", 0, 0},
             {"common/vehicleweight", 40000, 40000},
             {"common/vehicleweight", -1, 1500},
             {"common/ignitiontype", 1, 1},
             {"common/ignitiontype", 2, 0},
             {"common/ignitiontype", -1, 0},
         }) {
        store->setInt(row.key, row.stored);
        EXPECT_EQ(read(row.key), row.read) << row.key << " " << row.stored;
    }
}

TEST_F(VelmoraSettings, AnyStoredNumberButZeroOverridesTheFuelType)
{
    store->setInt("common/fueltypeoverride", -7);
    EXPECT_TRUE(settings.fuelTypeOverride());
    store->setInt("common/fueltypeoverride", 0);
    EXPECT_FALSE(settings.fuelTypeOverride());
}

TEST_F(VelmoraSettings, SettersWriteTheirKeyAsItIsAndFireTheirEvent)
{
    SettingsEventRecorder recorder;
    settings.attach(&recorder);
    settings.setUnitSystem(obd::UnitSystem::Imperial);
    settings.setLanguage(77);
    settings.setFuelCorrectionFactor(0.5F);
    settings.setVolumetricEfficiency(90);
    settings.setEngineDisplacement(3.0F);
    settings.setFuelTypeOverride(true);
    settings.setIgnitionType(obd::IgnitionType::Compression);
    settings.setVehicleWeight(-5);
    settings.detach(&recorder);
    settings.setFuelTypeOverride(false);
    EXPECT_EQ(store->writes(),
              (std::vector<std::string>{"common/unitsystem=1", "common/language=77", "common/fuelcorrectionfactor=50",
                                        "common/volumetricefficiency=90", "common/enginedisplacement=300",
                                        "common/fueltypeoverride=1", "common/ignitiontype=1", "common/vehicleweight=-5",
                                        "common/fueltypeoverride=0"}));
    EXPECT_EQ(recorder.events,
              (std::vector<VelmoraSettingsEvent>{
                  VelmoraSettingsEvent::UnitSystemChanged, VelmoraSettingsEvent::LanguageChanged,
                  VelmoraSettingsEvent::FuelCorrectionFactorChanged, VelmoraSettingsEvent::VolumetricEfficiencyChanged,
                  VelmoraSettingsEvent::EngineDisplacementChanged, VelmoraSettingsEvent::FuelTypeOverrideChanged,
                  VelmoraSettingsEvent::IgnitionTypeChanged, VelmoraSettingsEvent::VehicleWeightChanged}));
}

TEST_F(VelmoraSettings, EventsHaveTheirNumbers)
{
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::UnitSystemChanged), 0);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::LanguageChanged), 1);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::FuelCorrectionFactorChanged), 2);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::VolumetricEfficiencyChanged), 3);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::EngineDisplacementChanged), 4);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::FuelTypeOverrideChanged), 5);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::IgnitionTypeChanged), 6);
    EXPECT_EQ(static_cast<int>(VelmoraSettingsEvent::VehicleWeightChanged), 7);
}

TEST_F(VelmoraSettings, AnEqualValueIsWrittenAndFiredAgain)
{
    SettingsEventRecorder recorder;
    settings.attach(&recorder);
    settings.setLanguage(3);
    settings.setLanguage(3);
    EXPECT_EQ(recorder.events.size(), 2U);
    EXPECT_EQ(store->writes().size(), 2U);
}

TEST_F(VelmoraSettings, TheEventComesAfterTheWrite)
{
    struct Reader : tervex::IEventListener<VelmoraSettingsEvent>
    {
        obd::VelmoraSettings* source = nullptr;
        int weight = 0;
        void onEvent(VelmoraSettingsEvent const& /*event*/) override { weight = source->vehicleWeight(); }
    } reader;
    reader.source = &settings;
    settings.attach(&reader);
    settings.setVehicleWeight(900);
    EXPECT_EQ(reader.weight, 900);
}

TEST_F(VelmoraSettings, AChangeBehindTheLibrarysBackIsSeenAtTheNextReadWithoutAnEvent)
{
    SettingsEventRecorder recorder;
    settings.attach(&recorder);
    store->setInt("common/unitsystem", 1);
    EXPECT_EQ(settings.unitSystem(), obd::UnitSystem::Imperial);
    EXPECT_TRUE(recorder.events.empty());
}

TEST_F(VelmoraSettings, ListenerThatThrowsIsToldInTheLogAndHarmsNoSetter)
{
    struct Thrower : tervex::IEventListener<VelmoraSettingsEvent>
    {
        void onEvent(VelmoraSettingsEvent const& /*event*/) override { throw std::runtime_error("no"); }
    } thrower;
    support::LogCapture log;
    settings.attach(&thrower);
    settings.setVehicleWeight(900);
    EXPECT_EQ(settings.vehicleWeight(), 900);
    EXPECT_EQ(log.lines(), std::vector<std::string>{"FATAL Listener threw an exception"});
}

TEST_F(VelmoraSettings, StoreThatCannotReadGivesTheDefaults)
{
    settings.setVehicleWeight(900);
    store->failReads(true);
    EXPECT_EQ(settings.vehicleWeight(), 1500);
    store->failReads(false);
    EXPECT_EQ(settings.vehicleWeight(), 900);
}

TEST_F(VelmoraSettings, StoreThatCannotWriteReachesTheCallerAndFiresNothing)
{
    SettingsEventRecorder recorder;
    settings.attach(&recorder);
    store->failWrites(true);
    EXPECT_THROW(settings.setVehicleWeight(900), std::runtime_error);
    EXPECT_TRUE(recorder.events.empty());
    EXPECT_EQ(settings.vehicleWeight(), 1500);
}

TEST_F(VelmoraSettings, OwnsItsConnectionOptions)
{
    ASSERT_NE(settings.connectionOptions(), nullptr);
    EXPECT_EQ(settings.connectionOptions(), settings.connectionOptions());
    EXPECT_EQ(settings.connectionOptions()->bus(), 0);
}

TEST_F(VelmoraSettings, SyncIsLeftToTheApplication)
{
    settings.setLanguage(1);
    settings.connectionOptions()->save();
    settings.connectionOptions()->addBluetoothDevice({"OBD", "00:11", 1});
    EXPECT_EQ(store->syncs(), 0);
}

} // namespace
