// Every operator, function and message of formulas.
#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/formulawords.h"

#include <gtest/gtest.h>

#include <cmath>

using namespace velmora;

namespace {

std::optional<double> computed(std::string const& text, std::vector<unsigned char> const& bytes = {})
{
    return evaluate(parseFormula(text), {bytes, {}});
}

std::string parsed(std::string const& text, FormulaDialect dialect)
{
    try {
        return toText(parseFormula(text, dialect));
    } catch (FormulaError const& error) {
        return std::to_string(error.position()) + ": " + error.what();
    }
}

} // namespace

TEST(FormulaWords, ComputesEachFunction)
{
    std::pair<char const*, double> const cases[] = {
        {"abs(-2.5)", 2.5},
        {"sqrt(9)", 3.0},
        {"log(2)", std::log(2.0)},
        {"log10(1000)", 3.0},
        {"log1p(1)", std::log(2.0)},
        {"sin(1)", std::sin(1.0)},
        {"cos(1)", std::cos(1.0)},
        {"tan(1)", std::tan(1.0)},
        {"int(2.9)", 2.0},
        {"int16(1,2)", 258.0},
        {"int24(1,2,3)", 66051.0},
        {"int32(1,2,3,4)", 16909060.0},
        {"signed8(127)", 127.0},
        {"signed8(128)", -128.0},
        {"signed16(0x8000)", -32768.0},
        {"signed24(0x800000)", -8388608.0},
        {"signed32(0x80000000)", -2147483648.0},
        {"signed(1, 1)", -1.0},
        {"signed(0xFFFFFFFF, 32)", -1.0},
        {"bit(4, 2)", 1.0},
        {"bit(4, 1)", 0.0},
        {"bit(2**52, 52)", 1.0},
        {"min(1,2,3,4,5,6,7,0)", 0.0},
        {"max(1,2,3,4,5,6,7,8)", 8.0},
        {"1<<52", 4503599627370496.0},
        {"1<<0", 1.0},
        {"2**52>>52", 1.0},
        {"2**53|0", 9007199254740992.0},
        {"float32(0xC0,0x20,0,0)", -2.5},
        {"2**0.5", std::sqrt(2.0)},
        {"0x7fffFFFF", 2147483647.0},
        {"+ + 3", 3.0},
        {"~5", -6.0},
        {"!0+2*!7", 1.0},
        {"5==5", 1.0},
        {"5!=5", 0.0},
    };
    for (auto const& [text, result] : cases) {
        auto const value = computed(text);
        ASSERT_TRUE(value) << text;
        EXPECT_DOUBLE_EQ(*value, result) << text;
    }
    for (char const* const text :
         {"signed(1, 0)", "signed(1, 33)", "bit(1, -1)", "bit(1, 53)", "1<<53", "1<<-1", "1>>53", "(2**53+2)|0",
          "int16(256,0)", "int16(-1,0)", "1/0", "1%0", "1e308*10", "A", "float32(0,0,0,256)"}) {
        EXPECT_EQ(computed(text), std::nullopt) << text;
    }
    EXPECT_EQ(computed("int16(A,B)", {255, 255}), 65535.0);
    EXPECT_EQ(computed("B", {1, 2}), 2.0);
}

TEST(FormulaWords, WritesAsFewBracketsAsItReads)
{
    std::pair<char const*, char const*> const cases[] = {
        {"(A+B)+C", "A+B+C"},
        {"A+(B+C)", "A+(B+C)"},
        {"(A*B)/C%D", "A*B/C%D"},
        {"A*(B/C)", "A*(B/C)"},
        {"(A**B)**C", "(A**B)**C"},
        {"A**(B**C)", "A**B**C"},
        {"(-A)**2", "(-A)**2"},
        {"-(A**2)", "-A**2"},
        {"2**(-1)", "2**-1"},
        {"-(A+B)", "-(A+B)"},
        {"~(!A)", "~!A"},
        {"(A<<2)+B", "(A<<2)+B"},
        {"A<<(2+B)", "A<<2+B"},
        {"(A&B)|(C^D)", "A&B|C^D"},
        {"A&(B|C)", "A&(B|C)"},
        {"(A==B)!=C", "A==B!=C"},
        {"A<(B==C)", "A<(B==C)"},
        {"(A<B)<=C>D>=E", "A<B<=C>D>=E"},
        {"(A&&B)||C", "A&&B||C"},
        {"A&&(B||C)", "A&&(B||C)"},
        {"A>>(1>>2)", "A>>(1>>2)"},
        {"min( A,B ,3.50 )", "min(A, B, 3.5)"},
        {"signed(A,8)", "signed8(A)"},
        {"signed(A,16)+signed(A,24)+signed(A,32)", "signed16(A)+signed24(A)+signed32(A)"},
        {"signed(A,7)", "signed(A, 7)"},
        {"int16(A,B)+int24(A,B,C)+int32(A,B,C,D)", "int16(A, B)+int24(A, B, C)+int32(A, B, C, D)"},
        {"float32(A,B,C,D)", "float32(A, B, C, D)"},
        {"1e3+1e-3", "1000+0.001"},
        {"value ( \"X y\" )", "value(\"X y\")"},
        {"ZZ+AA+Z", "ZZ+AA+Z"},
    };
    for (auto const& [text, written] : cases) {
        EXPECT_EQ(parsed(text, FormulaDialect::Own), written) << text;
        EXPECT_EQ(parsed(written, FormulaDialect::Own), written);
    }
}

