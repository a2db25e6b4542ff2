#pragma once

#include <obd/obdprotocol.h>

namespace obd {

/// Whether a bus is CAN, on either length of identifiers.
inline bool isCan(ObdProtocol protocol)
{
    return protocol == ObdProtocolCan11 || protocol == ObdProtocolCan29;
}

/// Whether it is a legacy bus, whose frames hold at most 7 data bytes.
inline bool isLegacy(ObdProtocol protocol)
{
    return protocol == ObdProtocolIso9141 || protocol == ObdProtocolIso14230 || protocol == ObdProtocolJ1850;
}

} // namespace obd
