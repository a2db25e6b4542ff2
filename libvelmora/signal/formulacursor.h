#pragma once

#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulalexer.h"

#include <string>
#include <string_view>

namespace velmora {

// The token that a formula's reader stands at. Throws FormulaError, with the place, for what is not as it must be.
class FormulaCursor
{
public:
    explicit FormulaCursor(std::string_view text) : m_lexer(text) { advance(); }

    FormulaToken const& token() const { return m_token; }
    void advance() { m_token = m_lexer.next(); }

    bool at(std::string_view sign) const { return m_token.kind == FormulaToken::Kind::Sign && m_token.text == sign; }
    // Whether the sign was here; it is passed then.
    bool pass(std::string_view sign);
    void demand(std::string_view sign);
    // A name between the signs, both of which are passed.
    FormulaToken named(std::string_view opening, char closing);

    [[noreturn]] void fail(std::string const& why) const { throw FormulaError(why, m_token.position); }

private:
    FormulaLexer m_lexer;
    FormulaToken m_token;
};

// The value of another signal: value("NAME") in our grammar, val{Name} in the phones'. The cursor stands at the word.
FormulaNode readValue(FormulaCursor& cursor, bool phone);

// [0d]: the value of a standard PID, in the phones' grammar.
FormulaNode readOtherPid(FormulaCursor& cursor);

} // namespace velmora
