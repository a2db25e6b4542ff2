// The settings file at its bounds, each message, and each setting with its range as people see it.
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/session/userfolders.h"
#include "libvelmora/session/vehiclesettings.h"
#include "tests/support/memorysettings.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/settings.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

namespace {

using testing::ElementsAre;
using testsupport::TemporaryFolder;
using velmora::Error;
using velmora::findSetting;
using velmora::SettingsStore;

// What reading a file of that text complains of, behind its name.
std::string storeComplaint(TemporaryFolder const& folder, std::string const& text)
{
    std::ofstream(folder.file("s.toml")) << text;
    std::string const begin = "Could not read the settings file " + folder.file("s.toml") + ": ";
    try {
        SettingsStore{folder.file("s.toml")};
    } catch (Error const& error) {
        std::string const what = error.what();
        EXPECT_TRUE(what.starts_with(begin)) << what;
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Failed);
        return what.substr(begin.size());
    }
    return "";
}

TEST(SettingsBounds, AreToldInTheFilesOwnWords)
{
    TemporaryFolder const folder;
    std::pair<std::string, std::string> const cases[] = {
        {"x = 2147483647", ""},
        {"x = 2147483648", "x is too large a number"},
        {"[a]\nx = -2147483648", ""},
        {"[a]\nx = -2147483649", "a/x is too large a number"},
        {"x = true", "x is neither a whole number nor a text"},
        {"[a.b]\nx = 1.5", "a/b/x is neither a whole number nor a text"},
        {std::string(1 << 20, '#'), ""},
        {std::string((1 << 20) + 1, '#'), "it has 1048577 bytes; at most 1048576 are read"},
        {"[common]\nvehicleweight = 1", ""},
        {"[common]\nvehicleweight = 0", "common/vehicleweight has no value that it can have; expected 1 to 60000"},
        {"[common]\nvolumetricefficiency = 100", ""},
        {"[common]\nvolumetricefficiency = 101",
         "common/volumetricefficiency has no value that it can have; expected 0 to 100"},
        {"[common]\nfuelcorrectionfactor = 10.0", ""},
        {"[common]\nfuelcorrectionfactor = 9",
         "common/fuelcorrectionfactor has no value that it can have; expected 10 to 1000 hundredths"},
    };
    for (auto const& [text, complaint] : cases) {
        EXPECT_EQ(storeComplaint(folder, text), complaint) << text.substr(0, 60);
    }
    EXPECT_TRUE(storeComplaint(folder, "x = 1\ny =\n").ends_with(" (line 2)"));
}

TEST(SettingsBounds, WritingHoldsNothingOpenAndTellsAFolderThatCannotBe)
{
    TemporaryFolder const folder;
    long const before = testsupport::openDescriptors();
    SettingsStore store(folder.file("s.toml"));
    store.setInt("a/b", 1);
    store.sync();
    store.sync();
    EXPECT_EQ(testsupport::openDescriptors(), before);
    EXPECT_EQ(folder.read("s.toml"), "[a]\nb = 1\n");
    std::ofstream(folder.file("file")) << "x";
    SettingsStore inFile(folder.file("file/x/s.toml"));
    try {
        inFile.sync();
        ADD_FAILURE() << "a file holds no files";
    } catch (Error const& error) {
        EXPECT_EQ(std::string(error.what()),
                  "Could not write the settings file " + folder.file("file/x/s.toml") + ": Not a directory");
    }
}

TEST(SettingsBounds, KeysBelowABeginning)
{
    TemporaryFolder const folder;
    SettingsStore store(folder.file("s.toml"));
    for (char const* const key : {"limit/SPEED", "limit/RPM", "limits/X", "limi", "a", "z"}) {
        store.setInt(key, 1);
    }
    EXPECT_THAT(store.keysBelow("limit/"), ElementsAre("RPM", "SPEED"));
    EXPECT_THAT(store.keysBelow("z"), ElementsAre(""));
    EXPECT_THAT(store.keysBelow("zz"), ElementsAre());
}

// Environment variables as they were, at the end.
class UserFolders : public testing::Test
{
protected:
    static constexpr char const* names[] = {"HOME", "XDG_CONFIG_HOME", "XDG_DATA_HOME"};

    UserFolders()
    {
        for (char const* const name : names) {
            char const* const value = std::getenv(name);
            m_before.push_back(value == nullptr ? std::nullopt : std::optional<std::string>(value));
            ::unsetenv(name);
        }
    }
    ~UserFolders() override
    {
        for (std::size_t i = 0; i < m_before.size(); ++i) {
            m_before[i] ? ::setenv(names[i], m_before[i]->c_str(), 1) : ::unsetenv(names[i]);
        }
    }

    std::vector<std::optional<std::string>> m_before;
};

