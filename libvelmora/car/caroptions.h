#pragma once

#include "libvelmora/session/sessionoptions.h"

#include <velmora/caroptions.h>

namespace velmora {

// What a car's session is to use. Throws Error for what makes no sense.
SessionOptions sessionOptions(CarOptions const& options);

} // namespace velmora
