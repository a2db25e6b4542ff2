#include "libobd/connection/settingskeys.h"

namespace obd::settings {

int readInt(ISettings& store, IntKey const& key)
{
    int value = key.fallback;
    bool const found = store.getInt(key.key, value);
    return found && value >= key.lowest && value <= key.highest ? value : key.fallback;
}

} // namespace obd::settings
