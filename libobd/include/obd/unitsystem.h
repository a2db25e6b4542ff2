#pragma once

namespace obd {

enum class UnitSystem : int
{
    Metric = 0,
    Imperial = 1
};

} // namespace obd
