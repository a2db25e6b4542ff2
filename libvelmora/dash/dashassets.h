#pragma once

#include <cstddef>
#include <span>

namespace velmora {

// A file of the page, as the build has put it into the program.
struct DashAsset
{
    char const* name;
    unsigned char const* packed; // by gzip
    std::size_t packedSize;
    unsigned char const* plain;
    std::size_t plainSize;
};

std::span<DashAsset const> dashAssets();

} // namespace velmora
