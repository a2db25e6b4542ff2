#pragma once

#include "libvelmora/port/openingstop.h"

#include <functional>
#include <string>

namespace velmora {

// Pairs this computer with a Bluetooth device: answers its question for a PIN with 1234, then 0000, which adapters
// have, and confirms what modern ones ask; then trusts it. tell gets each step as a line. Paired already is no error.
// Throws Error.
void pairDevice(std::string const& mac, std::function<void(std::string const& line)> const& tell,
                OpeningStop const& stop);

} // namespace velmora
