#include "libvelmora/signal/formulaparser.h"

#include "libvelmora/signal/formulacursor.h"
#include "libvelmora/signal/formulawords.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <utility>

namespace velmora {

namespace {

constexpr int powerLevel = highestLevel + 1;

std::string inCase(std::string text, int (*convert)(int))
{
    std::transform(text.begin(), text.end(), text.begin(),
                   [convert](unsigned char each) { return static_cast<char>(convert(each)); });
    return text;
}

FormulaNode numberNode(double number)
{
    return {FormulaStep::Number, number, {}, {}};
}

class FormulaReader : private FormulaCursor
{
public:
    FormulaReader(std::string_view text, FormulaDialect dialect)
        : FormulaCursor(text), m_phone(dialect == FormulaDialect::Phone)
    {}

    FormulaNode read()
    {
        FormulaNode formula = binary(lowestLevel, 0);
        if (token().kind != FormulaToken::Kind::End) {
            fail("\"" + token().text + "\" is left over");
        }
        return formula;
    }

private:
    // The operator at hand, in the meaning of the dialect; null if there is none.
    FormulaOperator const* operatorHere() const
    {
        if (token().kind != FormulaToken::Kind::Sign) {
            return nullptr;
        }
        FormulaOperator const* const found = findOperator(token().text);
        if (!m_phone || found == nullptr) {
            return found;
        }
        if (found->step == FormulaStep::ExclusiveOr) {
            return findOperator(FormulaStep::Power);
        }
        return found->step == FormulaStep::Less ? findOperator(FormulaStep::ShiftLeft) : found;
    }

    // An old file's x<8 shifts; what else a comparison means there is not agreed.
    void checkShift(FormulaStep step, bool byLess, FormulaNode const& left) const
    {
        if (step == FormulaStep::Greater || step == FormulaStep::GreaterOrEqual || step == FormulaStep::LessOrEqual) {
            fail("comparisons mean different things in different versions of the apps");
        }
        if (!byLess) {
            return;
        }
        bool const places = token().kind == FormulaToken::Kind::Number &&
                            (token().number == 8 || token().number == 16 || token().number == 24);
        if (!places || (left.step != FormulaStep::Byte && !m_bracketed)) {
            fail("\"<\" is read as a shift only of a byte or a bracket, by 8, 16 or 24");
        }
    }

    // Each operator nests the tree by one, also in a chain such as A+A+A: its depth is bounded by the text's length.
    FormulaNode binary(int level, std::size_t depth)
    {
        if (level > highestLevel) {
            return unary(depth);
        }
        FormulaNode left = binary(level + 1, depth);
        for (FormulaOperator const* here = operatorHere(); here != nullptr && here->level == level;
             here = operatorHere()) {
            bool const byLess = at("<");
            advance();
            if (m_phone) {
                checkShift(here->step, byLess, left);
            }
            FormulaNode right = binary(level + 1, depth);
            left = {here->step, 0.0, {}, {std::move(left), std::move(right)}};
        }
        return left;
    }

    FormulaNode unary(std::size_t depth)
    {
        if (depth > deepestFormula) {
            fail("the formula is nested deeper than " + std::to_string(deepestFormula) + " levels");
        }
        if (pass("+")) {
            return unary(depth + 1);
        }
        constexpr std::array<std::pair<std::string_view, FormulaStep>, 3> signs = {
            {{"-", FormulaStep::Negate}, {"~", FormulaStep::Invert}, {"!", FormulaStep::Not}}};
        for (auto const& [sign, step] : signs) {
            if (m_phone && sign == "~" && at(sign)) {
                fail("\"~\" means different things in different versions of the apps");
            }
            if (pass(sign)) {
                return {step, 0.0, {}, {unary(depth + 1)}};
            }
        }
        return power(depth);
    }

