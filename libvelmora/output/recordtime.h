#pragma once

#include "libvelmora/output/record.h"

namespace velmora {

// When a record was made; of a trip, when it had ended.
WallTime timeOf(Record const& record);

// The same with all its times moved.
Record shifted(Record record, std::chrono::milliseconds step);

} // namespace velmora
