#pragma once

#include "libvelmora/report/vehiclereport.h"
#include "libvelmora/session/session.h"

namespace velmora {

// Asks adapter and control modules for all that a report holds, one module after another; each becomes the library's
// current one. Takes seconds. session must be connected. Throws Error if the link breaks or the user interrupts.
// maker: the one whose meanings the codes are given, or empty for that of the vehicle identification number.
VehicleReport readVehicle(Session& session, std::string const& maker = {});

// What the adapter says of itself, with the supply voltage that it measures.
AdapterReport readAdapter(Session& session);
// The bus that the vehicle was found on, as the opening found it.
ProtocolReport readProtocol(Session& session);

} // namespace velmora
