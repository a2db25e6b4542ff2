#include "libobd/service/ecuservice.h"

#include "libobd/dispatch/fetcher.h"
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
Value EcuService::fetchItem(Value (Item::*read)(std::shared_ptr<IEcu> const& ecu) const) const
{
    std::shared_ptr<IEcu> const module = connectedEcu();
    auto const item = std::make_shared<Item>();
    if (module == nullptr || !fetch(item)) {
        return {};
    }
    return ((*item).*read)(module);
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
    return fetchItem(&VehicleIdentificationNumber::vehicleIdentificationNumber);
}

bool EcuService::hasCalibrationIds()
{
    return isSupported(ObdMode::VehicleInformation, InfoCalibrationIds);
}

std::vector<std::string> EcuService::fetchCalibrationIds()
{
    return fetchItem(&CalibrationIds::calibrationIds);
}

bool EcuService::hasVerificationNumbers()
{
    return isSupported(ObdMode::VehicleInformation, InfoVerificationNumbers);
}

std::vector<std::string> EcuService::fetchVerificationNumbers()
{
    return fetchItem(&CalibrationVerificationNumbers::verificationNumbers);
}

bool EcuService::hasEngineSerialNumber()
{
    return isSupported(ObdMode::VehicleInformation, InfoEngineSerialNumber);
}

std::string EcuService::fetchEngineSerialNumber()
{
    return fetchItem(&EngineSerialNumber::engineSerialNumber);
}

bool EcuService::hasErotan()
{
    return isSupported(ObdMode::VehicleInformation, InfoErotan);
}

std::string EcuService::fetchErotan()
{
    return fetchItem(&Erotan::erotan);
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
