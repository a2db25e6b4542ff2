#include "libvelmora/car/sessionend.h"

#include <obd/library.h>

namespace velmora {

void tellUnwritten(Session const& session, CarOptions const& options)
{
    if (!options.onUnwritten) {
        return;
    }
    if (std::string const file = session.failedTrace(); !file.empty()) {
        options.onUnwritten(file);
    }
    if (!options.logFile.empty() && obd::LIBOBDLogFailed()) {
        options.onUnwritten(options.logFile);
    }
}

} // namespace velmora
