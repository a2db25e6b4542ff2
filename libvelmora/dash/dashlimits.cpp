#include "libvelmora/dash/dashlimits.h"

#include "libvelmora/read/sensorlimits.h"
#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

namespace velmora {

Json dashLimits(std::filesystem::path const& settings)
{
    Json limits = Json::object();
    if (settings.empty()) {
        return limits;
    }
    try {
        SettingsStore store(settings);
        for (std::string const& sensor : limitedSensors(store)) {
            SensorLimit const limit = limitOf(store, sensor);
            if (limit != SensorLimit()) {
                limits[sensor] = Json::array({valueOrNull(limit.lowest), valueOrNull(limit.highest)});
            }
        }
    } catch (Error const& /*unreadable*/) {
        return Json::object();
    }
    return limits;
}

} // namespace velmora
