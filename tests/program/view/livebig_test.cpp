#include "common/text/text.h"
#include "program/view/live/bigdigits.h"
#include "program/view/live/livebig.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

namespace {

using namespace velmora::cli;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;

std::vector<LiveRow> bigRows(std::size_t count)
{
    std::vector<LiveRow> rows;
    for (std::size_t i = 0; i < count; ++i) {
        LiveRow row{};
        row.name = "Sensor " + std::to_string(i);
        row.numeric = true;
        row.value = "1726";
        row.minimum = "800";
        row.maximum = "2652";
        row.unit = "rpm";
        rows.push_back(row);
    }
    return rows;
}

TEST(LiveBig, DigitsAreBlocksOrSigns)
{
    EXPECT_THAT(bigText("17", true), ElementsAre(" #  ###", "##    #", " #    #", " #   # ", "###  # "));
    EXPECT_THAT(bigText("1", false), ElementsAre("▄█ ", " █ ", "▀▀▀"));
    EXPECT_EQ(bigText("-8.5", true).front().size(), bigWidth("-8.5"));
    EXPECT_THAT(bigText("on", true), IsEmpty());
    EXPECT_THAT(bigText("", true), IsEmpty());
}

TEST(LiveBig, ShowsSixSensorsAtMostAndLeavesTheTableRoom)
{
    for (auto const& [columns, rows, cards] :
         {std::tuple{80, 24, 6}, std::tuple{80, 17, 0}, std::tuple{200, 60, 6}, std::tuple{26, 24, 2}}) {
        FrameStyle style;
        style.columns = static_cast<std::size_t>(columns);
        style.rows = static_cast<std::size_t>(rows);
        std::string const text = drawBig(bigRows(8), style);
        EXPECT_EQ(std::count(text.begin(), text.end(), 'S'), cards) << columns << "x" << rows;
        EXPECT_LE(std::count(text.begin(), text.end(), '\n'), std::max(0, rows - 12));
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);) {
            EXPECT_LE(velmora::displayWidth(line), style.columns);
        }
    }
}

TEST(LiveBig, ABarHasFiveSignsOrNone)
{
    std::vector<LiveRow> rows = bigRows(1);
    FrameStyle style;
    style.columns = 26;
    style.ascii = true;
    rows[0].minimum = "-12345678";
    rows[0].maximum = "123456789";
    rows[0].value = "123456789";
    EXPECT_THAT(drawBig(rows, style), HasSubstr("\n-12345678  123456789")) << "four would be left";
    rows[0].minimum = "-1234567";
    EXPECT_THAT(drawBig(rows, style), HasSubstr("\n-1234567 ===== 123456789"));
}

TEST(LiveBig, TheBarStandsBetweenLowestAndHighest)
{
    FrameStyle style;
    style.ascii = true;
    std::string const text = drawBig(bigRows(1), style);
    std::size_t const full = static_cast<std::size_t>(std::count(text.begin(), text.end(), '='));
    std::size_t const rest = static_cast<std::size_t>(std::count(text.begin(), text.end(), '.'));
    EXPECT_GT(full, 20U);
    EXPECT_LE(full > rest ? full - rest : rest - full, 1U); // 1726 is the middle
    EXPECT_THAT(text, HasSubstr("800 ="));
    EXPECT_TRUE(std::all_of(text.begin(), text.end(), [](char c) { return static_cast<unsigned char>(c) < 0x80; }));
}

TEST(LiveBig, AValueThatIsGoneIsADash)
{
    std::vector<LiveRow> rows = bigRows(1);
    rows.front().value.clear();
    FrameStyle style;
    style.ascii = true;
    EXPECT_THAT(drawBig(rows, style), HasSubstr("\n###"));
}

TEST(LiveBig, TellsWhatAValueWasAndMarksOneBeyondItsLimit)
{
    std::vector<LiveRow> rows = bigRows(2);
    rows[0].last = std::exchange(rows[0].value, "");
    rows[0].updated = LiveTime() + std::chrono::seconds(1);
    rows[1].limit.lowest = 2000;
    FrameStyle style;
    style.now = LiveTime() + std::chrono::seconds(31);
    std::string const text = drawBig(rows, style);
    EXPECT_THAT(text, HasSubstr("was 1726, 30 s ago"));
    EXPECT_THAT(text, HasSubstr("! Sensor 1"));
    style.rows = 60;
    std::string const tall = drawBig(rows, style);
    EXPECT_EQ(std::count(tall.begin(), tall.end(), '\n'), 7) << "a line for the trend";
}

TEST(LiveBig, AsciiKeepsTheWidth)
{
    EXPECT_EQ(toAscii("21 °C, 3 µA, name…"), "21 oC, 3 uA, name.");
    EXPECT_EQ(toAscii("日本"), "????");
}

} // namespace
