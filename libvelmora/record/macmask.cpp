#include "libvelmora/record/macmask.h"

#include <string_view>

namespace velmora {

namespace {

constexpr std::size_t macLength = 17;
constexpr std::size_t hiddenFrom = 9; // the fourth byte

bool isMacDigit(char each)
{
    return (each >= '0' && each <= '9') || (each >= 'A' && each <= 'F') || (each >= 'a' && each <= 'f');
}

bool isMac(std::string_view text)
{
    constexpr std::string_view separators = ":-_";
    if (text.size() < macLength || separators.find(text[2]) == std::string_view::npos) {
        return false;
    }
    for (std::size_t i = 0; i < macLength; ++i) {
        bool const fits = i % 3 == 2 ? text[i] == text[2] : isMacDigit(text[i]);
        if (!fits) {
            return false;
        }
    }
    return true;
}

} // namespace

std::string withoutMacs(std::string text)
{
    for (std::size_t begin = 0; begin + macLength <= text.size();) {
        if (!isMac(std::string_view(text).substr(begin))) {
            ++begin;
            continue;
        }
        for (std::size_t i = hiddenFrom; i < macLength; i += 3) {
            text.replace(begin + i, 2, "xx");
        }
        begin += macLength;
    }
    return text;
}

} // namespace velmora
