#include "common/text/layout.h"

#include <gtest/gtest.h>

namespace {

using namespace velmora;

TEST(Layout, LabelsStandInAColumn)
{
    EXPECT_EQ(labelledLine("VIN", "X"), "  VIN            X\n");
    EXPECT_EQ(labelledLine("Serial", ""), "  Serial         -\n");
}

TEST(Layout, ColumnsAreAsWideAsTheirWidestCell)
{
    EXPECT_EQ(drawColumns({{{"Name"}, {"Value", Mark::None, true}, {"Unit"}},
                           {{"Résistance"}, {"12", Mark::None, true}, {"Ω"}},
                           {{"x"}, {"123456", Mark::None, true}, {""}}},
                          "  ", Style()),
              "  Name         Value  Unit\n"
              "  Résistance      12  Ω\n"
              "  x           123456\n");
}

TEST(Layout, ARowOfOneCellStandsAcrossTheColumns)
{
    EXPECT_EQ(drawColumns({{{"a"}, {"b"}}, {{"a long heading", Mark::Bad}}}, " ", Style()), " a  b\n a long heading\n");
}

TEST(Layout, ColoursDoNotMoveColumns)
{
    EXPECT_EQ(drawColumns({{{"failed", Mark::Bad}, {"1", Mark::Bad, true}}, {{"ok"}, {"22", Mark::None, true}}}, "",
                          Style(true)),
              "\033[31mfailed\033[0m   \033[31m1\033[0m\n"
              "ok      22\n");
}

TEST(Layout, TextIsWrappedBetweenWords)
{
    EXPECT_EQ(wrapped("one two three unbreakable", 8, "> "), "> one two\n> three\n> unbreakable\n");
    EXPECT_EQ(wrapped("four five six", 9, ""), "four five\nsix\n");
    EXPECT_EQ(wrapped("four five six", 8, ""), "four\nfive six\n");
    EXPECT_EQ(wrapped("", 8, "> "), "");
}

TEST(Layout, ColumnsThatAreTooWideTakeSeveralLines)
{
    std::vector<std::vector<Cell>> const rows = {{{"Short Term Trim", Mark::Bad}, {"0.8", Mark::None, true}, {"%"}},
                                                 {{"one heading across all of them"}},
                                                 {{"RPM"}, {"772", Mark::None, true}, {"rpm"}}};
    EXPECT_EQ(drawColumns(rows, "  ", Style(false, false, 24)), "  Short Term    0.8  %\n"
                                                                "  Trim\n"
                                                                "  one heading across all of them\n"
                                                                "  RPM           772  rpm\n");
    EXPECT_EQ(drawColumns(rows, "  ", Style(false, false, 27)), drawColumns(rows, "  ", Style())) << "as wide as it is";
    EXPECT_TRUE(drawColumns(rows, "  ", Style(true, false, 24))
                    .starts_with("  \033[31mShort Term\033[0m    0.8  %\n  \033[31mTrim\033[0m\n"));
}

TEST(Layout, NoColumnIsNarrowerThanItsLongestWord)
{
    std::vector<std::vector<Cell>> const rows = {{{"an unbreakable word"}, {"another long one"}}};
    EXPECT_EQ(drawColumns(rows, "", Style(false, false, 20)), "an           another\n"
                                                              "unbreakable  long\n"
                                                              "word         one\n");
    std::vector<std::vector<Cell>> const wide = {{{"an unbreakable word"}, {"unbreakable too"}}};
    EXPECT_EQ(drawColumns(wide, "", Style(false, false, 20)), "an unbreakable word  unbreakable too\n");
}

TEST(Layout, TextIsWrappedToTheColumnsThatThereAre)
{
    EXPECT_EQ(wrapped("one two three four", 76, "    ", Style(false, false, 20)), "    one two three\n    four\n");
    EXPECT_EQ(wrapped("one two three four", 7, "    ", Style(false, false, 20)), "    one two\n    three\n    four\n");
}

TEST(Layout, CountsOneAndMany)
{
    EXPECT_EQ(counted(0, "code"), "0 codes");
    EXPECT_EQ(counted(1, "code"), "1 code");
    EXPECT_EQ(counted(2, "code"), "2 codes");
}

TEST(Layout, FoldsLinesBetweenWordsBelowTheLastColumn)
{
    EXPECT_EQ(folded("  Adapter   one two three four five\nshort\n", 24), "  Adapter   one two\n"
                                                                          "            three four\n"
                                                                          "            five\n"
                                                                          "short\n");
    EXPECT_EQ(folded("velmora: one two three four\n  - five six seven eight", 20), "velmora: one two\n"
                                                                                   "  three four\n"
                                                                                   "  - five six seven\n"
                                                                                   "    eight");
    EXPECT_EQ(folded("  a very late column is of  no use to hang below", 30), "  a very late column is of  no\n"
                                                                              "      use to hang below");
    EXPECT_EQ(folded("  Calibration   VS16-MT-0420  verification 17", 34), "  Calibration   VS16-MT-0420\n"
                                                                           "                verification 17");
    EXPECT_EQ(folded("exactly twenty wide.\n", 20), "exactly twenty wide.\n");
    EXPECT_EQ(folded("anExtremelyLongWordStandsWhole and more", 20), "anExtremelyLongWordStandsWhole\n  and more");
    EXPECT_EQ(folded("twenty-one are äöüß €€ ok", 22), "twenty-one are äöüß €€\n  ok") << "characters, not bytes";
    EXPECT_EQ(folded("\033[31mred words here\033[0m ok no", 17), "\033[31mred words here\033[0m ok no");
    EXPECT_EQ(folded("\033[31mred words are here\033[0m ok no", 22), "\033[31mred words are here\033[0m ok\n  no");
    EXPECT_EQ(folded("as it stands, however long that may be", 0), "as it stands, however long that may be");
}

} // namespace
