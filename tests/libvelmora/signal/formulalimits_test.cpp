// Formulas at the limits of their grammar: how operators bind, how many operands and levels there may be, which bits.
#include "libvelmora/signal/bitfield.h"
#include "libvelmora/signal/formulalexer.h"
#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/formulawords.h"
#include "libvelmora/signal/lookuptable.h"

#include <gtest/gtest.h>

#include <array>

using namespace velmora;

namespace {

std::optional<double> worth(std::string const& text)
{
    return evaluate(parseFormula(text), {});
}

// Its text in our grammar, or what is wrong.
std::string formulaWritten(std::string const& text, FormulaDialect dialect = FormulaDialect::Own)
{
    try {
        return toText(parseFormula(text, dialect));
    } catch (FormulaError const& error) {
        return error.what();
    }
}

std::string repeated(std::string const& part, int times)
{
    std::string text;
    for (int i = 0; i < times; ++i) {
        text += part;
    }
    return text;
}

// What a table of texts is, on one line.
std::string lookup(std::string const& equation)
{
    try {
        auto const table = parseLookup(equation);
        if (!table) {
            return "none";
        }
        std::string text = table->formula;
        for (auto const& [number, word] : table->texts) {
            text += " " + std::to_string(number) + "=" + word;
        }
        return text;
    } catch (FormulaError const& error) {
        return error.what();
    }
}

} // namespace

TEST(FormulaLimits, OperatorsBindInTheOrderOfTheGuide)
{
    std::vector<std::vector<std::string>> const levels = {
        {"||"},       {"&&"},     {"|"},          {"^"}, {"&"}, {"==", "!="}, {"<", "<=", ">", ">="},
        {"<<", ">>"}, {"+", "-"}, {"*", "/", "%"}};
    for (std::size_t one = 0; one < levels.size(); ++one) {
        for (std::size_t other = 0; other < levels.size(); ++other) {
            for (std::string const& first : levels[one]) {
                for (std::string const& second : levels[other]) {
                    std::string const left = "(A" + first + "B)" + second + "C";
                    std::string const right = "A" + first + "(B" + second + "C)";
                    std::string const plain = "A" + first + "B" + second + "C";
                    EXPECT_EQ(parseFormula(plain), parseFormula(other > one ? right : left)) << plain;
                    EXPECT_EQ(formulaWritten(left), other > one ? left : plain);
                    EXPECT_EQ(formulaWritten(right), other > one ? plain : right);
                }
            }
        }
    }
    EXPECT_EQ(formulaWritten("A*B**C"), "A*B**C");
    EXPECT_EQ(formulaWritten("(A*B)**C"), "(A*B)**C");
    EXPECT_EQ(formulaWritten("0**2"), "0**2");
    FormulaNode const minusTwo = leafNumber(-2);
    EXPECT_EQ(toText(combine(FormulaStep::Power, minusTwo, leafNumber(2))), "(-2)**2");
    EXPECT_EQ(toText(combine(FormulaStep::Power, leafNumber(2), minusTwo)), "2**-2");
    EXPECT_EQ(toText(combine(FormulaStep::Add, minusTwo, minusTwo)), "-2+-2");
}

