#include <obd/library.h>
#include <obd/troublecodecatalogue.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

namespace {

namespace Catalogue = obd::TroubleCodeCatalogue;

class TroubleCodeCatalogueTest : public testing::Test
{
protected:
    void SetUp() override { obd::LIBOBDOpen(""); }
    void TearDown() override { obd::LIBOBDClose(); }
};

TEST_F(TroubleCodeCatalogueTest, TellsWhatIsATroubleCode)
{
    for (char const* code : {"P0420", "B0001", "C3FFF", "U110A", "P0A0F"}) {
        EXPECT_TRUE(Catalogue::isTroubleCode(code)) << code;
    }
    for (char const* text : {"", "P", "X1", "P042", "P04200", "p0420", "P0a0F", "P4000", "PA000", "A0420", "P15O9",
                             "P1300]", " P042", "04200"}) {
        EXPECT_FALSE(Catalogue::isTroubleCode(text)) << text;
    }
}

TEST_F(TroubleCodeCatalogueTest, GivesTheMeaningsOfACode)
{
    auto const meanings = Catalogue::getTroubleCodes("P0420");
    ASSERT_EQ(meanings.size(), 1U);
    EXPECT_EQ(meanings[0]->description, "Catalyst System Efficiency Below Threshold Bank 1");
    EXPECT_EQ(meanings[0]->manufacturer, "Generic");
    EXPECT_GT(Catalogue::getTroubleCodes("P1000").size(), 1U);
    EXPECT_EQ(Catalogue::getTroubleCodes("P1FFF").at(0)->description, "Unknown Trouble Code");
}

TEST_F(TroubleCodeCatalogueTest, WhatIsNoCodeHasNoMeaningAndThrowsNothing)
{
    EXPECT_TRUE(Catalogue::getTroubleCodes("").empty());
    EXPECT_TRUE(Catalogue::getTroubleCodes("P").empty());
    EXPECT_TRUE(Catalogue::getTroubleCodes("X1234").empty());
    EXPECT_TRUE(Catalogue::getTroubleCodes("P15O9").empty());
}

TEST_F(TroubleCodeCatalogueTest, GivesEveryRowMakerByMaker)
{
    auto const rows = Catalogue::getRows();
    ASSERT_GT(rows.size(), 1000U);
    EXPECT_EQ(rows.front()->manufacturer, "Generic");
    EXPECT_EQ(rows.back()->manufacturer, "Volvo");
    std::set<std::string> makers;
    std::string last;
    for (auto const& row : rows) {
        if (row->manufacturer != last) {
            EXPECT_TRUE(makers.insert(row->manufacturer).second) << row->manufacturer << " is torn apart";
            last = row->manufacturer;
        }
    }
    auto const inOrder = [](auto const& left, auto const& right) { return left->code < right->code; };
    auto const maker =
        std::find_if(rows.begin(), rows.end(), [](auto const& row) { return row->manufacturer != "Generic"; });
    EXPECT_TRUE(std::is_sorted(rows.begin(), maker, inOrder));
}

TEST(TroubleCodeCatalogue, IsEmptyWhileTheLibraryIsClosed)
{
    EXPECT_TRUE(Catalogue::getRows().empty());
    ASSERT_EQ(Catalogue::getTroubleCodes("P0420").size(), 1U);
    EXPECT_EQ(Catalogue::getTroubleCodes("P0420")[0]->description, "ISO/SAE Reserved");
}

} // namespace
