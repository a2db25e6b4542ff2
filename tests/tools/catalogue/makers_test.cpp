#include "tools/catalogue/makers.h"

namespace {

TEST(Makers, NumbersFollowTheEnumeration)
{
    EXPECT_EQ(catalogue::makerCount(), 45U);
    EXPECT_EQ(catalogue::makerName(0), "Generic");
    EXPECT_EQ(catalogue::makerName(12), "Ford");
    EXPECT_EQ(catalogue::makerName(26), "Mercedes-Benz");
    EXPECT_EQ(catalogue::makerName(44), "Volvo");
}

TEST(Makers, FindsEachNameUnderItsNumber)
{
    for (std::size_t maker = 0; maker < catalogue::makerCount(); ++maker) {
        EXPECT_EQ(catalogue::findMaker(catalogue::makerName(maker)), maker);
    }
}

TEST(Makers, FindsNoOtherName)
{
    for (char const* name : {"", "ford", "Ford ", "Tesla"}) {
        EXPECT_FALSE(catalogue::findMaker(name)) << name;
    }
}

} // namespace