TEST(FormulaWords, SaysWhatIsWrongAndWhere)
{
    std::pair<char const*, char const*> const own[] = {
        {"value", "5: value wants a name: value(\"NAME\")"},
        {"value(\"\")", "6: the name is empty"},
        {"value(\"X\"", "9: a \")\" is missing here"},
        {"0xZ", "0: 0x wants up to eight hexadecimal digits"},
        {"0x123456789", "0: 0x wants up to eight hexadecimal digits"},
        {"A+.", "2: this number can't be read"},
        {"A$", "1: \"$\" has no place in a formula"},
        {"A:2", "1: \":\" is left over"},
        {"*A", "0: \"*\" stands in the wrong place"},
        {"MIN(A,B)", "0: function MIN is not known"},
        {"bit(A)", "6: 2 operands are wanted before this"},
        {"bit(A,B,C)", "10: 2 operands are wanted before this"},
        {"max(1,2,3,4,5,6,7,8,9)", "22: 2 to 8 operands are wanted before this"},
        {"A1", "0: \"A1\" is no byte (A to ZZ) and no function"},
        {"A_B", "0: \"A_B\" is no byte (A to ZZ) and no function"},
        {"min(A", "5: a \")\" is missing here"},
        {"[0D]", "0: \"[\" stands in the wrong place"},
    };
    for (auto const& [text, wrong] : own) {
        EXPECT_EQ(parsed(text, FormulaDialect::Own), wrong) << text;
    }
    std::string const shift = "\"<\" is read as a shift only of a byte or a bracket, by 8, 16 or 24";
    std::string const versions = " different things in different versions of the apps";
    std::pair<char const*, std::string> const phone[] = {
        {"a<24", "A<<24"},
        {"(a+b)<8", "A+B<<8"},
        {"a<9", "2: " + shift},
        {"2<8", "2: " + shift},
        {"a<b", "2: " + shift},
        {"a<<3", "A<<3"},
        {"a>=2", "3: comparisons mean" + versions},
        {"a>2", "2: comparisons mean" + versions},
        {"a<=2", "3: comparisons mean" + versions},
        {"~a", "0: \"~\" means" + versions},
        {"signed(1)", "0: Signed of more than one byte means" + versions},
        {"baro(1)", "0: function baro is not understood, or keeps state"},
        {"val{}", "3: the name is empty"},
        {"val{X", "4: the closing } is missing"},
        {"val X", "4: a name behind \"{\" is missing here"},
        {"[fe]", "value(\"[FE]\")"},
        {"[ff]", "1: [ff] is no standard PID"},
        {"[1]", "1: [1] is no standard PID"},
        {"[0g]", "1: [0g] is no standard PID"},
        {"{a:1:2}", "7: 2 operands are wanted before this"},
        {"a^2", "A**2"},
        {"VALUE", "0: \"VALUE\" is no byte (A to ZZ) and no function"},
    };
    for (auto const& [text, wrong] : phone) {
        EXPECT_EQ(parsed(text, FormulaDialect::Phone), wrong) << text;
    }
    EXPECT_EQ(parsed(std::string(66, '-') + "A", FormulaDialect::Own),
              "65: the formula is nested deeper than 64 levels");
    EXPECT_NE(parsed(std::string(64, '-') + "A", FormulaDialect::Own).substr(0, 2), "65");
    EXPECT_EQ(parsed(std::string(512, '1'), FormulaDialect::Own), "0: this number can't be read");
}

TEST(FormulaWords, NamesBytesBothWays)
{
    EXPECT_EQ(byteIndex(""), std::nullopt);
    EXPECT_EQ(byteIndex("AAA"), std::nullopt);
    EXPECT_EQ(byteIndex("a"), std::nullopt);
    EXPECT_EQ(byteIndex("A["), std::nullopt);
    EXPECT_EQ(byteIndex("A@"), std::nullopt);
    for (std::size_t index = 0; index < 702; ++index) {
        EXPECT_EQ(byteIndex(byteName(index)), index);
    }
    EXPECT_EQ(byteName(25) + byteName(26) + byteName(51) + byteName(52), "ZAAAZBA");
    EXPECT_EQ(valuesReadBy(parseFormula("value(\"X\")+value(\"Y\")*value(\"X\")")),
              (std::vector<std::string>{"X", "Y"}));
    EXPECT_EQ(bytesReadBy(parseFormula("1+2")), 0U);
    EXPECT_EQ(bytesReadBy(parseFormula("C+A")), 3U);
}
