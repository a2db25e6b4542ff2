#pragma once

#include <cstddef>
#include <functional>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <vector>

namespace velmora {

// What a step of a formula does. Byte and Value are what a formula reads, Number is written in it.
enum class FormulaStep
{
    Number,
    Byte,  // of the reply, 0 is the first behind the echo of the request
    Value, // the last value of another signal, by its id or name
    Negate,
    Invert, // each bit of the whole number
    Not,
    Add,
    Subtract,
    Multiply,
    Divide,
    Remainder,
    Power,
    ShiftLeft,
    ShiftRight,
    And,
    ExclusiveOr,
    Or,
    Less,
    LessOrEqual,
    Greater,
    GreaterOrEqual,
    Equal,
    NotEqual,
    Both,
    Either,
    Bit,    // of a whole number, 0 is the lowest
    Signed, // two's complement of the low bits, as many as the second tells
    Joined, // bytes to one whole number, the first is the highest
    Float,  // 4 or 8 bytes as IEEE 754, the first is the highest
    Absolute,
    Minimum,
    Maximum,
    SquareRoot,
    Logarithm,
    Logarithm10,
    Logarithm1p,
    Truncate,
    Sine,
    Cosine,
    Tangent,
};

// A formula as a tree. What it was written in is forgotten; toText writes it in our grammar.
struct FormulaNode
{
    FormulaStep step = FormulaStep::Number;
    double number = 0.0; // of Number; of Byte its index
    std::string name;    // of Value
    std::vector<FormulaNode> operands;

    bool operator==(FormulaNode const&) const = default;
};

// Why a text is no formula, and at which character of it.
class FormulaError : public std::runtime_error
{
public:
    FormulaError(std::string const& what, std::size_t position) : std::runtime_error(what), m_position(position) {}

    std::size_t position() const { return m_position; }

private:
    std::size_t m_position;
};

// Bounds that keep reading and evaluating a formula from costing more than its signal is worth.
inline constexpr std::size_t longestFormula = 512;
inline constexpr std::size_t deepestFormula = 64;

// What a formula reads when it is evaluated.
struct FormulaInput
{
    std::span<unsigned char const> bytes; // the reply behind the echo of the request
    std::function<std::optional<double>(std::string const& name)> value;
};

// The result; nothing where the formula names a byte behind the end of the reply or a value that is not known, and
// where the result is not finite. Never minus zero.
std::optional<double> evaluate(FormulaNode const& formula, FormulaInput const& input);

// The formula in our grammar, with the brackets that it needs.
std::string toText(FormulaNode const& formula);

// The names that the formula reads, each once, in the order of their first use.
std::vector<std::string> valuesReadBy(FormulaNode const& formula);

// How many bytes of the reply the formula reads: the highest index and one.
std::size_t bytesReadBy(FormulaNode const& formula);

} // namespace velmora
