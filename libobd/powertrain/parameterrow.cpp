#include "libobd/powertrain/parameterrow.h"

namespace obd {

std::optional<std::uint32_t> readField(std::vector<unsigned char> const& payload, Field field)
{
    if (payload.size() < field.end()) {
        return std::nullopt;
    }
    std::uint32_t raw = 0;
    for (std::size_t i = field.offset; i < field.end(); ++i) {
        raw = raw << 8U | payload[i];
    }
    return raw;
}

} // namespace obd
