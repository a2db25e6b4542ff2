#pragma once

namespace obd {

enum class IgnitionType : int
{
    Spark = 0,
    Compression = 1
};

} // namespace obd
