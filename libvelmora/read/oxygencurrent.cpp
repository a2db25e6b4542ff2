#include "libvelmora/read/oxygencurrent.h"

#include <fmt/format.h>

#include <charconv>
#include <memory>

namespace velmora {

namespace {

constexpr int firstUid = 0x34 * 10 + 1;
constexpr int lastUid = 0x3B * 10 + 1;
constexpr int offset = 128; // mA

} // namespace

bool isOxygenCurrent(int uid)
{
    return uid >= firstUid && uid <= lastUid && uid % 10 == 1;
}

double shownNumber(int uid, double number)
{
    return isOxygenCurrent(uid) ? number - offset : number;
}

int shownNumber(int uid, int number)
{
    return isOxygenCurrent(uid) ? number - offset : number;
}

std::string shownText(int uid, std::string const& text)
{
    if (!isOxygenCurrent(uid)) {
        return text;
    }
    double number = 0.0;
    char const* const last = std::to_address(text.end());
    auto const [end, error] = std::from_chars(std::to_address(text.begin()), last, number);
    if (error != std::errc() || end != last) {
        return text;
    }
    std::size_t const point = text.find('.');
    std::size_t const decimals = point == std::string::npos ? 0 : text.size() - point - 1;
    return fmt::format("{:.{}f}", shownNumber(uid, number), decimals);
}

} // namespace velmora
