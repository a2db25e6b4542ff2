#include "libvelmora/report/document/htmlescape.h"

#include <cstddef>

namespace velmora {

namespace {

constexpr char const* replacement = "\xEF\xBF\xBD";

unsigned char byteAt(std::string const& text, std::size_t place)
{
    return place < text.size() ? static_cast<unsigned char>(text[place]) : 0;
}

// How long the UTF-8 sequence is that begins there; 0 for bytes that are none (too long a form, a surrogate, beyond the
// last character).
std::size_t sequenceLength(std::string const& text, std::size_t place)
{
    unsigned char const first = byteAt(text, place);
    std::size_t const length = first < 0x80 ? 1 : first >= 0xF0 ? 4 : first >= 0xE0 ? 3 : 2;
    unsigned char const second = byteAt(text, place + 1);
    bool const wrong = (first >= 0x80 && first < 0xC2) || first > 0xF4 || (first == 0xE0 && second < 0xA0) ||
                       (first == 0xED && second > 0x9F) || (first == 0xF0 && second < 0x90) ||
                       (first == 0xF4 && second > 0x8F);
    for (std::size_t i = 1; i < length; ++i) {
        if ((byteAt(text, place + i) & 0xC0) != 0x80) {
            return 0;
        }
    }
    return wrong ? 0 : length;
}

bool isControl(std::string const& text, std::size_t place, std::size_t length)
{
    unsigned char const first = byteAt(text, place);
    bool const second = length == 2 && first == 0xC2 && byteAt(text, place + 1) < 0xA0;
    return second || (length == 1 && ((first < 0x20 && first != '\n' && first != '\t') || first == 0x7F));
}

} // namespace

std::string escapedHtml(std::string const& text)
{
    std::string result;
    for (std::size_t place = 0; place < text.size();) {
        std::size_t const length = sequenceLength(text, place);
        if (length == 0 || isControl(text, place, length)) {
            result += replacement;
            place += length == 0 ? 1 : length;
            continue;
        }
        switch (text[place]) {
        case '&':
            result += "&amp;";
            break;
        case '<':
            result += "&lt;";
            break;
        case '>':
            result += "&gt;";
            break;
        case '"':
            result += "&quot;";
            break;
        default:
            result.append(text, place, length);
        }
        place += length;
    }
    return result;
}

} // namespace velmora
