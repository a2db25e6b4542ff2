#pragma once

#include "libobd/service/ask.h"

#include <obd/iecuservice.h>
#include <obd/obdmode.h>

namespace obd {

// Holds no state of its own: each fetch asks with a parameter object that it makes.
class EcuService : public BaseService, public IEcuService
{
public:
    explicit EcuService(IObdVelmora const* obd, Following following = Following::AtOnce);

    std::vector<std::shared_ptr<ParameterDataModel>> supportedParameters() override;
    bool isParameterSupported(std::shared_ptr<ParameterDataModel> const& parameter) override;
    std::string standardDescription() override;
    std::string protocolDescription() override;
    std::string ecuName() override;
    std::string ecuDescription() override;
    bool hasVehicleIdentificationNumber() override;
    std::string fetchVehicleIdentificationNumber() override;
    bool hasCalibrationIds() override;
    std::vector<std::string> fetchCalibrationIds() override;
    bool hasVerificationNumbers() override;
    std::vector<std::string> fetchVerificationNumbers() override;
    bool hasEngineSerialNumber() override;
    std::string fetchEngineSerialNumber() override;
    bool hasErotan() override;
    std::string fetchErotan() override;
    std::vector<std::shared_ptr<ParameterDataModel>> furtherParameters() override;
    Outcome<std::string> askVehicleIdentificationNumber() override;
    Outcome<std::vector<std::string>> askCalibrationIds() override;
    Outcome<std::vector<std::string>> askVerificationNumbers() override;
    Outcome<std::string> askEngineSerialNumber() override;
    Outcome<std::string> askErotan() override;

private:
    bool isSupported(ObdMode mode, unsigned char id) const;
    // A text that the module tells without being asked; empty without one.
    std::string text(std::string (IEcu::*tell)() const) const;
    // Reads one item of service 09; read is the accessor of its value. With an info type only what the module offers.
    template <typename Item, typename Value>
    Outcome<Value> askItem(Value (Item::*read)(std::shared_ptr<IEcu> const& ecu) const,
                           std::optional<unsigned char> infoType = std::nullopt) const;
};

} // namespace obd
