#include "common/text/text.h"

#include <algorithm>
#include <clocale>
#include <cwchar>

namespace velmora {

namespace {

// One character of a UTF-8 text. A byte that begins none stands for itself, in one column.
struct Character
{
    std::size_t bytes = 1;
    std::size_t columns = 1;
};

// The widths of Unicode, whatever the locale that the user chose.
class WidthLocale
{
public:
    WidthLocale() : m_locale(::newlocale(LC_CTYPE_MASK, "C.UTF-8", nullptr)) {}
    ~WidthLocale()
    {
        if (m_locale != nullptr) {
            ::freelocale(m_locale);
        }
    }
    WidthLocale(WidthLocale const&) = delete;
    WidthLocale& operator=(WidthLocale const&) = delete;

    std::size_t columnsOf(char32_t character) const
    {
        if (m_locale == nullptr) {
            return 1;
        }
        locale_t const before = ::uselocale(m_locale); // of this thread alone
        int const columns = ::wcwidth(static_cast<wchar_t>(character));
        ::uselocale(before);
        return columns < 0 ? 1 : static_cast<std::size_t>(columns);
    }

private:
    locale_t const m_locale;
};

std::size_t columnsOf(char32_t character)
{
    static WidthLocale const locale;
    return locale.columnsOf(character);
}

std::size_t lengthByLead(unsigned char lead)
{
    return lead >= 0xC2 && lead < 0xE0 ? 2 : lead >= 0xE0 && lead < 0xF0 ? 3 : lead >= 0xF0 && lead < 0xF5 ? 4 : 1;
}

Character characterAt(std::string_view text, std::size_t at)
{
    auto const lead = static_cast<unsigned char>(text[at]);
    std::size_t const length = lengthByLead(lead);
    if (length == 1 || at + length > text.size()) {
        return {};
    }
    char32_t code = lead & (0xFFU >> (length + 1));
    for (std::size_t i = 1; i < length; ++i) {
        auto const byte = static_cast<unsigned char>(text[at + i]);
        if ((byte & 0xC0) != 0x80) {
            return {};
        }
        code = (code << 6) | (byte & 0x3FU);
    }
    return {length, columnsOf(code)};
}

} // namespace

std::size_t displayWidth(std::string_view text)
{
    std::size_t width = 0;
    for (std::size_t at = 0; at < text.size();) {
        Character const next = characterAt(text, at);
        width += next.columns;
        at += next.bytes;
    }
    return width;
}

std::size_t bytesOfWidth(std::string_view text, std::size_t width)
{
    std::size_t at = 0;
    while (at < text.size()) {
        Character const next = characterAt(text, at);
        if (next.columns > width) {
            break;
        }
        width -= next.columns;
        at += next.bytes;
    }
    return at;
}

std::string fitted(std::string const& text, std::size_t width, bool rightAligned)
{
    std::size_t const shown = displayWidth(text);
    if (shown > width) {
        std::string const begin = width == 0 ? std::string() : text.substr(0, bytesOfWidth(text, width - 1)) + "…";
        return begin + std::string(width - std::min(width, displayWidth(begin)), ' ');
    }
    std::string const blanks(width - shown, ' ');
    return rightAligned ? blanks + text : text + blanks;
}

} // namespace velmora
