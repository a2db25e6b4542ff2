#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"

#include <memory>

namespace velmora {

// Line protocol to a file, or to udp://HOST:PORT in datagrams of several lines. UDP gives no answer: what the network
// loses there is lost.
std::unique_ptr<IOutput> makeInfluxOutput(OutputAddress const& address);

} // namespace velmora
