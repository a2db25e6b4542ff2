#pragma once

#include <cstddef>

namespace obdsim {

/// A vehicle file that the build has put into the library.
struct EmbeddedVehicle
{
    char const* name;
    char const* text;
};

/// All of them, by name; the source is made by embedvehicles.cmake.
extern const EmbeddedVehicle embeddedVehicles[];
extern const std::size_t embeddedVehicleCount;

} // namespace obdsim
