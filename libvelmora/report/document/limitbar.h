#pragma once

#include "libvelmora/report/document/document.h"

#include <string>

namespace velmora {

// The bar as an SVG picture for HTML: what lies between the limits is filled, the value is a stroke. Empty without
// limits.
std::string drawnBar(LimitBar const& bar);

} // namespace velmora
