#pragma once

#include "libobd/parameters/vehicleinformation.h"

#include <map>
#include <string>

namespace obd {

// The checksums of the calibrations in a module (service 09, info type 06), as eight upper-case hexadecimal digits
// each. A further reply of the same module is appended.
class CalibrationVerificationNumbers : public VehicleInformation
{
public:
    CalibrationVerificationNumbers() : VehicleInformation(0x06) {}

    void clear() override;

    // Empty for a module that delivered none.
    std::vector<std::string> verificationNumbers(std::shared_ptr<IEcu> const& ecu) const;

private:
    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;

    std::map<unsigned int, std::vector<std::string>> m_numbers; // by module id
};

} // namespace obd
