#include "libvelmora/dash/dashlimits.h"
#include "libvelmora/read/sensorlimits.h"
#include "libvelmora/session/settingsstore.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using velmora::dashLimits;
using velmora::Json;

TEST(DashLimits, AreThoseOfTheSettingsAsTheyAreNow)
{
    testsupport::TemporaryFolder const folder;
    std::filesystem::path const file = folder.file("settings.toml");
    EXPECT_EQ(dashLimits({}), Json::object());
    EXPECT_EQ(dashLimits(file), Json::object()) << "no settings yet";

    velmora::SettingsStore store(file);
    velmora::setLimit(store, "RPM", velmora::parseLimit("6000"));
    velmora::setLimit(store, "MODULE_VOLTAGE", velmora::parseLimit("11.8..14.8"));
    store.setString("limit/SPEED", "fast");
    store.sync();
    EXPECT_EQ(dashLimits(file), Json::parse(R"({"MODULE_VOLTAGE": [11.8, 14.8], "RPM": [null, 6000.0]})"))
        << "without the one that is no limit";

    velmora::setLimit(store, "RPM", {});
    store.sync();
    EXPECT_EQ(dashLimits(file), Json::parse(R"({"MODULE_VOLTAGE": [11.8, 14.8]})"));
    std::ofstream(file) << "[limit\n";
    EXPECT_EQ(dashLimits(file), Json::object()) << "settings that can't be read";
}

} // namespace
