#include "libvelmora/vehicle/makerchoice.h"

#include "libvelmora/vehicle/vin.h"
#include "libvelmora/vehicle/wmitable.h"

#include <algorithm>

namespace velmora {

std::string const& MakerChoice::holding() const
{
    static std::string const nobody;
    return by == By::Option || by == By::Vin ? maker : nobody;
}

MakerChoice chooseMaker(std::string const& named, std::vector<std::string> const& vins)
{
    if (!named.empty()) {
        return {MakerChoice::By::Option, named};
    }
    auto const vin = std::find_if(vins.begin(), vins.end(), [](std::string const& text) { return isVin(text); });
    WmiRow const* const row = vin != vins.end() ? findWmi(vin->substr(0, 3)) : nullptr;
    if (row == nullptr || row->basis == WmiRow::Basis::None) {
        return {};
    }
    return {row->basis == WmiRow::Basis::Fact ? MakerChoice::By::Vin : MakerChoice::By::Guess, std::string(row->codes)};
}

} // namespace velmora
