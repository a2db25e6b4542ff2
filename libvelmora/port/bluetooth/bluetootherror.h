#pragma once

#include <velmora/error.h>

#include <string>

namespace velmora {

// What an errno of a classic connection means to the user, and what to try.
Error rfcommError(std::string const& mac, int error);

// The same for an error of the system's Bluetooth service: its D-Bus name, and its text, whose words differ between
// versions.
Error bluezError(std::string const& doing, std::string const& name, std::string const& text);

// There is no system bus, or this program was built without it.
Error noBusError(std::string const& what, std::string const& why);

} // namespace velmora
