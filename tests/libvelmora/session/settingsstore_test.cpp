#include "libvelmora/session/settingsstore.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using velmora::Error;
using velmora::SettingsStore;

class Settings : public testing::Test
{
protected:
    void write(std::string const& text) const { std::ofstream(m_file) << text; }
    std::string content() const { return content(m_file); }
    static std::string content(std::filesystem::path const& file)
    {
        std::ifstream in(file);
        return {std::istreambuf_iterator<char>(in), {}};
    }

    testsupport::TemporaryFolder const m_own;
    std::filesystem::path const m_folder = m_own.path();
    std::filesystem::path const m_file = m_folder / "settings.toml";
};

TEST_F(Settings, FileThatDoesNotExistIsAnEmptyStore)
{
    SettingsStore store(m_file);
    int number = 7;
    std::string text = "before";
    EXPECT_FALSE(store.getInt("common/unitsystem", number));
    EXPECT_FALSE(store.getString("velmora/port", text));
    EXPECT_EQ(number, 7);
    EXPECT_EQ(text, "before");
    EXPECT_FALSE(std::filesystem::exists(m_file)) << "reading writes nothing";
}

TEST_F(Settings, FolderIsNoStore)
{
    EXPECT_THROW(SettingsStore(m_folder.string()), Error);
}

TEST_F(Settings, ReadsTablesAsGroupsOfKeys)
{
    write("[common]\nunitsystem = 1\n[velmora]\nport = \"sim:\"\n[bluetooth.device1]\nname = \"OBDII\"\n");
    SettingsStore store(m_file);
    int number = 0;
    std::string text;
    EXPECT_TRUE(store.getInt("common/unitsystem", number));
    EXPECT_EQ(number, 1);
    EXPECT_TRUE(store.getString("velmora/port", text));
    EXPECT_EQ(text, "sim:");
    EXPECT_TRUE(store.getString("bluetooth/device1/name", text));
    EXPECT_EQ(text, "OBDII");
    EXPECT_FALSE(store.getInt("velmora/port", number)) << "a text is no number";
}

TEST_F(Settings, TakesANumberWithAPointWhereHundredthsAreStored)
{
    write("[common]\nenginedisplacement = 1.6\nfuelcorrectionfactor = 1.15\nvolumetricefficiency = 90\n");
    SettingsStore store(m_file);
    int number = 0;
    EXPECT_TRUE(store.getInt("common/enginedisplacement", number));
    EXPECT_EQ(number, 160);
    EXPECT_TRUE(store.getInt("common/fuelcorrectionfactor", number));
    EXPECT_EQ(number, 115) << "not cut to 114";
}

TEST_F(Settings, ForgetsAKey)
{
    SettingsStore store(m_file);
    store.setInt("common/unitsystem", 1);
    store.remove("common/unitsystem");
    store.remove("common/unitsystem");
    int number = 0;
    EXPECT_FALSE(store.getInt("common/unitsystem", number));
}

TEST_F(Settings, WhatIsSyncedIsReadBack)
{
    {
        SettingsStore store(m_folder / "new" / "settings.toml");
        store.setInt("common/unitsystem", 1);
        store.setInt("common/unitsystem", 0);
        store.setString("bluetooth/1/name", "quote \" and ü");
        store.sync();
    }
    EXPECT_EQ(content(m_folder / "new" / "settings.toml"),
              "[bluetooth.1]\nname = 'quote \" and ü'\n\n[common]\nunitsystem = 0\n");
    SettingsStore store(m_folder / "new" / "settings.toml");
    int number = 5;
    std::string text;
    EXPECT_TRUE(store.getInt("common/unitsystem", number));
    EXPECT_EQ(number, 0);
    EXPECT_TRUE(store.getString("bluetooth/1/name", text));
    EXPECT_EQ(text, "quote \" and ü");
}

TEST_F(Settings, BrokenFileIsToldWithItsLineAndLeftAlone)
{
    for (char const* broken :
         {"[common\n", "a = \n", "[common]\nunitsystem = 1.5\n", "[common]\nenginedisplacement = 1e9\n",
          "[common]\nenginedisplacement = nan\n", "x = [1]\n", "x = 9999999999\n", "[common]\nvehicleweight = -5\n",
          "[common]\nvehicleweight = 60001\n", "[common]\nenginedisplacement = 40.0\n", "[common]\nunitsystem = 2\n",
          "[common]\nunitsystem = 'imperial'\n"}) {
        write(broken);
        EXPECT_THROW(SettingsStore{m_file}, Error) << broken;
        EXPECT_EQ(content(), broken);
    }
}

