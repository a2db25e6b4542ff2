#pragma once

#include "libobd/parameters/identificationnumberparser.h"
#include "libobd/parameters/vehicleinformation.h"

namespace obd {

// What the identification numbers of service 09 share. A module that delivered none has an empty number.
class IdentificationNumber : public VehicleInformation
{
public:
    unsigned int timeout() const override; // twice that of other queries: five lines on a slow bus
    void clear() override;

protected:
    explicit IdentificationNumber(unsigned char infoType);

    std::string number(std::shared_ptr<IEcu> const& ecu) const { return m_parser.number(*ecu); }

private:
    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;

    IdentificationNumberParser m_parser;
};

class VehicleIdentificationNumber : public IdentificationNumber
{
public:
    VehicleIdentificationNumber() : IdentificationNumber(0x02) {}
    std::string vehicleIdentificationNumber(std::shared_ptr<IEcu> const& ecu) const { return number(ecu); }
};

class EngineSerialNumber : public IdentificationNumber
{
public:
    EngineSerialNumber() : IdentificationNumber(0x0D) {}
    std::string engineSerialNumber(std::shared_ptr<IEcu> const& ecu) const { return number(ecu); }
};

// The exhaust regulation or type approval number.
class Erotan : public IdentificationNumber
{
public:
    Erotan() : IdentificationNumber(0x0F) {}
    std::string erotan(std::shared_ptr<IEcu> const& ecu) const { return number(ecu); }
};

} // namespace obd
