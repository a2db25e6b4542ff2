#include "tools/catalogue/tablewriter.h"

#include <sstream>

namespace {

using catalogue::Row;

std::string write(std::vector<Row> const& table)
{
    std::ostringstream output;
    catalogue::writeTable(output, table);
    return output.str();
}

std::size_t occurrences(std::string const& text, std::string const& part)
{
    std::size_t count = 0;
    for (std::size_t at = text.find(part); at != std::string::npos; at = text.find(part, at + 1)) {
        ++count;
    }
    return count;
}

TEST(TableWriter, StoresEachTextOnce)
{
    std::string const text = write({{0, "P0300", "Misfire", false, {}}, {12, "P1001", "Misfire", false, {}}});
    EXPECT_EQ(occurrences(text, "\"Misfire\\0\""), 1U);
    EXPECT_NE(text.find("{\"P0300\", 0, 0, 0},\n    {\"P1001\", 12, 0, 0},"), std::string::npos);
    EXPECT_NE(text.find("packedDtcRowCount = 2;"), std::string::npos);
}

TEST(TableWriter, OffsetsStepOverTheClosingZero)
{
    std::string const text = write({{0, "P0300", "Misfire", false, {}}, {0, "P0301", "Other", false, {}}});
    EXPECT_NE(text.find("{\"P0301\", 0, 0, 8},"), std::string::npos);
}

TEST(TableWriter, EscapesQuotesAndBackslashes)
{
    EXPECT_NE(write({{0, "P0300", "A \"B\" \\", false, {}}}).find("\"A \\\"B\\\" \\\\\\0\""), std::string::npos);
}

TEST(TableWriter, StartsABlockWhenOneIsFull)
{
    std::vector<Row> table;
    for (int number = 0; number < 1000; ++number) {
        table.push_back({0, "P0300", std::string(100, 'A') + std::to_string(number), false, {}});
    }
    std::string const text = write(table);
    EXPECT_NE(text.find("dtcTextBlocks[] = {block0, block1};"), std::string::npos);
    EXPECT_NE(text.find("\", 0, 1, 0},"), std::string::npos);
}

} // namespace
