#include "tools/catalogue/sourceerror.h"
#include "tools/catalogue/textpattern.h"

namespace {

using catalogue::expandText;
using catalogue::SourceError;
using Texts = std::vector<std::string>;

catalogue::Lists const lists = {{"pair", {"Low", "High"}}};

TEST(TextPattern, PlainTextStandsForItself)
{
    EXPECT_EQ(expandText("Cruise Control Off Signal", 1, lists), Texts{"Cruise Control Off Signal"});
}

TEST(TextPattern, PlainTextServesSeveralCodes)
{
    EXPECT_EQ(expandText("Cruise Control", 2, lists), (Texts{"Cruise Control", "Cruise Control"}));
}

TEST(TextPattern, ChoiceGivesOneTextEach)
{
    EXPECT_EQ(expandText("Circuit {Low|Stuck On} Bank 1", 2, lists),
              (Texts{"Circuit Low Bank 1", "Circuit Stuck On Bank 1"}));
}

TEST(TextPattern, RangeCountsNumbersAndLetters)
{
    EXPECT_EQ(expandText("Cylinder {9-11}", 3, lists), (Texts{"Cylinder 9", "Cylinder 10", "Cylinder 11"}));
    EXPECT_EQ(expandText("Relay {B-D}", 3, lists), (Texts{"Relay B", "Relay C", "Relay D"}));
}

TEST(TextPattern, ListGivesItsEntries)
{
    EXPECT_EQ(expandText("Circuit {pair}", 2, lists), (Texts{"Circuit Low", "Circuit High"}));
}

TEST(TextPattern, LastGroupChangesFastest)
{
    EXPECT_EQ(expandText("{1|2} {pair}", 4, lists), (Texts{"1 Low", "1 High", "2 Low", "2 High"}));
}

TEST(TextPattern, RefusesAnotherNumberOfTextsThanCodes)
{
    EXPECT_THROW(expandText("Circuit {pair}", 1, lists), SourceError);
    EXPECT_THROW(expandText("Circuit {pair}", 3, lists), SourceError);
}

TEST(TextPattern, RefusesBracesThatDoNotMatch)
{
    for (char const* pattern : {"{pair", "pair}", "{{pair}}", "}pair{"}) {
        EXPECT_THROW(expandText(pattern, 2, lists), SourceError) << pattern;
    }
}

TEST(TextPattern, RefusesGroupsWithoutMeaning)
{
    for (char const* pattern :
         {"{}", "{other}", "{4-1}", "{A-A}", "{a-c}", "{1-C}", "{Low|}", "{|}", "{1-99999999999}"}) {
        EXPECT_THROW(expandText(pattern, 2, lists), SourceError) << pattern;
    }
}

TEST(TextPattern, HugeFamilyIsRefusedWithoutBuildingIt)
{
    EXPECT_THROW(expandText("{1-255}{1-255}{1-255}{1-255}{1-255}{1-255}", 2, lists), SourceError);
}

} // namespace
