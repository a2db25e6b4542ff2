#include <velmora/car.h>
#include <velmora/error.h>

#include <gtest/gtest.h>

#include <optional>

namespace {

using velmora::Car;
using velmora::CarOptions;
using velmora::Error;
using velmora::ErrorKind;
using velmora::LiveReader;
using velmora::LiveTurn;

CarOptions liveCar()
{
    CarOptions options;
    options.port = "sim:petrol-can11?instant";
    options.settingsFile = "/proc/nonexistent/settings.toml";
    options.units = velmora::Units::Metric;
    return options;
}

// The next turn of a parameter; ten seconds are no measure but an end.
std::optional<LiveTurn> nextOf(LiveReader& reader, int id)
{
    auto const limit = std::chrono::steady_clock::now() + std::chrono::seconds(10);
    while (std::chrono::steady_clock::now() < limit) {
        reader.wait(std::chrono::seconds(1));
        for (LiveTurn const& turn : reader.take()) {
            if (turn.id == id) {
                return turn;
            }
        }
    }
    return std::nullopt;
}

TEST(LiveReader, ReadsWithStatisticsAndOtherSensorsWhileItGoesOn)
{
    Car car(liveCar());
    std::unique_ptr<LiveReader> const reader = car.live({.sensors = {"RPM@20hz"}});
    ASSERT_EQ(reader->parameters().size(), 1U);
    EXPECT_EQ(reader->parameters()[0][0].key, "RPM");
    EXPECT_EQ(reader->parameters()[0][0].unit, "rpm");
    std::optional<LiveTurn> const turn = nextOf(*reader, 0x0C);
    ASSERT_TRUE(turn);
    ASSERT_FALSE(turn->readings.empty());
    EXPECT_EQ(turn->readings[0].sensor, "RPM");
    ASSERT_FALSE(turn->values.empty());
    EXPECT_FALSE(turn->values[0]->maximum.empty());
    EXPECT_NE(reader->reachedRates().find("of 20 Hz"), std::string::npos) << reader->reachedRates();
    EXPECT_NE(reader->modulesText().find("module 7E8"), std::string::npos) << reader->modulesText();

    reader->pick({0x0C, 0x0D});
    EXPECT_EQ(reader->words(), (std::vector<std::string>{"7E8:0C@20", "7E8:0D"}));
    EXPECT_EQ(reader->picked(), (std::vector<int>{0x0C, 0x0D}));
    EXPECT_TRUE(nextOf(*reader, 0x0D));
    reader->setMetric(false);
    EXPECT_EQ(reader->parameters()[1][0].unit, "mph");
    EXPECT_EQ(reader->parameters()[1][0].metricUnit, "km/h");
    EXPECT_TRUE(nextOf(*reader, 0x0D)) << "goes on in the other units";

    reader->pick({0x05});
    reader->beginRuns();
    EXPECT_EQ(reader->parameters().size(), 2U);
    EXPECT_TRUE(nextOf(*reader, 0x0D));
    EXPECT_GT(reader->run().kilograms, 0);
    reader->endRuns();
    EXPECT_EQ(reader->picked(), std::vector<int>{0x05});
    EXPECT_THROW(static_cast<void>(car.live({.sensors = {"NOSENSOR"}})), Error);
}

TEST(LiveReader, IsOverWithItsConnection)
{
    Car car(liveCar());
    std::unique_ptr<LiveReader> const reader = car.live({.sensors = {"RPM"}});
    car.reconnect();
    try {
        reader->parameters();
        FAIL();
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), ErrorKind::LinkLost);
    }
    EXPECT_THROW(reader->restart(), Error);
    reader->take();
    EXPECT_TRUE(nextOf(*car.live({.sensors = {"RPM"}}), 0x0C)) << "a new one reads on";
    EXPECT_THROW(velmora::checkRate("often"), Error);
    velmora::checkRate("10hz");
}

} // namespace
