#include "program/view/style.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;
using namespace velmora::cli;

TEST(Style, ColoursAreForTerminalsUnlessTheUserSaysOtherwise)
{
    EXPECT_TRUE(wantsColor(std::nullopt, false, true));
    EXPECT_TRUE(wantsColor(ColorMode::Auto, false, true));
    EXPECT_FALSE(wantsColor(std::nullopt, false, false));
    EXPECT_FALSE(wantsColor(ColorMode::Never, false, true));
    EXPECT_TRUE(wantsColor(ColorMode::Always, false, false));
}

TEST(Style, TheWishForNoColoursGivesWayToAlwaysOnly)
{
    EXPECT_FALSE(wantsColor(std::nullopt, true, true));
    EXPECT_FALSE(wantsColor(ColorMode::Auto, true, true));
    EXPECT_TRUE(wantsColor(ColorMode::Always, true, false));
}

TEST(Style, PaintsWithColoursOnly)
{
    EXPECT_EQ(Style().paint(Mark::Bad, "on"), "on");
    Style const coloured(true);
    EXPECT_EQ(coloured.paint(Mark::None, "on"), "on");
    EXPECT_EQ(coloured.paint(Mark::Good, "on"), "\033[32mon\033[0m");
    EXPECT_EQ(coloured.paint(Mark::Warning, "on"), "\033[33mon\033[0m");
    EXPECT_EQ(coloured.paint(Mark::Bad, "on"), "\033[31mon\033[0m");
    EXPECT_EQ(coloured.paint(Mark::Faint, "on"), "\033[2mon\033[0m");
}

} // namespace
