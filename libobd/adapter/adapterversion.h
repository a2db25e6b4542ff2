#pragma once

#include <string>

namespace obd {

// An adapter's firmware version. Adapters that tell none are taken for 1.0. Aligned so that clang, too, keeps it in one
// atomic without a library of its own.
struct alignas(2 * sizeof(int)) AdapterVersion
{
    int majorNumber = 1;
    int minorNumber = 0; // its first digit only: 4 for "1.45"

    bool operator==(AdapterVersion const&) const = default;
    bool isAtLeast(AdapterVersion const& other) const
    {
        return majorNumber > other.majorNumber ||
               (majorNumber == other.majorNumber && minorNumber >= other.minorNumber);
    }
};

// Reads "v1.5", "1.30" or "v2.1a". What is missing or no number is 0.
AdapterVersion parseAdapterVersion(std::string word);

} // namespace obd
