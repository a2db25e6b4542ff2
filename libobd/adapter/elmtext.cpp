#include "libobd/adapter/elmtext.h"

#include <algorithm>

namespace obd {
namespace {

char upperCase(char character)
{
    return character >= 'a' && character <= 'z' ? static_cast<char>(character - 'a' + 'A') : character;
}

} // namespace

void cropWord(std::string_view word, std::string& text)
{
    if (std::size_t const at = text.find(word); at != std::string::npos) {
        text.erase(at, word.size());
    }
}

void cropBefore(std::string_view word, std::string& text)
{
    if (std::size_t const at = text.find(word); at != std::string::npos) {
        text.erase(0, at);
    }
}

bool hasResponse(std::string_view text, std::string_view word)
{
    return text.find(word) != std::string_view::npos;
}

void removeSpaces(std::string& text)
{
    std::erase(text, ' ');
}

std::string toUpper(std::string text)
{
    std::transform(text.begin(), text.end(), text.begin(), upperCase);
    return text;
}

void trim(std::string_view command, std::string& text)
{
    text = toUpper(std::move(text));
    removeSpaces(text);
    cropWord(command, text);
    cropWord("?", text);
}

std::string stripped(std::string_view text)
{
    constexpr std::string_view whiteSpace = " \t\n\v\f\r";
    std::size_t const first = text.find_first_not_of(whiteSpace);
    if (first == std::string_view::npos) {
        return {};
    }
    return std::string(text.substr(first, text.find_last_not_of(whiteSpace) - first + 1));
}

} // namespace obd