TEST_F(Settings, AValueThatNobodyCanSetIsToldWithWhatIsExpected)
{
    for (auto const& [text, expected] :
         {std::pair("vehicleweight = -5", "common/vehicleweight has no value that it can have; expected 1 to 60000"),
          {"enginedisplacement = 4", "expected 5 to 3000 hundredths"},
          {"unitsystem = 'imperial'", "expected 0 (metric) or 1 (imperial)"}}) {
        write(std::string("[common]\n") + text + "\n");
        try {
            SettingsStore{m_file};
            ADD_FAILURE() << text;
        } catch (Error const& error) {
            EXPECT_TRUE(std::string(error.what()).ends_with(expected)) << error.what();
        }
    }
    write("[common]\nvehicleweight = 60000\nenginedisplacement = 0.05\nunitsystem = 1\n");
    EXPECT_NO_THROW(SettingsStore{m_file});
}

TEST_F(Settings, AValueInThePlaceOfAGroupGivesWay)
{
    write("common = 1\n");
    SettingsStore store(m_file);
    store.setInt("common/unitsystem", 1);
    store.sync();
    EXPECT_EQ(content(), "[common]\nunitsystem = 1\n");
}

TEST_F(Settings, FailingWriteLeavesTheOldFile)
{
    write("[common]\nunitsystem = 1\n");
    SettingsStore store(m_file);
    store.setInt("common/unitsystem", 0);
    rlimit old{};
    ::getrlimit(RLIMIT_FSIZE, &old);
    rlimit const full{4, old.rlim_max}; // as on a disk with four bytes left
    auto const handler = std::signal(SIGXFSZ, SIG_IGN);
    ::setrlimit(RLIMIT_FSIZE, &full);
    EXPECT_THROW(store.sync(), Error);
    ::setrlimit(RLIMIT_FSIZE, &old);
    std::signal(SIGXFSZ, handler);
    EXPECT_EQ(content(), "[common]\nunitsystem = 1\n");
    auto const files = std::filesystem::directory_iterator(m_folder);
    EXPECT_EQ(std::distance(begin(files), end(files)), 1) << "no half written file stays";
}

TEST_F(Settings, ANameThatIsTakenByAFolderIsTold)
{
    SettingsStore store(m_file);
    store.setInt("common/unitsystem", 0);
    std::filesystem::create_directories(m_file / "in the way");
    try {
        store.sync();
        ADD_FAILURE() << "nothing can be written there";
    } catch (Error const& error) {
        EXPECT_EQ(std::string(error.what()),
                  "Could not write the settings file " + m_file.string() + ": " + std::strerror(EISDIR));
    }
    auto const files = std::filesystem::directory_iterator(m_folder);
    EXPECT_EQ(std::distance(begin(files), end(files)), 1) << "no half written file stays";
}

// A child writes without end and is killed in the middle of it.
TEST_F(Settings, SurviveBeingKilledWhole)
{
    std::string const longText(50000, 'x');
    for (int round = 0; round < 5; ++round) {
        int ends[2];
        ASSERT_EQ(::pipe(ends), 0);
        pid_t const child = ::fork();
        if (child == 0) {
            SettingsStore store(m_file);
            for (int i = 0;; ++i) {
                store.setString("velmora/name", longText + std::to_string(i));
                store.sync();
                if (::write(ends[1], "x", 1) != 1) {
                    ::_exit(1);
                }
            }
        }
        ::close(ends[1]);
        char written = 0;
        for (int i = 0; i <= round; ++i) {
            EXPECT_EQ(::read(ends[0], &written, 1), 1);
        }
        ::kill(child, SIGKILL);
        ::close(ends[0]);
        ::waitpid(child, nullptr, 0);
        SettingsStore store(m_file);
        std::string text;
        EXPECT_TRUE(store.getString("velmora/name", text));
        EXPECT_TRUE(text.starts_with(longText));
    }
}

TEST_F(Settings, LivesInTheUsersConfigurationFolder)
{
    ::setenv("XDG_CONFIG_HOME", "/some/folder", 1);
    EXPECT_EQ(SettingsStore::defaultFile(), "/some/folder/velmora/settings.toml");
    ::setenv("XDG_CONFIG_HOME", "", 1);
    ::setenv("HOME", "/home/me", 1);
    EXPECT_EQ(SettingsStore::defaultFile(), "/home/me/.config/velmora/settings.toml");
}

} // namespace
