#include "common/text/text.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <numeric>
#include <string_view>

namespace velmora {

namespace {

bool isContinuation(char byte)
{
    return (static_cast<unsigned char>(byte) & 0xC0) == 0x80;
}

// How many bytes the UTF-8 character at the place has; 0 if there is none that may be shown.
std::size_t characterLength(std::string const& text, std::size_t at)
{
    auto const lead = static_cast<unsigned char>(text[at]);
    if (lead < 0x80) {
        return lead >= ' ' && lead != 0x7F ? 1 : 0;
    }
    std::size_t const length = lead >= 0xC2 && lead < 0xE0   ? 2
                               : lead >= 0xE0 && lead < 0xF0 ? 3
                               : lead >= 0xF0 && lead < 0xF5 ? 4
                                                             : 0;
    for (std::size_t i = 1; i < length; ++i) {
        if (at + i >= text.size() || !isContinuation(text[at + i])) {
            return 0;
        }
    }
    return length;
}

} // namespace

std::string readable(std::string const& text)
{
    std::string result;
    for (std::size_t at = 0; at < text.size();) {
        std::size_t const length = characterLength(text, at);
        result += length == 0 ? "\xEF\xBF\xBD" : text.substr(at, length);
        at += std::max<std::size_t>(length, 1);
    }
    return result;
}

std::string toUpper(std::string text)
{
    std::transform(text.begin(), text.end(), text.begin(),
                   [](char each) { return each >= 'a' && each <= 'z' ? static_cast<char>(each - 'a' + 'A') : each; });
    return text;
}

std::optional<double> numberIn(std::string const& text)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool const whole = !text.empty() && error == std::errc() && end == text.data() + text.size();
    return whole && std::isfinite(number) ? std::optional(number) : std::nullopt;
}

std::optional<unsigned int> parseHex(std::string const& text, unsigned int highest)
{
    std::string_view digits = text;
    if (digits.starts_with("0x") || digits.starts_with("0X")) {
        digits.remove_prefix(2);
    }
    unsigned int number = 0;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, 16);
    if (digits.empty() || error != std::errc() || end != digits.data() + digits.size() || number > highest) {
        return std::nullopt;
    }
    return number;
}

std::vector<std::string> adapterLines(std::string const& text)
{
    std::vector<std::string> lines(1);
    for (char const each : text) {
        if (each == '\r' || each == '\n') {
            lines.emplace_back();
        } else if (each != '\0') {
            lines.back() += each;
        }
    }
    std::erase_if(lines, [](std::string const& line) { return line.find_first_not_of(' ') == std::string::npos; });
    return lines;
}

std::vector<std::string> splitWords(std::string const& text)
{
    constexpr char const* separators = " _-";
    std::vector<std::string> words;
    std::size_t begin = text.find_first_not_of(separators);
    while (begin != std::string::npos) {
        std::size_t const end = text.find_first_of(separators, begin);
        words.push_back(text.substr(begin, end - begin));
        begin = text.find_first_not_of(separators, end);
    }
    return words;
}

std::string printableLine(std::string_view reply)
{
    std::string line;
    for (char const each : reply) {
        bool const printable = each > ' ' && each <= '~';
        if (printable) {
            line += each;
        } else if (!line.empty() && line.back() != ' ') {
            line += ' ';
        }
    }
    if (line.ends_with(' ')) {
        line.pop_back();
    }
    return line;
}

std::string csvField(std::string const& text)
{
    if (text.find_first_of(",\"\r\n") == std::string::npos) {
        return text;
    }
    std::string result = "\"";
    for (char const each : text) {
        result += each == '"' ? std::string("\"\"") : std::string(1, each);
    }
    return result + "\"";
}

std::size_t editDistance(std::string const& left, std::string const& right)
{
    std::vector<std::size_t> row(right.size() + 1);
    std::iota(row.begin(), row.end(), std::size_t{0});
    for (char const letter : left) {
        std::size_t diagonal = row[0]++;
        for (std::size_t j = 0; j < right.size(); ++j) {
            std::size_t const changed = diagonal + (letter == right[j] ? 0 : 1);
            diagonal = row[j + 1];
            row[j + 1] = std::min({changed, row[j] + 1, row[j + 1] + 1});
        }
    }
    return row.back();
}

} // namespace velmora
