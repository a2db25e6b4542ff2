#pragma once

#include <velmora/export.h>

#include <cstdint>
#include <string>
#include <vector>

namespace obd {
class IObdProxy;
}

namespace velmora {

/// What a vehicle identification number says by the standards alone (ISO 3779, ISO 3780, 49 CFR 565). Empty texts are
/// not known.
struct VinFacts
{
    /// What position 9 says where it is a check digit.
    enum class CheckDigit : std::uint8_t
    {
        Right,
        Wrong,     ///< where one is obligatory: mistyped or altered
        NotJudged, ///< not used by this maker or market, or used and not obligatory
    };

    /// What the model years stand on.
    enum class YearBasis : std::uint8_t
    {
        None,     ///< the place holds no year
        Position, ///< North America's rule: position 7 tells which round of thirty years it is
        Perhaps,  ///< as far as this maker codes the model year in that place
    };

    /// How sure the maker is.
    enum class Standing : std::uint8_t
    {
        Probable,
        Listed, ///< in a regulator's list, or in several public ones
    };

    /// How the maker's trouble codes are read with a list of the catalogue.
    enum class CodesBasis : std::uint8_t
    {
        None,  ///< the catalogue has no list for this maker
        Guess, ///< the list of a related maker or engine
        Fact,  ///< the maker's own list, or that of the same control modules
    };

    std::string vin;                               ///< 17 capital letters and digits
    std::string region;                            ///< "Europe"
    std::string country;                           ///< "Germany"
    std::string maker;                             ///< "Volkswagen"
    bool smallMaker = false;                       ///< one of those that share an identifier ending in 9
    Standing standing = Standing::Probable;        ///< of the maker
    std::string codes;                             ///< the list of the trouble code catalogue
    CodesBasis basis = CodesBasis::None;           ///< of that list
    std::vector<int> years;                        ///< rising; two where the number leaves the round open
    YearBasis yearBasis = YearBasis::None;         ///< of the years
    CheckDigit checkDigit = CheckDigit::NotJudged; ///< what position 9 says
    char computedCheck = '0';                      ///< what position 9 would have to be
};

/// What a vehicle identification number says, from one that was typed: any case, with blanks and hyphens. Throws Error
/// that tells what is wrong with it. Any thread.
VELMORA_EXPORT VinFacts explainVin(std::string const& text);

/// What a vehicle's own things are kept under: it tells vehicles apart, and nobody the number.
VELMORA_EXPORT std::string vehicleKey(std::string const& vin);
/// The number that a vehicle tells by service 09, for who works with the core: of the first module that tells one;
/// empty if none does.
VELMORA_EXPORT std::string vehicleVin(obd::IObdProxy& proxy);

} // namespace velmora
