#pragma once

#include "libvelmora/vehicle/wmitable.h"

#include <cstdint>
#include <string>
#include <vector>

namespace velmora {

// What a vehicle identification number says by the standards alone (ISO 3779, ISO 3780, 49 CFR 565). Empty texts are
// not known.
struct VinFacts
{
    enum class CheckDigit : std::uint8_t
    {
        Right,
        Wrong,     // where one is obligatory: mistyped or altered
        NotJudged, // not used by this maker or market, or used and not obligatory
    };

    // What the model years stand on.
    enum class YearBasis : std::uint8_t
    {
        None,     // the place holds no year
        Position, // North America's rule: position 7 tells which round of thirty years it is
        Perhaps,  // as far as this maker codes the model year in that place
    };

    std::string vin; // 17 capital letters and digits
    std::string region;
    std::string country;
    std::string maker;
    bool smallMaker = false; // one of those that share an identifier ending in 9
    WmiRow::Standing standing = WmiRow::Standing::Probable;
    std::string codes; // the list of the trouble code catalogue
    WmiRow::Basis basis = WmiRow::Basis::None;
    std::vector<int> years; // rising; two where the number leaves the round open
    YearBasis yearBasis = YearBasis::None;
    CheckDigit checkDigit = CheckDigit::NotJudged;
    char computedCheck = '0'; // what position 9 would have to be
};

// Whether the text is a vehicle identification number in the standard's form: 17 capital letters and digits without I,
// O and Q.
bool isVin(std::string const& text);

// The number in the standard's form from one that was typed: any case, with blanks and hyphens. Throws Error that tells
// what is wrong.
std::string parseVin(std::string const& text);

// vin must be one. thisYear: no model year lies more than a year behind it.
VinFacts decodeVin(std::string const& vin, int thisYear);

} // namespace velmora