TEST(FormulaLimits, FunctionsTakeAsManyOperandsAsTheGuideSays)
{
    struct Row
    {
        char const* name;
        int fewest;
        int most;
    };
    Row const rows[] = {{"bit", 2, 2},      {"signed", 2, 2}, {"signed8", 1, 1}, {"signed16", 1, 1}, {"signed24", 1, 1},
                        {"signed32", 1, 1}, {"int16", 2, 2},  {"int24", 3, 3},   {"int32", 4, 4},    {"float32", 4, 4},
                        {"float64", 8, 8},  {"abs", 1, 1},    {"min", 2, 8},     {"max", 2, 8},      {"sqrt", 1, 1},
                        {"log", 1, 1},      {"log10", 1, 1},  {"log1p", 1, 1},   {"int", 1, 1},      {"sin", 1, 1},
                        {"cos", 1, 1},      {"tan", 1, 1}};
    for (Row const& row : rows) {
        for (int count = 1; count < 10; ++count) {
            std::string const text = std::string(row.name) + "(A" + repeated(", A", count - 1) + ")";
            EXPECT_EQ(formulaWritten(text) == text, count >= row.fewest && count <= row.most)
                << text << " " << formulaWritten(text);
        }
    }
    EXPECT_EQ(std::size(formulaFunctions()), std::size(rows));
    EXPECT_EQ(formulaWritten("{a}", FormulaDialect::Phone), "2 operands are wanted before this");
    EXPECT_EQ(formulaWritten("(a)+2<8", FormulaDialect::Phone),
              "\"<\" is read as a shift only of a byte or a bracket, by 8, 16 or 24")
        << "a bracket further ahead is not the one that is shifted";
    EXPECT_EQ(formulaWritten("A 0x1F"), "\"0x1F\" is left over");
    for (char const* const bits : {"I", "Q", "Y", "AG", "8+0"}) {
        std::string const text = std::string("signed(A, ") + bits + ")";
        EXPECT_EQ(formulaWritten(text), text) << "as many bits as that byte says, which is the ninth, and so on";
    }
}

TEST(FormulaLimits, NestsSixtyFourLevelsInEachWay)
{
    std::string const deeper = "the formula is nested deeper than 64 levels";
    for (auto const& [front, back] : {std::pair("-", ""), std::pair("~", ""), std::pair("!", ""), std::pair("+", ""),
                                      std::pair("(", ")"), std::pair("A**", ""), std::pair("abs(", ")")}) {
        EXPECT_NE(formulaWritten(repeated(front, 64) + "A" + repeated(back, 64)), deeper) << front;
        EXPECT_EQ(formulaWritten(repeated(front, 65) + "A" + repeated(back, 65)), deeper) << front;
    }
    EXPECT_NE(formulaWritten(repeated("{", 64) + "A" + repeated(":1}", 64), FormulaDialect::Phone), deeper);
    EXPECT_EQ(formulaWritten(repeated("{", 65) + "A" + repeated(":1}", 65), FormulaDialect::Phone), deeper);
    EXPECT_EQ(formulaWritten("A" + repeated("+A", 255)), "A" + repeated("+A", 255)) << "a chain is no nest";
}

TEST(FormulaLimits, TruthIsOneOrZero)
{
    std::pair<char const*, double> const cases[] = {
        {"2&&3", 1}, {"0&&3", 0}, {"3&&0", 0}, {"0&&0", 0},     {"2||3", 1},     {"0||3", 1},     {"3||0", 1},
        {"0||0", 0}, {"!0", 1},   {"!2", 0},   {"bit(5,0)", 1}, {"bit(6,0)", 0}, {"bit(6,1)", 1}, {"1>>0", 1}};
    for (auto const& [text, value] : cases) {
        EXPECT_EQ(worth(text), value) << text;
    }
    EXPECT_EQ(worth("sqrt(-1)|0"), std::nullopt) << "what is no number has no bits";
    EXPECT_EQ(worth("~sqrt(-1)"), std::nullopt);
    EXPECT_EQ(worth("value(\"X\")"), std::nullopt) << "nobody knows it";
    EXPECT_EQ(FormulaToken().position, 0U);
}

