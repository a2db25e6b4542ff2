#include "tools/catalogue/codepattern.h"

#include "tools/catalogue/sourceerror.h"

#include <charconv>

namespace catalogue {

namespace {

constexpr std::string_view upperHexDigits = "0123456789ABCDEF";

void requireTroubleCode(std::string_view text)
{
    if (!isTroubleCode(text)) {
        throw SourceError("'" + std::string(text) + "' is no trouble code");
    }
}

// The number behind the letter of a valid code.
unsigned int codeNumber(std::string_view code)
{
    unsigned int number = 0;
    std::from_chars(code.data() + 1, code.data() + code.size(), number, 16);
    return number;
}

std::string makeCode(char system, unsigned int number)
{
    std::string code(1, system);
    for (int shift = 12; shift >= 0; shift -= 4) {
        code += upperHexDigits[(number >> shift) & 0xFU];
    }
    return code;
}

} // namespace

bool isTroubleCode(std::string_view text)
{
    constexpr std::string_view systems = "PBCU";
    constexpr std::string_view groups = "0123";
    return text.size() == 5 && systems.find(text[0]) != std::string_view::npos &&
           groups.find(text[1]) != std::string_view::npos &&
           text.find_first_not_of(upperHexDigits, 2) == std::string_view::npos;
}

std::vector<std::string> expandCodes(std::string_view word)
{
    std::size_t const dash = word.find('-');
    std::string_view const first = word.substr(0, dash);
    requireTroubleCode(first);
    if (dash == std::string_view::npos) {
        return {std::string(first)};
    }
    std::string_view const last = word.substr(dash + 1);
    requireTroubleCode(last);
    if (first.front() != last.front() || codeNumber(first) >= codeNumber(last)) {
        throw SourceError("the codes of '" + std::string(word) + "' do not rise");
    }
    std::vector<std::string> codes;
    for (unsigned int number = codeNumber(first); number <= codeNumber(last); ++number) {
        codes.push_back(makeCode(first.front(), number));
    }
    return codes;
}

} // namespace catalogue
