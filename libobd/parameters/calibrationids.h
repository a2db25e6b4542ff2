#pragma once

#include "libobd/parameters/vehicleinformation.h"

#include <map>
#include <string>

namespace obd {

class SaeLines;

// The names of the software and calibrations in a module (service 09, info type 04), up to 16 characters each. A
// further reply of the same module is appended; a reply that breaks off keeps what came before, and one on a legacy bus
// that lost a line gives the items that came whole.
class CalibrationIds : public VehicleInformation
{
public:
    CalibrationIds() : VehicleInformation(0x04) {}

    void clear() override;

    // Empty for a module that delivered none.
    std::vector<std::string> calibrationIds(std::shared_ptr<IEcu> const& ecu) const;

private:
    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool readWholeItems(unsigned int ecuId, SaeLines const& lines);

    std::map<unsigned int, std::vector<std::string>> m_ids; // by module id
};

} // namespace obd
