#pragma once

namespace obd {

/// How the engine lights its fuel.
enum class IgnitionType : int
{
    Spark = 0,
    Compression = 1
};

} // namespace obd
