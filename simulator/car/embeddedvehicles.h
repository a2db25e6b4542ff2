#pragma once

#include <cstddef>

namespace obdsim {

/// A vehicle file that the build has put into the library.
struct EmbeddedVehicle
{
    const char* name;
    const char* text;
};

/// All of them, by name; the source is made by embedvehicles.cmake.
extern const EmbeddedVehicle embeddedVehicles[];
extern const std::size_t embeddedVehicleCount;

} // namespace obdsim
