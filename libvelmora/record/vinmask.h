#pragma once

#include "simulator/dialogue.h"

namespace velmora {

// Puts zeros in place of the last six characters of each vehicle identification number (service 09, 02) in a dialogue
// with headers on, and mends the check bytes. A reply that holds one in a form that isn't known is replaced by NO DATA.
// dialogue.protocol must be the adapter's number of the bus.
void maskVins(obdsim::Dialogue& dialogue);

} // namespace velmora
