#include "libvelmora/signal/formulalexer.h"

#include "libvelmora/signal/formula.h"
#include "libvelmora/signal/formulawords.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <memory>

namespace velmora {

namespace {

bool isDigit(char each)
{
    return std::isdigit(static_cast<unsigned char>(each)) != 0;
}

bool isLetter(char each)
{
    return std::isalpha(static_cast<unsigned char>(each)) != 0;
}

bool isOfWord(char each)
{
    return isLetter(each) || isDigit(each) || each == '_';
}

} // namespace

FormulaToken FormulaLexer::next()
{
    m_place = std::min(m_text.find_first_not_of(" \t\n\v\f\r", m_place), m_text.size());
    if (m_place == m_text.size()) {
        return {FormulaToken::Kind::End, {}, 0.0, m_place};
    }
    char const first = m_text[m_place];
    if (isLetter(first)) {
        return word();
    }
    return isDigit(first) || first == '.' ? number() : sign();
}

FormulaToken FormulaLexer::nameUntil(char closing)
{
    std::size_t const end = m_text.find(closing, m_place);
    if (end == std::string_view::npos) {
        throw FormulaError(std::string("the closing ") + closing + " is missing", m_place);
    }
    FormulaToken const token{FormulaToken::Kind::Name, std::string(m_text.substr(m_place, end - m_place)), 0.0,
                             m_place};
    m_place = end + 1;
    return token;
}

FormulaToken FormulaLexer::number()
{
    std::string_view const rest = m_text.substr(m_place);
    if (rest.starts_with("0x") || rest.starts_with("0X")) {
        return hexadecimal();
    }
    FormulaToken token{FormulaToken::Kind::Number, {}, 0.0, m_place};
    auto const [end, error] = std::from_chars(std::to_address(rest.begin()), std::to_address(rest.end()), token.number);
    if (error != std::errc() || !std::isfinite(token.number)) {
        throw FormulaError("this number can't be read", m_place);
    }
    token.text = rest.substr(0, static_cast<std::size_t>(end - rest.data()));
    m_place += token.text.size();
    return token;
}

FormulaToken FormulaLexer::hexadecimal()
{
    std::string_view const rest = m_text.substr(m_place + 2);
    unsigned int value = 0;
    auto const [end, error] = std::from_chars(std::to_address(rest.begin()), std::to_address(rest.end()), value, 16);
    if (error != std::errc()) {
        throw FormulaError("0x wants up to eight hexadecimal digits", m_place);
    }
    std::size_t const length = 2 + static_cast<std::size_t>(end - rest.data());
    FormulaToken const token{FormulaToken::Kind::Number, std::string(m_text.substr(m_place, length)),
                             static_cast<double>(value), m_place};
    m_place += length;
    return token;
}

FormulaToken FormulaLexer::word()
{
    std::string_view const rest = m_text.substr(m_place);
    FormulaToken const token{FormulaToken::Kind::Word,
                             std::string(rest.begin(), std::find_if_not(rest.begin(), rest.end(), isOfWord)), 0.0,
                             m_place};
    m_place += token.text.size();
    return token;
}

FormulaToken FormulaLexer::sign()
{
    FormulaToken token{FormulaToken::Kind::Sign, std::string(1, m_text[m_place]), 0.0, m_place};
    for (FormulaOperator const& each : formulaOperators()) {
        if (m_text.substr(m_place).starts_with(each.sign)) {
            token.text = each.sign;
            break;
        }
    }
    constexpr std::string_view others = "()[]{},:~!\"";
    if (findOperator(token.text) == nullptr && others.find(token.text) == std::string_view::npos) {
        throw FormulaError("\"" + token.text + "\" has no place in a formula", m_place);
    }
    m_place += token.text.size();
    return token;
}

} // namespace velmora
