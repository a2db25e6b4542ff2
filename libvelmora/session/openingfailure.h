#pragma once

#include "libvelmora/port/portaddress.h"
#include "libvelmora/session/openingwatch.h"

#include <velmora/error.h>

#include <optional>
#include <string>

// Why a connection did not come about, with advice that fits the kind of port.
namespace velmora::openingfailure {

// The adapter did not answer as one does, by what was seen of it. address is nothing for a transport of the
// application's own.
Error silentAdapter(std::string const& port, std::optional<PortAddress> const& address, OpeningWatch const& seen);

// The adapter had answered, and says nothing at all any more.
Error goneAdapter(std::string const& port, std::optional<PortAddress> const& address, OpeningWatch const& seen);

// Replies came, but without the headers that tell whose they are.
Error headersMissing(std::string const& adapter, std::string const& port);

// The adapter works, and no control module answers. trouble: the adapter's word for it; empty for none.
Error silentVehicle(std::string const& adapter, std::string const& port, std::string const& trouble);

// The adapter resets itself, again and again.
Error resettingAdapter(std::string const& port);

} // namespace velmora::openingfailure