    // Binds to the right, and closer than a sign at its left: -A**2 is -(A**2).
    FormulaNode power(std::size_t depth)
    {
        FormulaNode base = primary(depth);
        FormulaOperator const* const here = operatorHere();
        if (here == nullptr || here->level != powerLevel) {
            return base;
        }
        advance();
        return {FormulaStep::Power, 0.0, {}, {std::move(base), unary(depth + 1)}};
    }

    FormulaNode primary(std::size_t depth)
    {
        m_bracketed = false;
        if (token().kind == FormulaToken::Kind::Number) {
            FormulaNode const node = numberNode(token().number);
            advance();
            return node;
        }
        if (token().kind == FormulaToken::Kind::Word) {
            return word(depth);
        }
        if (pass("(")) {
            FormulaNode inner = binary(lowestLevel, depth + 1);
            demand(")");
            m_bracketed = true;
            return inner;
        }
        if (m_phone && pass("{")) {
            FormulaNode bit = {FormulaStep::Bit, 0.0, {}, operands("}", depth)};
            return checkedCount(std::move(bit), 2, 2);
        }
        if (m_phone && at("[")) {
            return readOtherPid(*this);
        }
        fail(token().kind == FormulaToken::Kind::End ? "the formula ends too early"
                                                     : "\"" + token().text + "\" stands in the wrong place");
    }

    FormulaNode word(std::size_t depth)
    {
        FormulaToken const name = token();
        std::string const lower = inCase(name.text, std::tolower);
        if (lower == (m_phone ? "val" : "value")) {
            return readValue(*this, m_phone);
        }
        advance();
        if (at("(")) {
            return call(name, m_phone ? lower : name.text, depth);
        }
        auto const index = byteIndex(m_phone ? inCase(name.text, std::toupper) : name.text);
        if (!index) {
            throw FormulaError("\"" + name.text + "\" is no byte (A to ZZ) and no function", name.position);
        }
        return {FormulaStep::Byte, static_cast<double>(*index), {}, {}};
    }

    FormulaNode call(FormulaToken const& name, std::string const& function, std::size_t depth)
    {
        FormulaFunction const* const row = findFunction(function);
        std::string const phoneName = m_phone && function == "signed" ? "signed8" : function;
        if (row == nullptr) {
            throw FormulaError("function " + name.text +
                                   (m_phone ? " is not understood, or keeps state" : " is not known"),
                               name.position);
        }
        FormulaFunction const& meant = *findFunction(phoneName);
        advance();
        FormulaNode node = checkedCount({meant.step, 0.0, {}, operands(")", depth)}, meant.fewest, meant.most);
        if (m_phone && function == "signed" && node.operands[0].step != FormulaStep::Byte) {
            throw FormulaError("Signed of more than one byte means different things in different versions of the apps",
                               name.position);
        }
        if (meant.bits != 0) {
            node.operands.push_back(numberNode(meant.bits));
        }
        return node;
    }

    FormulaNode checkedCount(FormulaNode node, std::size_t fewest, std::size_t most) const
    {
        if (node.operands.size() < fewest || node.operands.size() > most) {
            fail(fewest == most
                     ? std::to_string(fewest) + " operands are wanted before this"
                     : std::to_string(fewest) + " to " + std::to_string(most) + " operands are wanted before this");
        }
        return node;
    }

    std::vector<FormulaNode> operands(std::string_view closing, std::size_t depth)
    {
        std::vector<FormulaNode> list;
        do {
            list.push_back(binary(lowestLevel, depth + 1));
        } while (pass(",") || (m_phone && pass(":")));
        demand(closing);
        return list;
    }

    bool m_phone;
    bool m_bracketed = false; // the last operand stood in brackets
};

} // namespace

FormulaNode parseFormula(std::string_view text, FormulaDialect dialect)
{
    if (text.size() > longestFormula) {
        throw FormulaError("the formula is longer than " + std::to_string(longestFormula) + " characters",
                           longestFormula);
    }
    return FormulaReader(text, dialect).read();
}

} // namespace velmora
