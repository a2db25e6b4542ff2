#include "libvelmora/signal/lookuptable.h"

#include "libvelmora/signal/formula.h"

#include <cctype>
#include <cstdlib>
#include <vector>

namespace velmora {

namespace {

constexpr std::size_t opening = 7; // of "lookup("

bool isLookup(std::string const& equation)
{
    std::string front = equation.substr(0, opening);
    for (char& each : front) {
        each = static_cast<char>(std::tolower(static_cast<unsigned char>(each)));
    }
    return front == "lookup(" && equation.back() == ')';
}

// Cut at colons that stand in no quotes, brackets or braces.
std::vector<std::string> cutAtColons(std::string const& text)
{
    std::vector<std::string> parts(1);
    int depth = 0;
    bool quoted = false;
    for (char const each : text) {
        quoted = each == '\'' ? !quoted : quoted;
        if (!quoted && (each == '(' || each == '{')) {
            ++depth;
        } else if (!quoted && (each == ')' || each == '}')) {
            --depth;
        }
        if (each == ':' && !quoted && depth == 0) {
            parts.emplace_back();
        } else {
            parts.back() += each;
        }
    }
    return parts;
}

} // namespace

std::optional<LookupTable> parseLookup(std::string const& equation)
{
    if (!isLookup(equation)) {
        return std::nullopt;
    }
    std::vector<std::string> const parts = cutAtColons(equation.substr(opening, equation.size() - opening - 1));
    if (parts.size() < 3 || !parts[1].empty()) {
        throw FormulaError("of LOOKUP only tables without a default are understood", opening);
    }
    LookupTable table{parts[0], {}};
    for (std::size_t i = 2; i < parts.size(); ++i) {
        char* end = nullptr;
        long const number = std::strtol(parts[i].c_str(), &end, 10);
        std::string const text = end;
        if (end == parts[i].c_str() || text.size() < 3 || !text.starts_with("='") || text.back() != '\'') {
            throw FormulaError("of LOOKUP only a number = 'text' is understood, not \"" + parts[i] + "\"", opening);
        }
        table.texts[number] = text.substr(2, text.size() - 3);
    }
    return table;
}

} // namespace velmora
