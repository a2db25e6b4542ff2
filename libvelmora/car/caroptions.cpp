#include "libvelmora/car/caroptions.h"

#include <obd/connectionprotocol.h>
#include <velmora/error.h>

namespace velmora {

SessionOptions sessionOptions(CarOptions const& options)
{
    SessionOptions result;
    result.port = options.port;
    result.baud = options.baud;
    if (options.protocol) {
        auto const protocol = static_cast<obd::VehicleProtocol>(*options.protocol);
        bool const search = protocol == obd::VehicleProtocol::Automatic;
        if (!search && obd::toObdProtocol(protocol) == obd::ObdProtocolUnknown) {
            throw Error(ErrorKind::WrongUse, "A protocol is a number from 1 to 9, or 0 to search for it");
        }
        result.protocol = protocol;
    }
    result.units = options.units;
    result.ecu = options.module;
    result.reset = options.reset;
    result.sleep = options.sleep;
    result.forget = options.forget;
    result.logFile = options.logFile;
    result.traceFile = options.traceFile;
    result.settingsFile = options.settingsFile;
    result.signalFiles = options.signalFiles;
    result.onProgress = options.onProgress;
    result.onDetail = options.onDetail;
    result.onPhase = options.onPhase;
    result.openPort = options.openPort;
    return result;
}

} // namespace velmora
