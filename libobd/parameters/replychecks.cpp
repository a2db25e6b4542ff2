#include "libobd/parameters/replychecks.h"

#include <common/logrecord.h>

namespace obd {

bool refuseLength(std::vector<unsigned char> const& data)
{
    TERVEX_LOG(Error) << "Invalid number of data bytes: " << data.size();
    return false;
}

bool refuse(char const* reason)
{
    TERVEX_LOG(Error) << reason;
    return false;
}

void logUnknownEcu(IEcu const& ecu)
{
    TERVEX_LOG(Error) << "invalid ECU id " << ecu.id();
}

} // namespace obd
