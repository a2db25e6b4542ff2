#include "libobd/service/ecuservice.h"

#include "libobd/parameters/calibrationids.h"
#include "libobd/parameters/calibrationverificationnumbers.h"
#include "libobd/parameters/identificationnumber.h"
#include "libobd/service/builtservice.h"
#include "libobd/service/parametercatalogue.h"

#include <obd/iecu.h>

namespace obd {

namespace {

// Info types of service 09 (SAE J1979).
enum InfoType : unsigned char
{
    InfoVehicleIdentificationNumber = 0x02,
    InfoCalibrationIds = 0x04,
    InfoVerificationNumbers = 0x06,
    InfoEngineSerialNumber = 0x0D,
    InfoErotan = 0x0F,
};

} // namespace

EcuService::EcuService(IObdVelmora const* obd, Following following) : BaseService(obd, servicePriority, following) {}

bool EcuService::isSupported(ObdMode mode, unsigned char id) const
{
    std::shared_ptr<IEcu> const module = ecu();
    return module != nullptr && module->isSupported(mode, id, 0);
}

std::string EcuService::text(std::string (IEcu::*tell)() const) const
{
    std::shared_ptr<IEcu> const module = ecu();
    return module != nullptr ? ((*module).*tell)() : std::string();
}

template <typename Item, typename Value>
Outcome<Value> EcuService::askItem(Value (Item::*read)(std::shared_ptr<IEcu> const& ecu) const,
                                   std::optional<unsigned char> infoType) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const item = std::make_shared<Item>();
    std::optional<Needed> needed;
    if (infoType) {
        needed = Needed{ObdMode::VehicleInformation, *infoType};
    }
    return ask(*this, module, needed, item, [&] { return ((*item).*read)(module); });
}

std::vector<std::shared_ptr<ParameterDataModel>> EcuService::supportedParameters()
{
    std::shared_ptr<IEcu> const module = ecu();
    return module != nullptr ? describeAllParameters(module, unitSystem())
                             : std::vector<std::shared_ptr<ParameterDataModel>>();
}

bool EcuService::isParameterSupported(std::shared_ptr<ParameterDataModel> const& parameter)
{
    bool const isByte = parameter != nullptr && parameter->id >= 0 && parameter->id <= 0xFF;
    return isByte && isSupported(ObdMode::CurrentData, ParameterIdentifier(parameter->id).toOid());
}

std::string EcuService::standardDescription()
{
    return text(&IEcu::standardDescription);
}

std::string EcuService::protocolDescription()
{
    return text(&IEcu::protocolDescription);
}

std::string EcuService::ecuName()
{
    return text(&IEcu::name);
}

std::string EcuService::ecuDescription()
{
    return text(&IEcu::description);
}

bool EcuService::hasVehicleIdentificationNumber()
{
    return isSupported(ObdMode::VehicleInformation, InfoVehicleIdentificationNumber);
}

std::string EcuService::fetchVehicleIdentificationNumber()
{
    return askItem(&VehicleIdentificationNumber::vehicleIdentificationNumber).value;
}

bool EcuService::hasCalibrationIds()
{
    return isSupported(ObdMode::VehicleInformation, InfoCalibrationIds);
}

std::vector<std::string> EcuService::fetchCalibrationIds()
{
    return askItem(&CalibrationIds::calibrationIds).value;
}

bool EcuService::hasVerificationNumbers()
{
    return isSupported(ObdMode::VehicleInformation, InfoVerificationNumbers);
}

std::vector<std::string> EcuService::fetchVerificationNumbers()
{
    return askItem(&CalibrationVerificationNumbers::verificationNumbers).value;
}

bool EcuService::hasEngineSerialNumber()
{
    return isSupported(ObdMode::VehicleInformation, InfoEngineSerialNumber);
}

std::string EcuService::fetchEngineSerialNumber()
{
    return askItem(&EngineSerialNumber::engineSerialNumber).value;
}

bool EcuService::hasErotan()
{
    return isSupported(ObdMode::VehicleInformation, InfoErotan);
}

std::string EcuService::fetchErotan()
{
    return askItem(&Erotan::erotan).value;
}

Outcome<std::string> EcuService::askVehicleIdentificationNumber()
{
    return askItem(&VehicleIdentificationNumber::vehicleIdentificationNumber, InfoVehicleIdentificationNumber);
}

Outcome<std::vector<std::string>> EcuService::askCalibrationIds()
{
    return askItem(&CalibrationIds::calibrationIds, InfoCalibrationIds);
}

Outcome<std::vector<std::string>> EcuService::askVerificationNumbers()
{
    return askItem(&CalibrationVerificationNumbers::verificationNumbers, InfoVerificationNumbers);
}

Outcome<std::string> EcuService::askEngineSerialNumber()
{
    return askItem(&EngineSerialNumber::engineSerialNumber, InfoEngineSerialNumber);
}

Outcome<std::string> EcuService::askErotan()
{
    return askItem(&Erotan::erotan, InfoErotan);
}

std::vector<std::shared_ptr<ParameterDataModel>> EcuService::furtherParameters()
{
    std::shared_ptr<IEcu> const module = ecu();
    return module != nullptr ? describeFurtherParameters(module, unitSystem())
                             : std::vector<std::shared_ptr<ParameterDataModel>>();
}

std::shared_ptr<IEcuService> EcuServiceBuilder::createEcuService()
{
    return buildService<EcuService>();
}

} // namespace obd
