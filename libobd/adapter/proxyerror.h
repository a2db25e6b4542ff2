#pragma once

#include <vector>

namespace obd {

// The adapter's error messages. 1 is reserved: no message has it.
enum class ProxyError : int
{
    NoData = 0,
    BufferFull = 2,
    BusBusy = 3,
    BusError = 4,
    CanError = 5,
    DataError = 6,
    GenericError = 7, // any other word with "ERR", such as "ERR94"
    FbError = 8,
    LvReset = 9,
    RxError = 10,
    Stopped = 11,
    UnableToConnect = 12,
    None = 13,
};

// The error message that a reply holds anywhere, good data beside it or not. Blanks and letter case make no difference,
// and the search notice "SEARCHING..." is none. Of several messages the first in the order of search counts, not the
// first in the reply.
ProxyError checkForErrors(std::vector<unsigned char> const& reply);

// Whether the message tells that a reply came damaged or was cut off, on the bus or by a fault of the adapter. The
// others tell that nothing came, or that the request did not get onto the bus: "BUS INIT: ...ERROR" is one of them.
bool isReplyLost(std::vector<unsigned char> const& reply);

} // namespace obd
