#include "libobd/adapter/adapterversion.h"

#include <gtest/gtest.h>

namespace {

TEST(AdapterVersion, IsOneZeroUnlessTold)
{
    EXPECT_EQ(obd::AdapterVersion{}, (obd::AdapterVersion{1, 0}));
}

TEST(AdapterVersion, IsReadFromAWord)
{
    struct Row
    {
        char const* word;
        int majorNumber;
        int minorNumber;
    };
    for (Row const row : {Row{"v1.5", 1, 5}, Row{"v2.1a", 2, 1}, Row{"v1.45", 1, 4}, Row{"1.30", 1, 3},
                          Row{"v1.2", 1, 2}, Row{"v2.3", 2, 3}, Row{"v12.9", 12, 9}, Row{"v2", 2, 0}, Row{"v2.", 2, 0},
                          Row{"v2.x", 2, 0}, Row{"V1.5", 0, 0}, Row{"", 0, 0}, Row{"v", 0, 0}, Row{"abc", 0, 0},
                          Row{"-1.5", 0, 0}, Row{"1v.5", 1, 5}, Row{"1a.5", 1, 0}}) {
        EXPECT_EQ(obd::parseAdapterVersion(row.word), (obd::AdapterVersion{row.majorNumber, row.minorNumber}))
            << row.word;
    }
}

TEST(AdapterVersion, NumberTooLargeToBeOneIsZero)
{
    EXPECT_EQ(obd::parseAdapterVersion("v99999999999999999999.7"), (obd::AdapterVersion{0, 7}));
}

TEST(AdapterVersion, IsOrdered)
{
    constexpr obd::AdapterVersion limit{1, 3};
    EXPECT_FALSE((obd::AdapterVersion{1, 2}).isAtLeast(limit));
    EXPECT_FALSE((obd::AdapterVersion{0, 9}).isAtLeast(limit));
    EXPECT_TRUE((obd::AdapterVersion{1, 3}).isAtLeast(limit));
    EXPECT_TRUE((obd::AdapterVersion{2, 0}).isAtLeast(limit));
}

} // namespace
