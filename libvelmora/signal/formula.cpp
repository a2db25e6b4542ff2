#include "libvelmora/signal/formula.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>

namespace velmora {

namespace {

using Result = std::optional<double>;

Result truth(bool holds)
{
    return holds ? 1.0 : 0.0;
}

// Whole numbers up to 2^53 pass through double unharmed; beyond, bits would be invented.
std::optional<std::int64_t> whole(double value)
{
    constexpr double most = 9007199254740992.0;
    if (!std::isfinite(value) || std::abs(value) > most) {
        return std::nullopt;
    }
    return static_cast<std::int64_t>(value);
}

Result shifted(std::int64_t value, std::int64_t places, bool left)
{
    constexpr std::int64_t most = 52;
    if (places < 0 || places > most) {
        return std::nullopt;
    }
    return left ? std::ldexp(static_cast<double>(value), static_cast<int>(places))
                : static_cast<double>(value >> places);
}

Result signedOf(std::int64_t value, std::int64_t bits)
{
    if (bits < 1 || bits > 32) {
        return std::nullopt;
    }
    std::int64_t const range = std::int64_t{1} << bits;
    std::int64_t const low = value & (range - 1);
    return static_cast<double>(low >= range / 2 ? low - range : low);
}

Result wholeStep(FormulaStep step, double left, double right)
{
    auto const first = whole(left);
    auto const second = whole(right);
    if (!first || !second) {
        return std::nullopt;
    }
    switch (step) {
    case FormulaStep::ShiftLeft:
        return shifted(*first, *second, true);
    case FormulaStep::ShiftRight:
        return shifted(*first, *second, false);
    case FormulaStep::And:
        return static_cast<double>(*first & *second);
    case FormulaStep::ExclusiveOr:
        return static_cast<double>(*first ^ *second);
    case FormulaStep::Or:
        return static_cast<double>(*first | *second);
    case FormulaStep::Remainder:
        return *second == 0 ? Result() : Result(static_cast<double>(*first % *second));
    case FormulaStep::Bit:
        return *second < 0 || *second > 52 ? Result() : Result(static_cast<double>(*first >> *second & 1));
    default:
        return signedOf(*first, *second);
    }
}

Result numberStep(FormulaStep step, double left, double right)
{
    switch (step) {
    case FormulaStep::Add:
        return left + right;
    case FormulaStep::Subtract:
        return left - right;
    case FormulaStep::Multiply:
        return left * right;
    case FormulaStep::Divide:
        return right == 0.0 ? Result() : Result(left / right);
    case FormulaStep::Power:
        return std::pow(left, right);
    case FormulaStep::Less:
        return truth(left < right);
    case FormulaStep::LessOrEqual:
        return truth(left <= right);
    case FormulaStep::Greater:
        return truth(left > right);
    case FormulaStep::GreaterOrEqual:
        return truth(left >= right);
    case FormulaStep::Equal:
        return truth(left == right);
    case FormulaStep::NotEqual:
        return truth(left != right);
    case FormulaStep::Both:
        return truth(left != 0.0 && right != 0.0);
    case FormulaStep::Either:
        return truth(left != 0.0 || right != 0.0);
    default:
        return wholeStep(step, left, right);
    }
}

Result oneStep(FormulaStep step, double value)
{
    switch (step) {
    case FormulaStep::Negate:
        return -value;
    case FormulaStep::Not:
        return truth(value == 0.0);
    case FormulaStep::Invert: {
        auto const number = whole(value);
        return number ? Result(static_cast<double>(~*number)) : Result();
    }
    case FormulaStep::Absolute:
        return std::abs(value);
    case FormulaStep::SquareRoot:
        return std::sqrt(value);
    case FormulaStep::Logarithm:
        return std::log(value);
    case FormulaStep::Logarithm10:
        return std::log10(value);
    case FormulaStep::Logarithm1p:
        return std::log1p(value);
    case FormulaStep::Sine:
        return std::sin(value);
    case FormulaStep::Cosine:
        return std::cos(value);
    case FormulaStep::Tangent:
        return std::tan(value);
    default:
        return std::trunc(value);
    }
}

std::optional<std::uint64_t> joined(std::vector<double> const& bytes)
{
    std::uint64_t number = 0;
    for (double const each : bytes) {
        if (!(each >= 0.0 && each <= 255.0)) {
            return std::nullopt;
        }
        number = number << 8U | static_cast<std::uint64_t>(each);
    }
    return number;
}

Result listStep(FormulaStep step, std::vector<double> const& values)
{
    if (step == FormulaStep::Minimum) {
        return *std::min_element(values.begin(), values.end());
    }
    if (step == FormulaStep::Maximum) {
        return *std::max_element(values.begin(), values.end());
    }
    auto const number = joined(values);
    if (!number) {
        return std::nullopt;
    }
    if (step == FormulaStep::Joined) {
        return static_cast<double>(*number);
    }
    return values.size() == 4 ? static_cast<double>(std::bit_cast<float>(static_cast<std::uint32_t>(*number)))
                              : std::bit_cast<double>(*number);
}

bool isListStep(FormulaStep step)
{
    return step == FormulaStep::Minimum || step == FormulaStep::Maximum || step == FormulaStep::Joined ||
           step == FormulaStep::Float;
}

Result leaf(FormulaNode const& node, FormulaInput const& input)
{
    if (node.step == FormulaStep::Number) {
        return node.number;
    }
    if (node.step == FormulaStep::Value) {
        return input.value ? input.value(node.name) : std::nullopt;
    }
    auto const index = static_cast<std::size_t>(node.number);
    return index < input.bytes.size() ? Result(input.bytes[index]) : Result();
}

Result evaluateNode(FormulaNode const& node, FormulaInput const& input)
{
    if (node.operands.empty()) {
        return leaf(node, input);
    }
    std::vector<double> values;
    values.reserve(node.operands.size());
    for (FormulaNode const& operand : node.operands) {
        Result const value = evaluateNode(operand, input);
        if (!value) {
            return std::nullopt;
        }
        values.push_back(*value);
    }
    if (isListStep(node.step)) {
        return listStep(node.step, values);
    }
    return values.size() == 1 ? oneStep(node.step, values[0]) : numberStep(node.step, values[0], values[1]);
}

} // namespace

std::optional<double> evaluate(FormulaNode const& formula, FormulaInput const& input)
{
    Result const result = evaluateNode(formula, input);
    if (!result || !std::isfinite(*result)) {
        return std::nullopt;
    }
    return *result == 0.0 ? 0.0 : *result; // of -0 too
}

std::vector<std::string> valuesReadBy(FormulaNode const& formula)
{
    std::vector<std::string> names;
    if (formula.step == FormulaStep::Value) {
        names.push_back(formula.name);
    }
    for (FormulaNode const& operand : formula.operands) {
        for (std::string const& name : valuesReadBy(operand)) {
            if (std::find(names.begin(), names.end(), name) == names.end()) {
                names.push_back(name);
            }
        }
    }
    return names;
}

std::size_t bytesReadBy(FormulaNode const& formula)
{
    std::size_t bytes = formula.step == FormulaStep::Byte ? static_cast<std::size_t>(formula.number) + 1 : 0;
    for (FormulaNode const& operand : formula.operands) {
        bytes = std::max(bytes, bytesReadBy(operand));
    }
    return bytes;
}

} // namespace velmora
