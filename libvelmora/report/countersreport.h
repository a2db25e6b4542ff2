#pragma once

#include "libvelmora/report/moduletopic.h"

#include <string>
#include <vector>

namespace velmora {

Json toJsonValue(CountersReport const& report);

} // namespace velmora
