#pragma once

#include "libvelmora/signal/formula.h"

#include <cstddef>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace velmora {

// An operator between two operands, of one of the levels of binding; a higher level binds closer.
struct FormulaOperator
{
    std::string_view sign;
    FormulaStep step;
    int level;
};

// All operators of our grammar; a longer sign stands before its beginning.
std::span<FormulaOperator const> formulaOperators();

// Null for a step or a sign that is no operator.
FormulaOperator const* findOperator(FormulaStep step);
FormulaOperator const* findOperator(std::string_view sign);

inline constexpr int lowestLevel = 1;
inline constexpr int highestLevel = 10; // of those that bind to the left; "**" binds to the right, above them

// A function with how many operands it takes; bits is the second operand of a Signed that its name tells.
struct FormulaFunction
{
    std::string_view name;
    FormulaStep step;
    std::size_t fewest;
    std::size_t most;
    int bits = 0;
};

std::span<FormulaFunction const> formulaFunctions();

// By its name in lower case; null if there is none.
FormulaFunction const* findFunction(std::string_view name);

// "A" is 0, "Z" 25, "AA" 26, "ZZ" 701: the name of a byte of the reply.
std::string byteName(std::size_t index);
// Back again; nothing if it is no such name.
std::optional<std::size_t> byteIndex(std::string_view name);

} // namespace velmora
