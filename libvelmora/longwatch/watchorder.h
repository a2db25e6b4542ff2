#pragma once

#include "libvelmora/watch/watchsettings.h"

#include <velmora/longwatch.h>

namespace velmora {

// What the options and their settings file say together: the options stand above the file, outputs come on top. Throws
// Error for what makes no sense, signal files that hold mistakes among it.
WatchSettings settingsOf(LongWatchOptions const& options);

} // namespace velmora
