#pragma once

#include "libvelmora/signal/signal.h"

#include <cstddef>
#include <vector>

namespace velmora {

// The signals, by index and rising, whose formula reads what can't be known among these: a signal that is not here or
// has no formula, or itself in a circle; and those that read such a one. Costs as much as the formulas are long,
// however they refer to each other.
std::vector<std::size_t> brokenReferences(std::vector<Signal> const& signals);

} // namespace velmora
