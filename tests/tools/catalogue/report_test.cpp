#include "tools/catalogue/report.h"

#include <sstream>

namespace {

std::vector<catalogue::Row> const table = {
    {0, "B0001", "Airbag", false, {}},
    {0, "P0300", "Misfire", false, {}},
    {12, "P1001", "Misfire", false, {}},
    {14, "P1001", "Misfire", false, {}},
};

TEST(Report, DumpsRowsWithTabs)
{
    std::ostringstream output;
    catalogue::writeDump(output, table);
    EXPECT_EQ(output.str(),
              "Generic\tB0001\tAirbag\nGeneric\tP0300\tMisfire\nFord\tP1001\tMisfire\nGM\tP1001\tMisfire\n");
}

TEST(Report, CountsMakersPrefixesAndTotals)
{
    std::ostringstream output;
    catalogue::writeCounts(output, table);
    std::string const text = output.str();
    EXPECT_NE(text.find("maker\tGeneric\t2\n"), std::string::npos);
    EXPECT_NE(text.find("maker\tDaewoo\t0\n"), std::string::npos);
    EXPECT_NE(text.find("maker\tFord\t1\n"), std::string::npos);
    EXPECT_TRUE(text.ends_with("generic\tB0\t1\ngeneric\tP0\t1\nmakers\tP1\t2\n"
                               "all\trows\t4\nall\tcodes\t3\nall\ttexts\t2\n"))
        << text;
}

} // namespace
