#pragma once

#include <map>
#include <optional>
#include <string>

namespace velmora {

// LOOKUP(formula:default:number='text':...) of the phones' dialect.
struct LookupTable
{
    std::string formula;
    std::map<long, std::string> texts;
};

// Nothing for an equation that is no LOOKUP. Throws FormulaError for one with a default, ranges or numbers in the place
// of texts, which have no form here.
std::optional<LookupTable> parseLookup(std::string const& equation);

} // namespace velmora
