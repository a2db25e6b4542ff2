#include "tools/catalogue/codepattern.h"
#include "tools/catalogue/sourceerror.h"

namespace {

using catalogue::expandCodes;
using catalogue::isTroubleCode;
using Codes = std::vector<std::string>;

TEST(CodePattern, KnowsTroubleCodes)
{
    for (char const* code : {"P0000", "P0420", "P0A0F", "B3FFF", "C1234", "U350C"}) {
        EXPECT_TRUE(isTroubleCode(code)) << code;
    }
}

TEST(CodePattern, RefusesWhatIsNoTroubleCode)
{
    for (char const* code :
         {"", "P", "P042", "P04200", "X0420", "p0420", "P042g", "P042a", "P4000", "P15O9", "P1300]"}) {
        EXPECT_FALSE(isTroubleCode(code)) << code;
    }
}

TEST(CodePattern, OneCodeStandsForItself)
{
    EXPECT_EQ(expandCodes("P0420"), Codes{"P0420"});
}

TEST(CodePattern, RangeCountsInHexadecimal)
{
    EXPECT_EQ(expandCodes("P0209-P020B"), (Codes{"P0209", "P020A", "P020B"}));
    EXPECT_EQ(expandCodes("U0FFF-U1000"), (Codes{"U0FFF", "U1000"}));
}

TEST(CodePattern, RefusesRangesThatDoNotRise)
{
    EXPECT_THROW(expandCodes("P0420-P0420"), catalogue::SourceError);
    EXPECT_THROW(expandCodes("P0421-P0420"), catalogue::SourceError);
    EXPECT_THROW(expandCodes("P0420-B0421"), catalogue::SourceError);
}

TEST(CodePattern, RefusesRangesOfNoCodes)
{
    for (char const* word : {"-", "P0420-", "-P0420", "P0420-P04", "P0420-P0421-P0422"}) {
        EXPECT_THROW(expandCodes(word), catalogue::SourceError) << word;
    }
}

} // namespace
