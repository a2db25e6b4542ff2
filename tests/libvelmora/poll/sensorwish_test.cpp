#include "libvelmora/poll/sensorwish.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using velmora::parseRate;
using velmora::parseSensorWish;

TEST(SensorWish, ModuleAndRateAreTakenOffTheSensor)
{
    struct Case
    {
        char const* word;
        std::optional<unsigned int> module;
        char const* sensor;
        std::optional<double> hertz;
    };
    Case const cases[] = {
        {"RPM", {}, "RPM", {}},
        {"RPM@10hz", {}, "RPM", 10.0},
        {"0.5@0.2 Hz", {}, "0.5", 0.2},
        {"7E8:RPM", 0x7E8, "RPM", {}},
        {"18daf110:05@5", 0x18DAF110, "05", 5.0},
        {"10:0C", 0x10, "0C", {}},
        {"bank 1: trim", {}, "bank 1: trim", {}}, // no id in front of the colon
        {"123456789:05", {}, "123456789:05", {}}, // too long for an id
    };
    for (Case const& each : cases) {
        velmora::SensorWish const wish = parseSensorWish(each.word);
        EXPECT_EQ(wish.module, each.module) << each.word;
        EXPECT_EQ(wish.sensor, each.sensor) << each.word;
        EXPECT_EQ(wish.hertz, each.hertz) << each.word;
    }
}

TEST(SensorWish, WhatIsNoRateAndNoSensorIsRefused)
{
    for (char const* word : {"RPM@", "RPM@fast", "RPM@10hzz", "RPM@-1", "RPM@0", "RPM@1001", "RPM@nan", "RPM@inf",
                             "@10hz", "7E8:", "7E8:@1hz", ""}) {
        EXPECT_THROW(parseSensorWish(word), velmora::Error) << word;
    }
}

TEST(SensorWish, RatesAreShownWithTheDigitsThatCount)
{
    EXPECT_EQ(velmora::rateText(10.0), "10");
    EXPECT_EQ(velmora::rateText(0.2), "0.2");
    EXPECT_EQ(velmora::rateText(33.333), "33.3");
    EXPECT_EQ(parseRate("0.001"), 0.001);
    EXPECT_EQ(parseRate("1000HZ"), 1000.0);
}

} // namespace
