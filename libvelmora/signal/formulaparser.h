#pragma once

#include "libvelmora/signal/formula.h"

#include <string>
#include <string_view>

namespace velmora {

// In what a formula is written.
enum class FormulaDialect
{
    Own,   // docs/signals.md tells it
    Phone, // of the CSV form that phone apps exchange: no matter of case, ':' between operands, '^' is a power
};

// Reads a formula whole. Throws FormulaError for a text that is none, is longer than longestFormula or nested deeper
// than deepestFormula; and, of the phones' dialect, for what means different things in different versions of the apps
// or keeps state from one value to the next: that is told, never guessed.
FormulaNode parseFormula(std::string_view text, FormulaDialect dialect = FormulaDialect::Own);

} // namespace velmora
