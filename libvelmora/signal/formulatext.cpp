#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulawords.h"

#include <charconv>

namespace velmora {

namespace {

constexpr int signLevel = highestLevel + 1;
constexpr int powerBaseLevel = highestLevel + 2;

std::string numberText(double number)
{
    char digits[400];
    auto const [end, error] = std::to_chars(digits, digits + sizeof(digits), number, std::chars_format::fixed);
    return error == std::errc() ? std::string(digits, end) : std::string("0");
}

char const* signOf(FormulaStep step)
{
    switch (step) {
    case FormulaStep::Negate:
        return "-";
    case FormulaStep::Invert:
        return "~";
    case FormulaStep::Not:
        return "!";
    default:
        return nullptr;
    }
}

std::string write(FormulaNode const& node, int level);

std::string writeOperator(FormulaNode const& node, FormulaOperator const& here)
{
    bool const power = node.step == FormulaStep::Power;
    std::string const left = write(node.operands[0], power ? powerBaseLevel : here.level);
    std::string const right = write(node.operands[1], power ? signLevel : here.level + 1);
    return left + std::string(here.sign) + right;
}

// A byte has a number, too, which is its place.
bool isNumber(FormulaNode const& node, int number)
{
    return node.step == FormulaStep::Number && node.number == number;
}

// The shortest name of the function; a Signed of a usual width has one of its own.
std::string writeCall(FormulaNode const& node)
{
    std::size_t shown = node.operands.size();
    FormulaFunction const* named = nullptr;
    for (FormulaFunction const& each : formulaFunctions()) {
        bool const fits = each.step == node.step && (each.bits == 0 || isNumber(node.operands.back(), each.bits));
        std::size_t const given = node.operands.size() - (each.bits != 0 ? 1 : 0);
        if (fits && given >= each.fewest && given <= each.most) {
            named = &each;
            shown = given;
        }
    }
    std::string text = named != nullptr ? std::string(named->name) : std::string();
    for (std::size_t i = 0; i < shown; ++i) {
        text += (i == 0 ? "(" : ", ") + write(node.operands[i], lowestLevel);
    }
    return text + ")";
}

std::string bracketed(std::string const& text, bool needed)
{
    return needed ? "(" + text + ")" : text;
}

std::string write(FormulaNode const& node, int level)
{
    if (node.step == FormulaStep::Number) {
        return bracketed(numberText(node.number), node.number < 0.0 && level > signLevel);
    }
    if (node.step == FormulaStep::Byte) {
        return byteName(static_cast<std::size_t>(node.number));
    }
    if (node.step == FormulaStep::Value) {
        return "value(\"" + node.name + "\")";
    }
    if (char const* const sign = signOf(node.step)) {
        return bracketed(sign + write(node.operands[0], signLevel), level > signLevel);
    }
    if (FormulaOperator const* const here = findOperator(node.step)) {
        return bracketed(writeOperator(node, *here),
                         level > (node.step == FormulaStep::Power ? signLevel : here->level));
    }
    return writeCall(node);
}

} // namespace

std::string toText(FormulaNode const& formula)
{
    return write(formula, lowestLevel);
}

} // namespace velmora
