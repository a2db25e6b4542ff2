#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulaparser.h"

#include <gtest/gtest.h>

#include <cmath>
#include <map>

using namespace velmora;

namespace {

using Bytes = std::vector<unsigned char>;

std::optional<double> resultOf(std::string const& text, Bytes const& bytes,
                               FormulaDialect dialect = FormulaDialect::Own)
{
    return evaluate(parseFormula(text, dialect), {bytes, [](std::string const& name) -> std::optional<double> {
                                                      return name == "SPEED" ? std::optional(50.0) : std::nullopt;
                                                  }});
}

// What is wrong, and at which character.
std::string mistakeIn(std::string const& text, FormulaDialect dialect = FormulaDialect::Own)
{
    try {
        parseFormula(text, dialect);
    } catch (FormulaError const& error) {
        return std::to_string(error.position()) + ": " + error.what();
    }
    return "none";
}

struct FormulaCase
{
    char const* text;
    Bytes bytes;
    double result;
};

} // namespace

TEST(Formula, ComputesInOurGrammar)
{
    FormulaCase const cases[] = {
        {"(A*256+B)/4", {0x1A, 0xF8}, 1726.0},
        {"2+3*4", {}, 14.0},
        {"2-3-4", {}, -5.0},
        {"100/10/2", {}, 5.0},
        {"7%4", {}, 3.0},
        {"-7%4", {}, -3.0},
        {"2**3**2", {}, 512.0},
        {"-2**2", {}, -4.0},
        {"2**-1", {}, 0.5},
        {"1<<8|A", {0x0F}, 271.0},
        {"A>>4&3", {0xF0}, 3.0},
        {"6^3", {}, 5.0},
        {"~0", {}, -1.0},
        {"!A+!B", {0, 7}, 1.0},
        {"A==1||B==2&&A==9", {1, 0}, 1.0},
        {"A>=3", {3}, 1.0},
        {"A<3", {3}, 0.0},
        {"(A!=3)+2*(A!=4)", {3}, 2.0},
        {"(A>3)+2*(A>2)", {3}, 2.0},
        {"(A<=3)+2*(A<=2)", {3}, 1.0},
        {"(A&&B)+2*(A||B)", {3, 0}, 2.0},
        {"A^B", {6, 3}, 5.0},
        {"0x1F+1e1+.5", {}, 41.5},
        {"signed8(A)", {0xFF}, -1.0},
        {"signed16(A*256+B)/10", {0xFC, 0xBA}, -83.8},
        {"signed(A, 4)", {0x18}, -8.0},
        {"int24(A,B,C)", {1, 2, 3}, 66051.0},
        {"float32(A,B,C,D)", {0x3F, 0x80, 0, 0}, 1.0},
        {"float64(A,B,C,D,E,F,G,H)", {0xC0, 0, 0, 0, 0, 0, 0, 0}, -2.0},
        {"bit(A, 3)", {0x08}, 1.0},
        {"min(A, 3, B)", {9, 2}, 2.0},
        {"max(A, 3)", {9}, 9.0},
        {"int(-1.7)", {}, -1.0},
        {"value(\"SPEED\")*2", {}, 100.0},
        {" A\t+ 1 ", {1}, 2.0},
    };
    for (FormulaCase const& each : cases) {
        auto const result = resultOf(each.text, each.bytes);
        ASSERT_TRUE(result) << each.text;
        EXPECT_DOUBLE_EQ(*result, each.result) << each.text;
        EXPECT_EQ(parseFormula(toText(parseFormula(each.text))), parseFormula(each.text)) << each.text;
    }
}

TEST(Formula, NamesBytesFromAToZz)
{
    Bytes bytes(702);
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        bytes[i] = static_cast<unsigned char>(i % 251);
    }
    EXPECT_EQ(resultOf("Z", bytes), 25.0);
    EXPECT_EQ(resultOf("AA", bytes), 26.0);
    EXPECT_EQ(resultOf("ZZ", bytes), 701 % 251);
    EXPECT_EQ(bytesReadBy(parseFormula("A+AB")), 28U);
}

