#pragma once

#include "libvelmora/report/moduletopic.h"

#include <velmora/actions.h>

namespace velmora {

// "cleared", "refused", "no answer" or "the reply can't be read".
char const* resultWord(ClearReport::Result result);

Json toJsonValue(ClearReport const& report);

} // namespace velmora
