#include "tools/catalogue/source.h"

#include <sstream>

namespace {

using catalogue::Source;
using Problems = std::vector<std::string>;

Source read(std::string const& text, Source source = {})
{
    std::istringstream input(text);
    catalogue::readSource(input, "test.codes", source);
    return source;
}

Problems problemsOf(std::string const& text)
{
    return read(text).problems;
}

TEST(Source, ReadsRowsOfAMaker)
{
    Source const source = read("# Ford's codes\n"
                               "maker Ford\n"
                               "\n"
                               "P1000  OBD-II Monitor Testing Incomplete\n"
                               "P1001-P1002, P1005  Cylinder {1-3} Misfire\n");
    EXPECT_TRUE(source.problems.empty());
    ASSERT_EQ(source.rows.size(), 4U);
    EXPECT_EQ(source.rows[0].maker, 12U);
    EXPECT_EQ(source.rows[0].code, "P1000");
    EXPECT_EQ(source.rows[0].text, "OBD-II Monitor Testing Incomplete");
    EXPECT_EQ(source.rows[0].place.line, 4U);
    EXPECT_EQ(source.rows[3].code, "P1005");
    EXPECT_EQ(source.rows[3].text, "Cylinder 3 Misfire");
    EXPECT_FALSE(source.rows[3].repeat);
}

TEST(Source, ReadsRepeats)
{
    Source const source = read("maker Fiat\nP1111 Sensor\nrepeat P1111 Sensor Circuit\n");
    ASSERT_EQ(source.rows.size(), 2U);
    EXPECT_TRUE(source.rows[1].repeat);
}

TEST(Source, ReadsMalformedCodes)
{
    Source const source = read("maker Buick\nmalformed P1300]  Ignitor Circuit\n");
    ASSERT_EQ(source.rows.size(), 1U);
    EXPECT_EQ(source.rows[0].code, "P1300]");
    EXPECT_EQ(source.rows[0].text, "Ignitor Circuit");
}

TEST(Source, ReadsTwins)
{
    Source const source = read("maker Buick\nsame as Pontiac except P1300, P1400-P1401\n");
    ASSERT_EQ(source.twins.size(), 1U);
    EXPECT_EQ(source.twins[0].maker, 5U);
    EXPECT_EQ(source.twins[0].original, 34U);
    EXPECT_EQ(source.twins[0].exceptions, (std::vector<std::string>{"P1300", "P1400", "P1401"}));
}

TEST(Source, ListsOfAFileWithoutMakerServeLaterFiles)
{
    Source const lists = read("list pair = Low | High\n");
    Source const source = read("maker Ford\nP1001, P1002 Circuit {pair}\n", lists);
    EXPECT_TRUE(source.problems.empty());
    EXPECT_EQ(source.rows.size(), 2U);
}

TEST(Source, ListsOfAMakersFileStayInIt)
{
    Source const first = read("maker Ford\nlist pair = Low | High\nP1001, P1002 Circuit {pair}\n");
    EXPECT_TRUE(first.problems.empty());
    Source const source = read("maker Audi\nP1001, P1002 Circuit {pair}\n", first);
    EXPECT_EQ(source.problems, (Problems{"test.codes:2: '{pair}' is no range, no choice and no known list"}));
}

TEST(Source, LinesMayEndInCarriageReturns)
{
    Source const source = read("maker Ford\r\nP1001 Sensor\r\n");
    EXPECT_TRUE(source.problems.empty());
    EXPECT_EQ(source.rows.at(0).text, "Sensor");
}

TEST(Source, RefusesAnUnknownMaker)
{
    EXPECT_EQ(problemsOf("\nmaker Tesla\n"), (Problems{"test.codes:2: unknown maker 'Tesla'"}));
    EXPECT_EQ(problemsOf("maker Ford\nsame as Tesla\n"), (Problems{"test.codes:2: unknown maker 'Tesla'"}));
}

TEST(Source, RefusesRowsBeforeTheMaker)
{
    Problems const expected{"test.codes:1: a 'maker' line must come before the first code"};
    EXPECT_EQ(problemsOf("P1001 Sensor\n"), expected);
    EXPECT_EQ(problemsOf("same as Ford\n"), expected);
}

TEST(Source, RefusesASecondMaker)
{
    EXPECT_EQ(problemsOf("maker Ford\nmaker Ford\n"), (Problems{"test.codes:2: the file has named its maker already"}));
}

TEST(Source, RefusesABadCode)
{
    EXPECT_EQ(problemsOf("maker Ford\nP15O9 Sensor\n"), (Problems{"test.codes:2: 'P15O9' is no trouble code"}));
    EXPECT_EQ(problemsOf("maker Ford\nP1001, Sensor\n"), (Problems{"test.codes:2: 'Sensor' is no trouble code"}));
}

TEST(Source, RefusesEmptyAndLongTexts)
{
    EXPECT_EQ(problemsOf("maker Ford\nP1001\n"), (Problems{"test.codes:2: the text is empty"}));
    EXPECT_TRUE(problemsOf("maker Ford\nP1001 " + std::string(140, 'A')).empty());
    EXPECT_EQ(problemsOf("maker Ford\nP1001 " + std::string(141, 'A')),
              (Problems{"test.codes:2: the text has 141 characters, more than 140"}));
}

TEST(Source, RefusesControlCharactersAndOtherAlphabets)
{
    Problems const expected{"test.codes:2: a control character, a tab or a character outside ASCII"};
    EXPECT_EQ(problemsOf("maker Ford\nP1001\tSensor\n"), expected);
    EXPECT_EQ(problemsOf("maker Ford\nP1001 Sen\x01sor\n"), expected);
    EXPECT_EQ(problemsOf("maker Ford\nP1001 Capteur cass\xC3\xA9\n"), expected);
}

TEST(Source, RefusesDoubledBlanks)
{
    EXPECT_EQ(problemsOf("maker Ford\nP1001 Sensor  Circuit\n"),
              (Problems{"test.codes:2: two blanks in a row inside the text"}));
}

TEST(Source, RefusesAFamilyThatDoesNotFitItsCodes)
{
    EXPECT_EQ(problemsOf("maker Ford\nP1001-P1004 Cylinder {1-3} Misfire\n"),
              (Problems{"test.codes:2: the family has 4 codes but only 3 texts"}));
    EXPECT_EQ(problemsOf("maker Ford\nP1001-P1002 Cylinder {1-3} Misfire\n"),
              (Problems{"test.codes:2: the family has 2 codes but more texts"}));
}

TEST(Source, RefusesBadLists)
{
    EXPECT_EQ(problemsOf("list pair\n"), (Problems{"test.codes:1: a list reads 'list NAME = ENTRY | ENTRY'"}));
    EXPECT_EQ(problemsOf("list = Low\n"), (Problems{"test.codes:1: a list reads 'list NAME = ENTRY | ENTRY'"}));
    EXPECT_EQ(problemsOf("list pair = Low |\n"), (Problems{"test.codes:1: an entry between bars is empty"}));
    EXPECT_EQ(problemsOf("list a = Low\nlist a = High\n"), (Problems{"test.codes:2: there is a list 'a' already"}));
}

TEST(Source, RefusesMalformedMarksThatAreNone)
{
    EXPECT_EQ(problemsOf("maker Ford\nmalformed P1300 Sensor\n"),
              (Problems{"test.codes:2: 'P1300' is a well-formed code: leave 'malformed' out"}));
    EXPECT_EQ(problemsOf("maker Ford\nmalformed P1300]] Sensor\n"),
              (Problems{"test.codes:2: a malformed code has at most 6 characters"}));
}

TEST(Source, RefusesWordsBehindTheExceptions)
{
    EXPECT_EQ(problemsOf("maker Buick\nsame as Pontiac except P1300 P1301\n"),
              (Problems{"test.codes:2: something stands behind the codes of 'except'"}));
}

TEST(Source, TellsEveryBadLine)
{
    Source const source = read("maker Ford\nP1 A\nP1001 Sensor\nP2 B\n");
    EXPECT_EQ(source.problems,
              (Problems{"test.codes:2: 'P1' is no trouble code", "test.codes:4: 'P2' is no trouble code"}));
    EXPECT_EQ(source.rows.size(), 1U);
}

} // namespace
