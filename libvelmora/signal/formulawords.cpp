#include "libvelmora/signal/formulawords.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr FormulaOperator operators[] = {
    {"||", FormulaStep::Either, 1},      {"&&", FormulaStep::Both, 2},
    {"==", FormulaStep::Equal, 6},       {"!=", FormulaStep::NotEqual, 6},
    {"<<", FormulaStep::ShiftLeft, 8},   {">>", FormulaStep::ShiftRight, 8},
    {"<=", FormulaStep::LessOrEqual, 7}, {">=", FormulaStep::GreaterOrEqual, 7},
    {"**", FormulaStep::Power, 11},      {"<", FormulaStep::Less, 7},
    {">", FormulaStep::Greater, 7},      {"|", FormulaStep::Or, 3},
    {"^", FormulaStep::ExclusiveOr, 4},  {"&", FormulaStep::And, 5},
    {"+", FormulaStep::Add, 9},          {"-", FormulaStep::Subtract, 9},
    {"*", FormulaStep::Multiply, 10},    {"/", FormulaStep::Divide, 10},
    {"%", FormulaStep::Remainder, 10},
};

constexpr std::size_t many = 8;
constexpr std::size_t lettersOfBytes = 26;

constexpr FormulaFunction functions[] = {
    {"bit", FormulaStep::Bit, 2, 2},
    {"signed", FormulaStep::Signed, 2, 2},
    {"signed8", FormulaStep::Signed, 1, 1, 8},
    {"signed16", FormulaStep::Signed, 1, 1, 16},
    {"signed24", FormulaStep::Signed, 1, 1, 24},
    {"signed32", FormulaStep::Signed, 1, 1, 32},
    {"int16", FormulaStep::Joined, 2, 2},
    {"int24", FormulaStep::Joined, 3, 3},
    {"int32", FormulaStep::Joined, 4, 4},
    {"float32", FormulaStep::Float, 4, 4},
    {"float64", FormulaStep::Float, 8, 8},
    {"abs", FormulaStep::Absolute, 1, 1},
    {"min", FormulaStep::Minimum, 2, many},
    {"max", FormulaStep::Maximum, 2, many},
    {"sqrt", FormulaStep::SquareRoot, 1, 1},
    {"log", FormulaStep::Logarithm, 1, 1},
    {"log10", FormulaStep::Logarithm10, 1, 1},
    {"log1p", FormulaStep::Logarithm1p, 1, 1},
    {"int", FormulaStep::Truncate, 1, 1},
    {"sin", FormulaStep::Sine, 1, 1},
    {"cos", FormulaStep::Cosine, 1, 1},
    {"tan", FormulaStep::Tangent, 1, 1},
};

} // namespace

std::span<FormulaOperator const> formulaOperators()
{
    return operators;
}

FormulaOperator const* findOperator(FormulaStep step)
{
    auto const found = std::find_if(std::begin(operators), std::end(operators),
                                    [step](FormulaOperator const& each) { return each.step == step; });
    return found == std::end(operators) ? nullptr : &*found;
}

FormulaOperator const* findOperator(std::string_view sign)
{
    auto const found = std::find_if(std::begin(operators), std::end(operators),
                                    [sign](FormulaOperator const& each) { return each.sign == sign; });
    return found == std::end(operators) ? nullptr : &*found;
}

std::span<FormulaFunction const> formulaFunctions()
{
    return functions;
}

FormulaFunction const* findFunction(std::string_view name)
{
    auto const found = std::find_if(std::begin(functions), std::end(functions),
                                    [name](FormulaFunction const& each) { return each.name == name; });
    return found == std::end(functions) ? nullptr : &*found;
}

std::string byteName(std::size_t index)
{
    std::string const last(1, static_cast<char>('A' + index % lettersOfBytes));
    return index < lettersOfBytes ? last : static_cast<char>('A' + index / lettersOfBytes - 1) + last;
}

std::optional<std::size_t> byteIndex(std::string_view name)
{
    auto const isCapital = [](char each) { return each >= 'A' && each <= 'Z'; };
    if (name.empty() || name.size() > 2 || !std::all_of(name.begin(), name.end(), isCapital)) {
        return std::nullopt;
    }
    auto const last = static_cast<std::size_t>(name.back() - 'A');
    return name.size() == 1 ? last : static_cast<std::size_t>(name.front() - 'A' + 1) * lettersOfBytes + last;
}

} // namespace velmora