TEST(FormulaLimits, FieldsOfBitsAreCutWhereverTheyStand)
{
    std::array<unsigned char, 8> const data = {0xA5, 0x3C, 0x81, 0x7E, 0xF0, 0x0F, 0x99, 0x66};
    auto const bitAt = [&data](std::size_t place) { return data[place / 8] >> (7 - place % 8) & 1; };
    for (std::size_t first = 0; first < 17; ++first) {
        for (std::size_t length = 1; length <= 40; ++length) {
            std::int64_t expected = 0;
            for (std::size_t i = 0; i < length; ++i) {
                expected = expected * 2 + bitAt(first + i);
            }
            EXPECT_EQ(evaluate(rawOf({first, length, false, false}), {data, {}}), static_cast<double>(expected))
                << first << " " << length;
            std::int64_t const negative = bitAt(first) != 0 ? expected - (std::int64_t{1} << length) : expected;
            if (length <= 32) {
                EXPECT_EQ(evaluate(rawOf({first, length, false, true}), {data, {}}), static_cast<double>(negative))
                    << first << " " << length;
            }
        }
    }
    EXPECT_EQ(evaluate(rawOf({8, 24, true, false}), {data, {}}), 0x7E813C);
    EXPECT_EQ(evaluate(rawOf({8, 24, true, true}), {data, {}}), 0x7E813C);
    EXPECT_EQ(evaluate(rawOf({16, 16, true, true}), {data, {}}), 0x7E81);
    EXPECT_EQ(toText(rawOf({0, 16, false, false})), "A*256+B") << "whole bytes need no mask and no shift";
    EXPECT_EQ(toText(rawOf({8, 8, false, false})), "B");
    EXPECT_EQ(toText(rawOf({4, 8, false, false})), "A*256+B>>4&255");
    EXPECT_EQ(toText(rawOf({3, 5, false, false})), "A&31");
    std::pair<BitField, bool> const fields[] = {
        {{0, 0, false, false}, true},  {{0, 1, false, false}, false}, {{0, 48, false, false}, false},
        {{0, 49, false, false}, true}, {{0, 32, false, true}, false}, {{0, 33, false, true}, true},
        {{8, 16, true, false}, false}, {{4, 16, true, false}, true},  {{8, 12, true, false}, true}};
    for (auto const& [field, wrong] : fields) {
        EXPECT_EQ(wrongField(field).has_value(), wrong) << field.first << " " << field.length;
    }
    BitField const none;
    EXPECT_EQ(none.first + none.length, 0U);
    EXPECT_FALSE(none.littleEndian || none.isSigned);
}

TEST(FormulaLimits, TablesOfTextsAreCutAtTheirOwnColons)
{
    std::string const wrong = "of LOOKUP only a number = 'text' is understood, not \"";
    std::string const ofDefault = "of LOOKUP only tables without a default are understood";
    std::pair<char const*, std::string> const cases[] = {
        {"LOOKUP(A::0='Off':12='On')", "A 0=Off 12=On"},
        {"lookup(A::-1='x')", "A -1=x"},
        {"LOOKUP(MAX(A:B)+{C:1}::1='a')", "MAX(A:B)+{C:1} 1=a"},
        {"LOOKUP(A::1='a:(b':2='c}:':3=')')", "A 1=a:(b 2=c}: 3=)"},
        {"LOOKUP(A::1='')", "A 1="},
        {"LOOKUP(A::1='x'", "none"},
        {"LOOKUP(", "none"},
        {"LOOKUP", "none"},
        {"", "none"},
        {"A+B", "none"},
        {"VLOOKUP(A::1='x')", "none"},
        {"LOOKUP()", ofDefault},
        {"LOOKUP(A)", ofDefault},
        {"LOOKUP(A:)", ofDefault},
        {"LOOKUP(A:0:1='x')", ofDefault},
        {"LOOKUP(A::='a')", wrong + "='a'\""},
        {"LOOKUP(A::1')", wrong + "1'\""},
        {"LOOKUP(A::1=a')", wrong + "1=a'\""},
        {"LOOKUP(A::1='a)", wrong + "1='a\""},
        {"LOOKUP(A::1'a')", wrong + "1'a'\""},
        {"LOOKUP(A::1..2='a')", wrong + "1..2='a'\""},
        {"LOOKUP(A::1=')", wrong + "1='\""},
    };
    for (auto const& [equation, text] : cases) {
        EXPECT_EQ(lookup(equation), text) << equation;
    }
}
