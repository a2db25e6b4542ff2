#include "libvelmora/session/sessionoptions.h"

#include <obd/connectionprotocol.h>
#include <velmora/error.h>

#include <utility>

namespace velmora {

SessionOptions::SessionOptions(CarOptions options) : CarOptions(std::move(options))
{
    bool const search = !protocol || *protocol == static_cast<int>(obd::VehicleProtocol::Automatic);
    if (!search && obd::toObdProtocol(static_cast<obd::VehicleProtocol>(*protocol)) == obd::ObdProtocolUnknown) {
        throw Error(ErrorKind::WrongUse, "A protocol is a number from 1 to 9, or 0 to search for it");
    }
}

} // namespace velmora
