#pragma once

#include <velmora/health.h>

#include <functional>

namespace velmora {

// How the one that feeds the outputs is. Any thread.
using HealthSource = std::function<Health()>;

} // namespace velmora
