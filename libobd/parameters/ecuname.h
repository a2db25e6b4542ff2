#pragma once

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/vehicleinformation.h"

#include <map>
#include <string>

namespace obd {

// The module's own name (service 09, info type 0A): an acronym of up to 4 characters, and a text of up to 15.
class EcuName : public VehicleInformation
{
public:
    EcuName() : VehicleInformation(0x0A) {}

    unsigned int timeout() const override; // 2500 ms
    void clear() override;

    // Empty, with a log line, for a module that delivered none.
    std::string ecuAcronym(IEcu const& ecu) const;  // such as "ECM1"
    std::string description(IEcu const& ecu) const; // such as "EngineControl"

    // The acronym spelled out, such as "Engine Control Module1"; as it stands if it is none of SAE J1979.
    std::string fullDescription(IEcu const& ecu) const;

private:
    struct Name
    {
        std::string acronym;
        std::string text;
    };

    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    void store(unsigned int ecuId, ByteView field);

    std::map<unsigned int, Name> m_names; // by module id
};

} // namespace obd
