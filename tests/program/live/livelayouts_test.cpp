#include "libvelmora/output/database/database.h"
#include "program/live/livelayouts.h"
#include "program/live/liverecord.h"
#include "program/live/userfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

namespace {

using namespace velmora;
using namespace velmora::cli;

class LiveFiles : public testing::Test
{
protected:
    testsupport::TemporaryFolder const own;
    std::filesystem::path const& folder = own.path();
};

TEST_F(LiveFiles, LayoutsAreKeptByVehicle)
{
    LiveLayouts const layouts(folder / "settings.toml");
    EXPECT_FALSE(layouts.load("vehicle-1"));
    layouts.save("vehicle-1", {{"7E8:0C@10", "7E8:0D"}, false});
    layouts.save("vehicle-2", {{"7E8:05"}, true});
    EXPECT_EQ(layouts.load("vehicle-1"), (LiveLayout{{"7E8:0C@10", "7E8:0D"}, false}));
    EXPECT_EQ(layouts.load("vehicle-2"), (LiveLayout{{"7E8:05"}, true}));
}

TEST_F(LiveFiles, ALayoutThatNobodyCanReadIsNone)
{
    LiveLayouts const layouts(folder / "settings.toml");
    for (char const* const text : {"{}", "[1]", "{\"sensors\":[1]}", "{\"sensors\":\"RPM\"}", "x"}) {
        std::ofstream(folder / "layouts.toml") << "[live]\nvehicle-1 = '" << text << "'\n";
        EXPECT_FALSE(layouts.load("vehicle-1")) << text;
    }
    std::ofstream(folder / "layouts.toml") << "[live]\nvehicle-1 = '{\"sensors\":[\"RPM\"]}'\n";
    EXPECT_TRUE(layouts.load("vehicle-1")) << "the same file with a text that is one";
    EXPECT_TRUE(layouts.load("vehicle-1")->big) << "unless it says otherwise";
    for (auto const& [sensors, letters, good] :
         {std::tuple{300, 64, true}, std::tuple{301, 64, false}, std::tuple{300, 65, false}}) {
        layouts.save("vehicle-2", {std::vector<std::string>(static_cast<std::size_t>(sensors),
                                                            std::string(static_cast<std::size_t>(letters), 'A')),
                                   true});
        EXPECT_EQ(layouts.load("vehicle-2").has_value(), good) << sensors << " of " << letters;
    }
}

TEST_F(LiveFiles, StandAmongTheUsersDataAndReplaceNothing)
{
    ::setenv("XDG_DATA_HOME", folder.c_str(), 1);
    std::filesystem::path const first = saveUserText("snapshot", ".txt", "one\n");
    std::chrono::system_clock::time_point const time{std::chrono::seconds(1709802302)};
    EXPECT_EQ(newUserFile("live", ".db", time), folder / "velmora" / "live" / "live-20240307-090502.db");
    std::ofstream(newUserFile("live", ".db", time)) << "x";
    EXPECT_EQ(newUserFile("live", ".db", time), folder / "velmora" / "live" / "live-20240307-090502-2.db");
    std::ofstream(newUserFile("live", ".db", time)) << "x";
    EXPECT_EQ(newUserFile("live", ".db", time), folder / "velmora" / "live" / "live-20240307-090502-3.db");
    EXPECT_EQ(std::filesystem::file_size(first), 4U);
    ::setenv("XDG_DATA_HOME", (first / "no folder").c_str(), 1);
    EXPECT_THROW(saveUserText("snapshot", ".txt", "x"), Error);
    ::unsetenv("XDG_DATA_HOME");
}

TEST_F(LiveFiles, ARecordingIsADatabaseOfTheWatch)
{
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.module = 0x7E8;
    reading.sensor = "RPM";
    reading.pid = "010C";
    reading.name = "Engine RPM";
    reading.value = 1726.0;
    reading.unit = "rpm";
    {
        LiveRecord record(folder / "li?ve.db", "vehicle-1");
        record.take(reading);
        EXPECT_EQ(record.trouble(), "");
    }
    Database database((folder / "li?ve.db").string());
    EXPECT_EQ(database.number("SELECT value FROM reading"), 1726);
    EXPECT_EQ(database.number("SELECT count(*) FROM sensor WHERE vehicle = 'vehicle-1' AND key = 'RPM'"), 1);
    EXPECT_NE(LiveRecord("/nowhere/at/all.db", "x").trouble(), "");
}

} // namespace
