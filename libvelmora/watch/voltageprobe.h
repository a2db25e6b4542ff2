#pragma once

#include "libvelmora/port/iport.h"

#include <chrono>
#include <memory>
#include <optional>
#include <string_view>

namespace velmora {

// Asks an adapter for the supply voltage and nothing else: no bring-up, so nothing goes to the vehicle. Nothing if it
// does not tell within the time. Throws Error (link lost) if the port breaks.
std::optional<double> probeVoltage(std::unique_ptr<IPort> port, std::chrono::milliseconds limit);

// "12.6V" somewhere in what an adapter said, in volts.
std::optional<double> findVolts(std::string_view text);

} // namespace velmora
