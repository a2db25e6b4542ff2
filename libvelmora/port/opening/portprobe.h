#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/port/openingstop.h"

#include <memory>

namespace velmora {

// Asks an open port who is there, within some seconds: with "ATI" and a carriage return, which nothing takes harm from.
// Whether an adapter answered, by its prompt. The port is closed.
bool answersAsAdapter(std::unique_ptr<IPort> port, OpeningStop const& stop);

} // namespace velmora
