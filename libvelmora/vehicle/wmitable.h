#pragma once

#include <velmora/vin.h>

#include <cstdint>
#include <string_view>

namespace velmora {

// What the first three characters of a vehicle identification number stand for.
struct WmiRow
{
    using Basis = VinFacts::CodesBasis;
    using Standing = VinFacts::Standing;

    enum class Make : std::uint8_t
    {
        Light,
        Heavy, // trucks, buses, motorcycles: the rule of the model year does not hold for them
    };

    std::string_view wmi;
    std::string_view maker;
    std::string_view country; // empty where it is not known
    std::string_view codes;   // a maker of the trouble code catalogue, or empty
    Basis basis;
    Standing standing;
    Make make;
};

// The row of an identifier of three capital letters and digits, else that of its first two characters. Null if there is
// none. An identifier that ends in 9 is shared by small makers, and has none.
WmiRow const* findWmi(std::string_view wmi);

// The country of an identifier; empty where it is not known.
std::string_view countryOfWmi(std::string_view wmi);

// The region of an identifier, by its first character; empty for one that is not given out.
std::string_view regionOfWmi(std::string_view wmi);

} // namespace velmora
