#pragma once

namespace obd {

/// The adapter's protocol numbers, those of its "set protocol" command. 0 lets the adapter search.
enum class VehicleProtocol : int
{
    Automatic = 0,
    SaeJ1850Pwm = 1,  ///< 41.6 kbaud
    SaeJ1850Vpw = 2,  ///< 10.4 kbaud
    Iso9141 = 3,      ///< 5 baud init, 10.4 kbaud
    Iso14230Slow = 4, ///< 5 baud init, 10.4 kbaud
    Iso14230Fast = 5, ///< fast init, 10.4 kbaud
    Iso15765Can11Bit500 = 6,
    Iso15765Can29Bit500 = 7,
    Iso15765Can11Bit250 = 8,
    Iso15765Can29Bit250 = 9,
};

} // namespace obd
