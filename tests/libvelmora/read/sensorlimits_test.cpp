#include "libvelmora/read/sensorlimits.h"
#include "libvelmora/session/settingsstore.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/settingsfile.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

namespace {

using namespace velmora;

TEST(SensorLimits, AreANumberOrARange)
{
    EXPECT_EQ(parseLimit("6000"), (SensorLimit{{}, 6000.0}));
    EXPECT_EQ(parseLimit("11.8.."), (SensorLimit{11.8, {}}));
    EXPECT_EQ(parseLimit("-40..120"), (SensorLimit{-40.0, 120.0}));
    for (char const* const text : {"6000", "11.8..", "11.8..14.8", "..5"}) {
        EXPECT_EQ(parseLimit(limitText(parseLimit(text))), parseLimit(text)) << text;
    }
    for (char const* const text : {"", "..", "a", "1..b", "nan", "inf", "5..4", "1...2", "1 "}) {
        EXPECT_THROW(parseLimit(text), Error) << text;
    }
}

TEST(SensorLimits, TheirSensorHasManyNames)
{
    for (char const* const name : {"RPM", "rpm", "0C", "010C", "0x0C", "$0C"}) {
        EXPECT_EQ(limitKey(name), "RPM") << name;
    }
    EXPECT_EQ(limitKey("BATTERY_PACK"), "BATTERY_PACK") << "a signal's id";
    EXPECT_THROW(limitKey("a/b"), Error);
    EXPECT_THROW(limitKey(""), Error);
}

TEST(SensorLimits, SayWhatTheyLack)
{
    auto const problem = [](std::string const& text) {
        try {
            parseLimit(text);
        } catch (Error const& error) {
            return std::string(error.what());
        }
        return std::string("none");
    };
    EXPECT_EQ(problem(".."), "\"..\" is no limit: it has no end");
    EXPECT_EQ(problem("5..4"), "\"5..4\" is no limit: no value can meet it");
    EXPECT_EQ(problem("5..5"), "none") << "one value meets it";
    EXPECT_EQ(problem("x..4"), "\"x\" is no limit");
    EXPECT_EQ(limitText({}), "");
    EXPECT_EQ(limitText({5.0, {}}), "5..");
    EXPECT_EQ(limitText({{}, 5.5}), "..5.5");
    EXPECT_EQ(limitKey("XY"), "XY") << "two letters that are no number";
    EXPECT_EQ(limitKey("01F"), "01F") << "three digits are no PID";
    EXPECT_EQ(limitKey("FF"), "PID_FF");
    EXPECT_EQ(limitKey("010D"), "SPEED");
    EXPECT_EQ(limitKey("020D"), "020D") << "of another service";
    EXPECT_EQ(limitKey("AZaz_09-."), "AZaz_09-.");
    EXPECT_EQ(limitKey(std::string(64, 'x')), std::string(64, 'x'));
    for (std::string const& id : {std::string(65, 'x'), std::string("a@"), std::string("a["), std::string("a`"),
                                  std::string("a{"), std::string("a/"), std::string("a:")}) {
        EXPECT_THROW(limitKey(id), Error) << id;
    }
}

TEST(SettingsFile, IsOnTheDiskAfterEachChange)
{
    testsupport::TemporaryFolder const folder;
    std::string const path = folder.file("settings.toml");
    SettingsFile(path).setText("own/word", "text");
    EXPECT_EQ(SettingsFile(path).text("own/word"), "text");
    SettingsFile file(path);
    file.setNumber("own/number", 7);
    EXPECT_EQ(SettingsFile(path).number("own/number"), 7);
    file.set("displacement", "1.6");
    EXPECT_EQ(SettingsFile(path).setting("displacement").value, "1.60");
}

TEST(SensorLimits, AreKeptInTheSettings)
{
    std::filesystem::path const file = testsupport::ownPath("limits.toml");
    std::ofstream(file) << "[limit]\nSPEED = 130\nMAF = \"nonsense\"\n";
    SettingsStore store(file);
    setLimit(store, "RPM", parseLimit("800..6000"));
    store.sync();
    SettingsStore again(file);
    EXPECT_EQ(limitOf(again, "RPM"), (SensorLimit{800.0, 6000.0}));
    EXPECT_EQ(limitOf(again, "SPEED"), (SensorLimit{{}, 130.0})) << "as a person writes it";
    EXPECT_EQ(limitOf(again, "MAF"), SensorLimit());
    EXPECT_EQ(limitedSensors(again), (std::vector<std::string>{"MAF", "RPM", "SPEED"}));
    setLimit(again, "RPM", {});
    EXPECT_EQ(limitOf(again, "RPM"), SensorLimit());
    SensorLimits limits(file);
    EXPECT_EQ(limits.of("RPM"), (SensorLimit{800.0, 6000.0})) << "what was not brought to the disk";
    limits.set("RPM", {});
    limits.set("ECT", parseLimit("110"));
    EXPECT_EQ(SensorLimits(file).of("RPM"), SensorLimit());
    EXPECT_EQ(SensorLimits(file).sensors(), (std::vector<std::string>{"ECT", "MAF", "SPEED"}));
    std::filesystem::remove(file);
}

} // namespace
