#pragma once

namespace obd {

/// The bus family of a connection, which decides how replies are framed.
enum ObdProtocol : int
{
    ObdProtocolIso9141 = 0,  ///< ISO 9141-2
    ObdProtocolIso14230 = 1, ///< ISO 14230-4 (KWP 2000), both initialisations
    ObdProtocolJ1850 = 2,    ///< SAE J1850, PWM and VPW
    ObdProtocolCan11 = 3,    ///< ISO 15765-4, 11 bit identifiers, both speeds
    ObdProtocolCan29 = 4,    ///< ISO 15765-4, 29 bit identifiers, both speeds
    ObdProtocolUnknown = 5,  ///< no protocol known, or no device
};

} // namespace obd
