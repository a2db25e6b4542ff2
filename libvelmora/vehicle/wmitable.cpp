#include "libvelmora/vehicle/wmitable.h"

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

using enum VinFacts::CodesBasis;
using enum VinFacts::Standing;
using enum WmiRow::Make;

constexpr WmiRow wmiRows[] = {
#include "libvelmora/vehicle/wmirows.inc"
};

static_assert(std::ranges::adjacent_find(wmiRows, std::ranges::greater_equal{}, &WmiRow::wmi) ==
                  std::ranges::end(wmiRows),
              "identifiers must rise, none twice");

WmiRow const* findExact(std::string_view wmi)
{
    auto const* const found = std::ranges::lower_bound(wmiRows, wmi, {}, &WmiRow::wmi);
    return found != std::end(wmiRows) && found->wmi == wmi ? found : nullptr;
}

// First characters that are one country's as a whole.
std::string_view countryOfFirst(char first)
{
    switch (first) {
    case '1':
    case '4':
    case '5':
        return "United States";
    case '2':
        return "Canada";
    case 'J':
        return "Japan";
    case 'L':
        return "China";
    case 'W':
        return "Germany";
    default:
        return {};
    }
}

} // namespace

WmiRow const* findWmi(std::string_view wmi)
{
    if (wmi.size() != 3 || wmi[2] == '9') {
        return nullptr;
    }
    WmiRow const* const exact = findExact(wmi);
    return exact != nullptr ? exact : findExact(wmi.substr(0, 2));
}

std::string_view countryOfWmi(std::string_view wmi)
{
    if (wmi.size() < 2) {
        return {};
    }
    WmiRow const* const exact = findExact(wmi);
    if (exact != nullptr) {
        return exact->country;
    }
    std::string_view const first = countryOfFirst(wmi[0]);
    if (!first.empty()) {
        return first;
    }
    auto const* const same =
        std::ranges::find(wmiRows, wmi.substr(0, 2), [](WmiRow const& row) { return row.wmi.substr(0, 2); });
    return same != std::end(wmiRows) ? same->country : std::string_view();
}

std::string_view regionOfWmi(std::string_view wmi)
{
    char const first = wmi.empty() ? '0' : wmi[0];
    if (first >= 'A' && first <= 'C') {
        return "Africa";
    }
    if (first == 'H' || (first >= 'J' && first <= 'R')) {
        return "Asia";
    }
    if (first >= 'S' && first <= 'Z') {
        return "Europe";
    }
    if ((first >= '1' && first <= '5') || first == '7') {
        return "North America";
    }
    if (first == '6') {
        return "Oceania";
    }
    return first == '8' || first == '9' ? "South America" : "";
}

} // namespace velmora
