#pragma once

#include "simulator/adapter/settings.h"
#include "simulator/bus/frame.h"
#include "simulator/car/moduledata.h"

namespace obdsim {

/// What the PCI byte of a CAN frame tells (ISO 15765-2); it stands behind the address byte if addresses are extended.
bool isFirstFrame(Frame const& frame, bool extended);
bool isConsecutiveFrame(Frame const& frame, bool extended);

/// The consecutive frames that a first frame promises.
std::size_t promisedFrames(Frame const& frame, bool extended);

/// How many consecutive frames a module sends upon the flow control of the adapter for its first frame: it heeds only
/// what comes to its own identifier and address. An adapter answers a first frame once, so a block size ends the
/// message.
int allowedFrames(Protocol const& protocol, Settings const& settings, ModuleData const& module);

} // namespace obdsim
