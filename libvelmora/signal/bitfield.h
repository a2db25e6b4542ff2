#pragma once

#include "libvelmora/signal/formula.h"

#include <cstddef>
#include <optional>
#include <string>

namespace velmora {

// Where a raw value stands among the bits of the data, 0 being the highest of its first byte.
struct BitField
{
    std::size_t first = 0;
    std::size_t length = 0;
    bool littleEndian = false;
    bool isSigned = false;
};

// The raw value as a formula.
FormulaNode rawOf(BitField const& field);

// Why the field can't be read, or nothing.
std::optional<std::string> wrongField(BitField const& field);

FormulaNode leafNumber(double number);
FormulaNode combine(FormulaStep step, FormulaNode left, FormulaNode right);

} // namespace velmora
