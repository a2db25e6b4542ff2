#pragma once

#include <systemd/sd-bus.h>

#include <string>

namespace velmora {

// What the signal PropertiesChanged of a device or a characteristic says.

// Whether it tells that the device is no longer connected.
bool tellsDisconnected(sd_bus_message* message);

// The new value of a characteristic; empty if the signal tells of none.
std::string changedValue(sd_bus_message* message);

} // namespace velmora
