#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace velmora {

// One word, number or sign of a formula.
struct FormulaToken
{
    enum class Kind
    {
        Number,
        Word,
        Sign,
        Name, // what stood between the quotes or braces of a value's name
        End,
    };

    Kind kind = Kind::End;
    std::string text;
    double number = 0.0;
    std::size_t position = 0;
};

// Cuts a formula into its tokens, one at a time.
class FormulaLexer
{
public:
    explicit FormulaLexer(std::string_view text) : m_text(text) {}

    // Throws FormulaError for a character that no formula has, and for a number that is none.
    FormulaToken next();
    // The text up to the closing character, which is passed. Throws FormulaError if it does not come.
    FormulaToken nameUntil(char closing);

private:
    FormulaToken number();
    FormulaToken hexadecimal();
    FormulaToken word();
    FormulaToken sign();

    std::string_view m_text;
    std::size_t m_place = 0;
};

} // namespace velmora
