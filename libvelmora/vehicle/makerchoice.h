#pragma once

#include <string>
#include <vector>

namespace velmora {

// Whose meanings a vehicle's trouble codes are read with.
struct MakerChoice
{
    enum class By
    {
        Nothing,
        Option, // the user named the maker
        Vin,    // the vehicle identification number tells it, and its control modules are known to follow that list
        Guess,  // the number tells a related maker, which is only offered
    };

    By by = By::Nothing;
    std::string maker; // as the trouble code catalogue writes it

    // The maker whose meanings hold; empty for nobody.
    std::string const& holding() const;
};

// named: the maker that the user chose, or empty. vins: what the control modules told, in any form; the first that is a
// vehicle identification number counts.
MakerChoice chooseMaker(std::string const& named, std::vector<std::string> const& vins);

} // namespace velmora
