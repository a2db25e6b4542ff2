#pragma once

#include "libobd/parameters/fixedrequestparameter.h"

namespace obd {

// Of a CAN reply of service 09: service, info type, number of items.
inline constexpr std::size_t infoHeaderLength = 3;

// An item of service 09 (SAE J1979), kept by control module. On CAN a reply comes assembled, on the legacy buses as
// numbered lines; see SaeLines.
class VehicleInformation : public FixedRequestParameter
{
protected:
    explicit VehicleInformation(unsigned char infoType) : FixedRequestParameter({0x09, infoType}) {}

    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;

    // Bytes of checksum behind each line of a legacy reply, judged by its size: 0 or 1. Lines may have been lost. A
    // reply that has the size of no lines at all is taken to have checksums.
    std::size_t guessChecksumLength(std::vector<unsigned char> const& data) const;

private:
    virtual bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) = 0;
    virtual bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) = 0;
};

} // namespace obd
