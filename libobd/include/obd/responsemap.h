#pragma once

#include <map>
#include <vector>

namespace obd {

/// The reply to one request: payload bytes, free of bus framing, by control module id in rising order. The id is the
/// CAN identifier of the reply, or on the other buses the source address, the third header byte.
using ResponseMap = std::map<unsigned int, std::vector<unsigned char>>;

} // namespace obd
