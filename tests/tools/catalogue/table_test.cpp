#include "tools/catalogue/table.h"

#include <sstream>

namespace {

using catalogue::Row;
using catalogue::Source;
using Problems = std::vector<std::string>;

// Reads texts as files "1.codes", "2.codes" and so on.
Source read(std::vector<std::string> const& files)
{
    Source source;
    int number = 0;
    for (std::string const& text : files) {
        std::istringstream input(text);
        catalogue::readSource(input, std::to_string(++number) + ".codes", source);
    }
    return source;
}

std::string summary(std::vector<Row> const& table)
{
    std::string text;
    for (Row const& row : table) {
        text += std::to_string(row.maker) + ' ' + row.code + ' ' + row.text + '\n';
    }
    return text;
}

TEST(Table, SortsByMakerAndCode)
{
    Source source = read({"maker Ford\nP1002 B\nP1001 A\n", "maker Generic\nP0300 C\n", "maker Generic\nB0001 D\n"});
    EXPECT_EQ(summary(catalogue::buildTable(source)), "0 B0001 D\n0 P0300 C\n12 P1001 A\n12 P1002 B\n");
    EXPECT_TRUE(source.problems.empty());
}

TEST(Table, KeepsRepeatsInTheOrderOfTheSource)
{
    Source source = read({"maker Fiat\nP1001 Z\nrepeat P1001 A\nrepeat P1001 Z\n"});
    EXPECT_EQ(summary(catalogue::buildTable(source)), "11 P1001 Z\n11 P1001 A\n11 P1001 Z\n");
    EXPECT_TRUE(source.problems.empty());
}

TEST(Table, TwinTakesOverAllRows)
{
    Source source = read({"maker Dodge\nsame as Chrysler\n", "maker Chrysler\nP1001 A\nrepeat P1001 B\n"});
    EXPECT_EQ(summary(catalogue::buildTable(source)), "7 P1001 A\n7 P1001 B\n10 P1001 A\n10 P1001 B\n");
    EXPECT_TRUE(source.problems.empty());
}

TEST(Table, TwinLeavesExceptionsOutAndAddsRowsOfItsOwn)
{
    Source source =
        read({"maker Pontiac\nP1300 A\nP1301 B\n", "maker Buick\nsame as Pontiac except P1300\nmalformed P1300] A\n"});
    EXPECT_EQ(summary(catalogue::buildTable(source)), "5 P1300] A\n5 P1301 B\n34 P1300 A\n34 P1301 B\n");
    EXPECT_TRUE(source.problems.empty());
}

TEST(Table, RefusesACodeGivenTwice)
{
    Source source = read({"maker Ford\nP1001 A\n", "maker Ford\n\nP1001 B\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems,
              (Problems{"2.codes:3: P1001 of 'Ford' stands already at 1.codes:2; write 'repeat' before "
                        "it if both are wanted"}));
}

TEST(Table, RefusesARepeatOfNothing)
{
    Source source = read({"maker Ford\nrepeat P1001 A\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems,
              (Problems{"1.codes:2: P1001 is marked as a repeat, but no row of that code stands before it"}));
}

TEST(Table, RefusesATwinWithoutRows)
{
    Source source = read({"maker Dodge\nsame as Chrysler\n", "maker Ford\nP1001 A\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems, (Problems{"1.codes:2: there are no rows of 'Chrysler' to take over"}));
}

TEST(Table, RefusesATwinOfATwin)
{
    Source source =
        read({"maker Chrysler\nP1001 A\n", "maker Dodge\nsame as Chrysler\n", "maker Jeep\nsame as Dodge\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems, (Problems{"3.codes:2: 'Dodge' is itself the same as another maker: name that one"}));
}

TEST(Table, RefusesAnExceptionThatIsNotThere)
{
    Source source = read({"maker Chrysler\nP1001 A\n", "maker Dodge\nsame as Chrysler except P1002\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems, (Problems{"2.codes:2: 'Chrysler' has no code P1002 to leave out"}));
}

TEST(Table, RefusesSourcesWithoutARow)
{
    Source source = read({"# nothing\n"});
    catalogue::buildTable(source);
    EXPECT_EQ(source.problems, (Problems{"the sources hold no row"}));
}

} // namespace
