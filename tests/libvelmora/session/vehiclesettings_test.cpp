#include "libvelmora/session/libraryuse.h"
#include "libvelmora/session/vehiclesettings.h"
#include "libvelmora/vehicle/units.h"
#include "tests/support/memorysettings.h"
#include "tests/support/temporaryfolder.h"

#include <obd/iconnectionoptions.h>
#include <obd/iobdvelmora.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>
#include <velmora/error.h>
#include <velmora/settings.h>
#include <velmora/settingsfile.h>

#include <gtest/gtest.h>

#include <fstream>
#include <limits>
#include <set>

namespace {

using namespace velmora;

class VehicleSettings : public testing::Test
{
protected:
    void set(std::string const& name, std::string const& text) { setSetting(findSetting(name), text, *m_store); }
    std::string shown(std::string const& name) { return shownSetting(findSetting(name), *m_store); }

    std::shared_ptr<support::MemorySettings> m_store = std::make_shared<support::MemorySettings>();
    LibraryUse m_use{""};
    std::shared_ptr<obd::IObdVelmora> m_obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, m_store);
    obd::IVelmoraSettings& m_library = *m_obd->getSettings();
};

TEST_F(VehicleSettings, ReachTheLibrary)
{
    set("units", "imperial");
    EXPECT_EQ(m_library.unitSystem(), obd::UnitSystem::Imperial);
    set("gallon", "uk");
    EXPECT_EQ(storedUnits(m_library.unitSystem(), *m_store), Units::ImperialUk);
    set("displacement", "1.6");
    EXPECT_FLOAT_EQ(m_library.engineDisplacement(), 1.6F);
    set("efficiency", "90");
    EXPECT_EQ(m_library.volumetricEfficiency(), 90);
    set("weight", "1234");
    EXPECT_EQ(m_library.vehicleWeight(), 1234);
    set("correction", "1.15");
    EXPECT_FLOAT_EQ(m_library.fuelCorrectionFactor(), 1.15F);
    set("fuel", "override");
    EXPECT_TRUE(m_library.fuelTypeOverride());
    set("ignition", "compression");
    EXPECT_EQ(m_library.ignitionType(), obd::IgnitionType::Compression);
}

TEST_F(VehicleSettings, DefaultsAreTheLibrarys)
{
    std::set<std::string> const shownDefaults = {"units metric",  "gallon us",     "displacement 2.00",
                                                 "efficiency 85", "weight 1500",   "correction 1.00",
                                                 "fuel reported", "ignition spark"};
    std::set<std::string> found;
    for (VehicleSetting const& setting : vehicleSettings()) {
        EXPECT_EQ(shownSetting(setting, *m_store), shownDefault(setting));
        found.insert(setting.name + (" " + shownDefault(setting)));
        set(setting.name, shownDefault(setting));
    }
    EXPECT_EQ(found, shownDefaults);
    EXPECT_EQ(m_library.unitSystem(), obd::UnitSystem::Metric);
    EXPECT_FLOAT_EQ(m_library.engineDisplacement(), 2.0F);
    EXPECT_EQ(m_library.volumetricEfficiency(), 85);
    EXPECT_EQ(m_library.vehicleWeight(), 1500);
    EXPECT_FLOAT_EQ(m_library.fuelCorrectionFactor(), 1.0F);
    EXPECT_FALSE(m_library.fuelTypeOverride());
    EXPECT_EQ(m_library.ignitionType(), obd::IgnitionType::Spark);
}

TEST_F(VehicleSettings, WhatIsNoValueIsToldWithTheRange)
{
    for (auto const& [name, text, range] :
         {std::tuple("displacement", "1.605", "0.05 to 30.00 l, with at most two digits"),
          {"displacement", "0.04", "0.05"},
          {"displacement", "30.01", "30.00"},
          {"displacement", "1,6", "0.05"},
          {"displacement", "1.6l", "0.05"},
          {"displacement", "nan", "0.05"},
          {"displacement", "", "0.05"},
          {"efficiency", "85.5", "0 to 100 %"},
          {"efficiency", "101", "0 to 100 %"},
          {"efficiency", "-1", "0 to 100 %"},
          {"weight", "1e99", "1 to 60000 kg"},
          {"units", "Imperial", "metric or imperial"},
          {"gallon", "imperial", "us or uk"},
          {"ignition", "0", "spark or compression"}}) {
        try {
            set(name, text);
            ADD_FAILURE() << name << " " << text;
        } catch (Error const& error) {
            EXPECT_EQ(error.kind(), ErrorKind::WrongUse);
            EXPECT_NE(error.hints().at(0).find(range), std::string::npos) << error.hints().at(0);
        }
    }
    for (auto const& [name, text] : {std::pair("displacement", "0.05"), {"displacement", "30"}, {"efficiency", "0"}}) {
        set(name, text);
    }
    EXPECT_THROW(findSetting("color"), Error);
}

TEST_F(VehicleSettings, WhatReadsAsTheDefaultShowsAsTheDefault)
{
    m_store->setInt(settings::volumetricEfficiency, 101);
    m_store->setInt(settings::ignitionType, 2);
    m_store->setInt(settings::engineDisplacement, 5000);
    EXPECT_EQ(shown("efficiency"), "85");
    EXPECT_EQ(shown("ignition"), "spark");
    EXPECT_EQ(shown("displacement"), "50.00") << "which the library takes";
    EXPECT_FLOAT_EQ(m_library.engineDisplacement(), 50.0F);
}

// Whatever the library writes of itself is known, and what a finger slipped on is not.
TEST_F(VehicleSettings, KeysThatNothingReadsAreFound)
{
    m_library.setLanguage(1);
    m_library.connectionOptions()->addBluetoothDevice({"OBDII", "00:1D:A5:68:98:8B", 1});
    m_library.connectionOptions()->save();
    for (VehicleSetting const& setting : vehicleSettings()) {
        m_store->setInt(setting.key, setting.lowest);
    }
    EXPECT_GT(m_store->writes().size(), 20U);
    for (std::string const& write : m_store->writes()) {
        EXPECT_TRUE(isKnownKey(write.substr(0, write.find('=')))) << write;
    }
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("settings.toml");
    std::ofstream(file) << "displacement = 160\n[common]\nenginedisplacment = 160\nvehicleweight = 1400\n"
                           "[connection]\nprotocl = 6\n[limit]\nRPM = 6000\n[velmora]\nport = 'sim:'\n";
    EXPECT_EQ(SettingsFile(file).unknownKeys(),
              (std::vector<std::string>{"common/enginedisplacment", "connection/protocl", "displacement"}));
    EXPECT_TRUE(SettingsFile(folder.file("none.toml")).unknownKeys().empty());
}

TEST_F(VehicleSettings, OnlyTheirOwnKeysAreStoredInHundredths)
{
    int value = 7;
    for (auto const& [key, number] : {std::pair<char const*, double>{settings::vehicleWeight, 1.0},
                                      {settings::unitSystem, 1.0},
                                      {"no such key", 1.0},
                                      {settings::engineDisplacement, 1e9},
                                      {settings::engineDisplacement, std::numeric_limits<double>::quiet_NaN()}}) {
        EXPECT_FALSE(storedHundredths(key, number, value)) << key;
        EXPECT_EQ(value, 7);
    }
    EXPECT_TRUE(storedHundredths(settings::engineDisplacement, 1.6, value));
    EXPECT_EQ(value, 160);
}

} // namespace
