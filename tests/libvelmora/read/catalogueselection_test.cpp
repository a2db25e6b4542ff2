#include "libvelmora/read/catalogueselection.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

namespace {

using namespace velmora;

CatalogueRows rows()
{
    auto const row = [](char const* code, char const* text, char const* maker) {
        return std::make_shared<obd::DtcDataModel>(code, text, "Powertrain", maker);
    };
    return {row("P0420", "Catalyst System Efficiency Below Threshold Bank 1", "Generic"),
            row("P0430", "Catalyst System Efficiency Below Threshold Bank 2", "Generic"),
            row("P1000", "OBD-II Monitor Testing Incomplete", "Ford")};
}

TEST(CatalogueSelection, FindsWordsInAnyOrderAndCase)
{
    auto const found = selectWords(rows(), {"bank", "1", "CATALYST"});
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0]->code, "P0420");
    EXPECT_EQ(selectWords(rows(), {"threshold catal"}).size(), 2U);
    EXPECT_EQ(selectWords(rows(), {"obd-ii"}).size(), 1U);
    EXPECT_EQ(selectWords(rows(), {"p1000"}).size(), 1U);
}

TEST(CatalogueSelection, WordMatchesByItsBeginningOnly)
{
    EXPECT_TRUE(selectWords(rows(), {"alyst"}).empty());
    EXPECT_TRUE(selectWords(rows(), {"catalyst", "monitor"}).empty());
}

TEST(CatalogueSelection, WordsAreLettersAndDigits)
{
    CatalogueRows const odd = {
        std::make_shared<obd::DtcDataModel>("P0001", "AZ@az[x1`y2{09/z3:w4", "Powertrain", "Generic")};
    for (char const* const word : {"AZ", "az", "x1", "y2", "09", "z3", "W4", "p0001", "09/z3", "AZ@AZ"}) {
        EXPECT_EQ(selectWords(odd, {word}).size(), 1U) << word;
    }
    for (char const* const word : {"z", "1", "azx", "9"}) {
        EXPECT_EQ(selectWords(odd, {word}).size(), word[0] == 'z' ? 1U : 0U) << word;
    }
}

TEST(CatalogueSelection, NoWordsSelectAll)
{
    EXPECT_EQ(selectWords(rows(), {}).size(), 3U);
    EXPECT_EQ(selectWords(rows(), {" - "}).size(), 3U);
}

TEST(CatalogueSelection, KeepsOneMaker)
{
    auto const found = selectMaker(rows(), "Ford");
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found[0]->code, "P1000");
}

TEST(CatalogueSelection, FindsAMakerHoweverItIsWritten)
{
    EXPECT_EQ(findMaker("ford"), "Ford");
    EXPECT_EQ(findMaker("LANDROVER"), "Land Rover");
    EXPECT_EQ(findMaker("mercedes benz"), "Mercedes-Benz");
    EXPECT_EQ(findMaker("volvo"), "Volvo");
    EXPECT_EQ(findMaker("VW"), "Volkswagen");
    EXPECT_EQ(findMaker("Mercedes"), "Mercedes-Benz");
    EXPECT_EQ(findMaker("chevy"), "GM");
    EXPECT_EQ(findMaker("General Motors"), "GM");
    EXPECT_EQ(findMaker("Infiniti"), "Infinity") << "as the catalogue has it";
    EXPECT_EQ(findMaker("Citro\u00EBn"), "Citroen");
    EXPECT_EQ(findMaker("\u0160koda"), "Skoda");
    for (char const* const other : {"alfa", "benz", "Chevrolet", "GMC", "MB", "olds", "Range Rover"}) {
        EXPECT_NO_THROW(findMaker(other)) << other;
    }
}

TEST(CatalogueSelection, MakerThatIsNotThereIsWrongUseWithTheList)
{
    for (char const* name : {"Lada", "", "For"}) {
        try {
            findMaker(name);
            ADD_FAILURE() << name;
        } catch (Error const& failure) {
            EXPECT_EQ(failure.kind(), ErrorKind::WrongUse);
            ASSERT_EQ(failure.hints().size(), 1U);
            EXPECT_NE(failure.hints()[0].find("Alfa Romeo, Audi"), std::string::npos);
        }
    }
}

} // namespace
