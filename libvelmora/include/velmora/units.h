#pragma once

namespace velmora {

/// The units that values are told in.
enum class Units : int
{
    Metric,
    Imperial,   ///< with gallons of the US, 3.785 l
    ImperialUk, ///< with gallons of the United Kingdom, 4.546 l
};

} // namespace velmora
