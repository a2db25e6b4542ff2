#include "libvelmora/car/caroffers.h"

#include "common/text/text.h"
#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/vehicle/pidtitles.h"
#include "libvelmora/vehicle/units.h"

#include <obd/iecu.h>
#include <obd/iecuservice.h>
#include <obd/sensorpids.h>

#include <algorithm>
#include <cmath>

namespace velmora {

namespace {

ModuleOffers::Service offeredService(obd::IEcu const& ecu, int number, obd::ObdMode mode)
{
    ModuleOffers::Service service{number, {}, toAnswer(ecu.detection(mode, 0))};
    for (unsigned char const id : ecu.supportedIds(mode, 0)) {
        if (!obd::isSupportMask(id)) {
            service.identifiers.push_back(id);
        }
    }
    return service;
}

// An end of the sensor's range, in whole numbers as the library gives it.
int shownEnd(obd::SensorDataModel const& sensor, int number, Units units)
{
    return static_cast<int>(std::lround(inUnits(shownNumber(sensor.uid, number), sensor.unit, units)));
}

ModuleOffers::Value offeredValue(obd::SensorDataModel const& sensor, Units units)
{
    ModuleOffers::Value value{sensor.uid, sensor.name, sensorUnit(sensor.uid, sensor.unit, units), {}, {}};
    if (sensor.numeric != nullptr) {
        value.minimum = shownEnd(sensor, sensor.numeric->minimum, units);
        value.maximum = shownEnd(sensor, sensor.numeric->maximum, units);
    }
    return value;
}

// What the library can show of the selected module.
std::vector<std::shared_ptr<obd::ParameterDataModel>> decodedParameters(obd::IEcuService& service)
{
    auto parameters = service.supportedParameters();
    auto const further = service.furtherParameters();
    parameters.insert(parameters.end(), further.begin(), further.end());
    return parameters;
}

ModuleOffers::LaterParameter laterParameter(unsigned char pid)
{
    ModuleOffers::LaterParameter later{pid, pidTitle(pid), {}};
    for (BuiltinPid const& each : builtinPids()) {
        if (each.pid == pid && isDecoded(each)) {
            later.values.push_back(
                {each.signal.id, each.signal.name, each.signal.unit, std::string(standingWord(each.standing))});
        }
    }
    return later;
}

void addParameters(ModuleOffers& offers, obd::IEcu const& ecu, Units units, bool all)
{
    auto const service = obd::EcuServiceBuilder::createEcuService();
    auto const decoded = decodedParameters(*service);
    for (auto const& parameter : decoded) {
        bool const offered = service->isParameterSupported(parameter);
        if (offered || all) {
            offers.parameters.push_back({static_cast<unsigned int>(parameter->id), parameter->name, offered, {}});
            for (auto const& sensor : parameter->sensors) {
                offers.parameters.back().values.push_back(offeredValue(*sensor, units));
            }
        }
    }
    for (unsigned char const pid : ecu.supportedIds(obd::ObdMode::CurrentData, 0)) {
        bool const known = std::any_of(decoded.begin(), decoded.end(),
                                       [pid](auto const& parameter) { return static_cast<int>(parameter->id) == pid; });
        if (pid > obd::lastListedPid && !obd::isSupportMask(pid) && !known) {
            offers.further.push_back(laterParameter(pid));
        }
    }
}

} // namespace

char const* sensorUnit(int uid, MeasurementUnit unit, Units units)
{
    return labelInUnits(unitLabel(uid, unit), unit, units);
}

std::vector<ModuleOffers> readOffers(Session& session, bool all)
{
    std::vector<ModuleOffers> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        ModuleOffers offers{ecu->id(), readable(ecu->name()), readable(ecu->description()), {}, {}, {}};
        offers.services = {offeredService(*ecu, 1, obd::ObdMode::CurrentData),
                           offeredService(*ecu, 6, obd::ObdMode::MonitorTests),
                           offeredService(*ecu, 8, obd::ObdMode::SystemControl),
                           offeredService(*ecu, 9, obd::ObdMode::VehicleInformation)};
        addParameters(offers, *ecu, session.units(), all);
        modules.push_back(std::move(offers));
    }
    return modules;
}

} // namespace velmora
