#include "libobd/parameters/vehicleinformation.h"

#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>
#include <obd/protocolfamily.h>

namespace obd {

bool VehicleInformation::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    return isCan(ecu->protocol()) ? fromCanSystem(ecu->id(), data) : fromSaeSystem(ecu->id(), data);
}

std::size_t VehicleInformation::guessChecksumLength(std::vector<unsigned char> const& data) const
{
    bool const mayBePlain = data.size() % SaeLines::lineLength == 0;
    bool const mayBeChecked = data.size() % (SaeLines::lineLength + 1) == 0;
    // Seven lines with checksums are as long as eight without: there the beginnings of the lines decide.
    bool const plain = mayBePlain && (!mayBeChecked || verifySaeSignatures(data, 0));
    TERVEX_LOG(Debug) << (plain ? "No checksum in use" : "Checksum in use");
    return plain ? 0 : 1;
}

} // namespace obd
