#pragma once

namespace obd {

/// The units that values are told in.
enum class UnitSystem : int
{
    Metric = 0,
    Imperial = 1
};

} // namespace obd
