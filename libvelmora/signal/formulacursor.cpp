#include "libvelmora/signal/formulacursor.h"

#include <algorithm>
#include <cctype>

namespace velmora {

bool FormulaCursor::pass(std::string_view sign)
{
    bool const here = at(sign);
    if (here) {
        advance();
    }
    return here;
}

void FormulaCursor::demand(std::string_view sign)
{
    if (!pass(sign)) {
        fail("a \"" + std::string(sign) + "\" is missing here");
    }
}

FormulaToken FormulaCursor::named(std::string_view opening, char closing)
{
    if (!at(opening)) {
        fail("a name behind \"" + std::string(opening) + "\" is missing here");
    }
    FormulaToken const name = m_lexer.nameUntil(closing);
    if (name.text.empty()) {
        fail("the name is empty");
    }
    advance();
    return name;
}

FormulaNode readValue(FormulaCursor& cursor, bool phone)
{
    cursor.advance();
    if (phone) {
        return {FormulaStep::Value, 0.0, cursor.named("{", '}').text, {}};
    }
    if (!cursor.at("(")) {
        cursor.fail("value wants a name: value(\"NAME\")");
    }
    cursor.advance();
    std::string const name = cursor.named("\"", '"').text;
    cursor.demand(")");
    return {FormulaStep::Value, 0.0, name, {}};
}

// From ff upward they are sensors of the phone itself.
FormulaNode readOtherPid(FormulaCursor& cursor)
{
    FormulaToken const name = cursor.named("[", ']');
    std::string digits = name.text;
    std::transform(digits.begin(), digits.end(), digits.begin(),
                   [](unsigned char each) { return static_cast<char>(std::toupper(each)); });
    bool const hexadecimal = digits.find_first_not_of("0123456789ABCDEF") == std::string::npos;
    if (!hexadecimal || digits.size() != 2 || digits == "FF") {
        throw FormulaError("[" + name.text + "] is no standard PID", name.position);
    }
    return {FormulaStep::Value, 0.0, "[" + digits + "]", {}};
}

} // namespace velmora