TEST(Formula, HasNoValueWhereThereIsNone)
{
    EXPECT_FALSE(resultOf("C", {1, 2})) << "a byte beyond the reply is never 0";
    EXPECT_FALSE(resultOf("0*C", {1, 2}));
    EXPECT_FALSE(resultOf("A/B", {1, 0}));
    EXPECT_FALSE(resultOf("A%B", {1, 0}));
    EXPECT_FALSE(resultOf("sqrt(-1)", {}));
    EXPECT_FALSE(resultOf("log(0)", {}));
    EXPECT_FALSE(resultOf("10**400", {}));
    EXPECT_FALSE(resultOf("float32(A,B,C,D)", {0x7F, 0x80, 0, 0})) << "infinite";
    EXPECT_FALSE(resultOf("value(\"RPM\")", {}));
    EXPECT_FALSE(resultOf("1<<60", {}));
    EXPECT_FALSE(resultOf("1e300&1", {})) << "no whole number";
    EXPECT_FALSE(std::signbit(*resultOf("(A-1)*-1", {1}))) << "minus zero is zero";
}

TEST(Formula, TellsWhereAMistakeStands)
{
    std::map<std::string, std::string> const cases = {
        {"", "0: the formula ends too early"},
        {"A+", "2: the formula ends too early"},
        {"(A", "2: a \")\" is missing here"},
        {"A)", "1: \")\" is left over"},
        {"A B", "2: \"B\" is left over"},
        {"A*0,5", "3: \",\" is left over"},
        {"a", "0: \"a\" is no byte (A to ZZ) and no function"},
        {"AAA", "0: \"AAA\" is no byte (A to ZZ) and no function"},
        {"AVG(A)", "0: function AVG is not known"},
        {"min(A)", "6: 2 to 8 operands are wanted before this"},
        {"A=1", "1: \"=\" has no place in a formula"},
        {"{A:1}", "0: \"{\" stands in the wrong place"},
        {"value(SPEED)", "6: a name behind \"\"\" is missing here"},
        {"value(\"SPEED", "7: the closing \" is missing"},
        {"1e400", "0: this number can't be read"},
    };
    for (auto const& [text, mistake] : cases) {
        EXPECT_EQ(mistakeIn(text), mistake) << text;
    }
    EXPECT_EQ(mistakeIn(std::string(513, ' ')), "512: the formula is longer than 512 characters");
    EXPECT_EQ(mistakeIn(std::string(64, '(') + "A" + std::string(64, ')')), "none");
    EXPECT_NE(mistakeIn(std::string(66, '(') + "A" + std::string(66, ')')), "none");
    EXPECT_NE(mistakeIn(std::string(200, '-') + "A"), "none");
}

TEST(Formula, ReadsThePhonesDialect)
{
    FormulaCase const cases[] = {
        {"((m<8)+n)/10", {0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0x0D, 0xD9}, 354.5},
        {"a<16", {1}, 65536.0},
        {"{b:3}+Bit(a:0)", {1, 8}, 2.0},
        {"SIGNED(A)*256+b", {0xFF, 0xFE}, -2.0},
        {"signed16(int16(a:b))", {0xFF, 0xFE}, -2.0},
        {"MAX(0:A)", {7}, 7.0},
        {"A^2", {3}, 9.0},
        {"val{SPEED}/2", {}, 25.0},
        {"2*-1", {}, -2.0},
        {"A<<8", {1}, 256.0},
        {"(A==2)||(A==3)", {3}, 1.0},
    };
    for (FormulaCase const& each : cases) {
        auto const result = resultOf(each.text, each.bytes, FormulaDialect::Phone);
        ASSERT_TRUE(result) << each.text;
        EXPECT_DOUBLE_EQ(*result, each.result) << each.text;
        FormulaNode const tree = parseFormula(each.text, FormulaDialect::Phone);
        EXPECT_EQ(parseFormula(toText(tree)), tree) << each.text << " as " << toText(tree);
    }
}

TEST(Formula, GuessesNothingOfThePhonesDialect)
{
    for (char const* const text :
         {"A<7", "8<A", "A>3", "A<=8", "-A+B<8", "~A", "Signed(A*256)+B", "(Signed(BD)*256))+BE", "AVG(5:A)",
          "EWMAF(A:3)", "BARO()", "RANDOM()", "[ff1001]", "[0", "[123]", "{A:1} -1 * -1}", "(A-80)/2)"}) {
        EXPECT_NE(mistakeIn(text, FormulaDialect::Phone), "none") << text;
    }
}
