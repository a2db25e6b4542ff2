#pragma once

#include "libvelmora/port/portaddress.h"
#include "libvelmora/session/openingwatch.h"

#include <velmora/error.h>

#include <string>

// Why a connection did not come about, with advice that fits the kind of port.
namespace velmora::openingfailure {

// The adapter did not answer as one does, by what was seen of it.
Error silentAdapter(PortAddress const& address, OpeningWatch const& seen);

// Replies came, but without the headers that tell whose they are.
Error headersMissing(std::string const& adapter, PortAddress const& address);

} // namespace velmora::openingfailure