TEST_F(UserFolders, AreBelowHomeUnlessTheyAreNamed)
{
    EXPECT_EQ(SettingsStore::defaultFile(), "./.config/velmora/settings.toml");
    EXPECT_EQ(velmora::userDataFolder(), ".local/share/velmora");
    ::setenv("HOME", "/home/me", 1);
    EXPECT_EQ(SettingsStore::defaultFile(), "/home/me/.config/velmora/settings.toml");
    EXPECT_EQ(velmora::userDataFolder(), "/home/me/.local/share/velmora");
    ::setenv("XDG_CONFIG_HOME", "", 1);
    ::setenv("XDG_DATA_HOME", "", 1);
    EXPECT_EQ(SettingsStore::defaultFile(), "/home/me/.config/velmora/settings.toml");
    EXPECT_EQ(velmora::userDataFolder(), "/home/me/.local/share/velmora");
    ::setenv("XDG_CONFIG_HOME", "/c", 1);
    ::setenv("XDG_DATA_HOME", "/d", 1);
    EXPECT_EQ(SettingsStore::defaultFile(), "/c/velmora/settings.toml");
    EXPECT_EQ(velmora::userDataFolder(), "/d/velmora");
}

TEST(SettingRanges, AreShownAndStoredAndOutsideThem)
{
    struct Case
    {
        char const* name;
        char const* range;
        char const* stored;
        char const* hint;
        int outside;
        char const* outsideShows;
    };
    Case const cases[] = {
        {"units", "metric or imperial", "0 (metric) or 1 (imperial)", "", 2, "metric"},
        {"gallon", "us or uk", "0 (us) or 1 (uk)", "", -1, "us"},
        {"displacement", "0.05 to 30.00", "5 to 3000 hundredths", " l, with at most two digits behind the point", 4,
         "0.04"},
        {"efficiency", "0 to 100", "0 to 100", " %", -1, "85"},
        {"weight", "1 to 60000", "1 to 60000", " kg", 60001, "60001"},
        {"correction", "0.10 to 10.00", "10 to 1000 hundredths", ", with at most two digits behind the point", 1001,
         "10.01"},
        {"fuel", "reported or override", "0 (reported) or 1 (override)", "", 2, "reported"},
        {"ignition", "spark or compression", "0 (spark) or 1 (compression)", "", 2, "spark"},
    };
    EXPECT_EQ(velmora::vehicleSettings().size(), std::size(cases));
    for (Case const& each : cases) {
        velmora::VehicleSetting const& setting = findSetting(each.name);
        EXPECT_EQ(shownRange(setting), each.range);
        EXPECT_EQ(storedRange(setting), each.stored);
        support::MemorySettings store;
        for (int const edge : {setting.lowest, setting.highest}) {
            store.setInt(setting.key, edge);
            std::string const shown = shownSetting(setting, store);
            support::MemorySettings again;
            setSetting(setting, shown, again);
            int value = -1;
            EXPECT_TRUE(again.getInt(setting.key, value));
            EXPECT_EQ(value, edge) << each.name << " " << shown;
        }
        store.setInt(setting.key, each.outside);
        EXPECT_EQ(shownSetting(setting, store), each.outsideShows) << each.name;
        try {
            setSetting(setting, "odd", store);
            ADD_FAILURE() << each.name;
        } catch (Error const& error) {
            EXPECT_EQ(std::string(error.what()), std::string("\"odd\" is no value for ") + each.name);
            EXPECT_EQ(error.hints().at(0), std::string("expected ") + each.range + each.hint);
        }
    }
    EXPECT_STREQ(findSetting("units").unit, "");
    try {
        findSetting("colour");
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "There is no setting \"colour\"");
        EXPECT_THAT(error.hints(), ElementsAre("these there are: units, gallon, displacement, efficiency, weight, "
                                               "correction, fuel, ignition"));
    }
}

TEST(SettingRanges, NumbersAreTakenToTheHundredth)
{
    support::MemorySettings store;
    velmora::VehicleSetting const& displacement = findSetting("displacement");
    for (auto const& [text, stored] : {std::pair("1.6", 160),
                                       {"1.60000000001", 160},
                                       {"1.600000005", 160},
                                       {"0.29", 29},
                                       {"2.", 200},
                                       {"30.00", 3000}}) {
        setSetting(displacement, text, store);
        int value = 0;
        store.getInt(displacement.key, value);
        EXPECT_EQ(value, stored) << text;
    }
    for (char const* const text : {"1.60001", "inf", "-1.6", "1.6 ", " 1.6"}) {
        EXPECT_THROW(setSetting(displacement, text, store), Error) << text;
    }
    int value = 0;
    EXPECT_TRUE(velmora::storedHundredths(velmora::settings::engineDisplacement, 21474836.47, value));
    EXPECT_EQ(value, 2147483647);
    EXPECT_TRUE(velmora::storedHundredths(velmora::settings::engineDisplacement, -21474836.47, value));
    EXPECT_FALSE(velmora::storedHundredths(velmora::settings::engineDisplacement, 21474836.48, value));
    for (char const* const key : {"common/language", "velmora/port", "limit/X", "bluetooth/1/name", "velmora/gallon"}) {
        EXPECT_TRUE(velmora::isKnownKey(key)) << key;
    }
    for (char const* const key : {"", "limit", "common", "velmora/ports", "x/limit/"}) {
        EXPECT_FALSE(velmora::isKnownKey(key)) << key;
    }
}

} // namespace
