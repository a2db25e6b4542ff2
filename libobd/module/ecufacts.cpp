// What an Ecu finds out of its control module beside the supported sets: what scales and selects everything else.

#include "libobd/bytes/bytes.h"
#include "libobd/module/ecu.h"
#include "libobd/parameters/ecuname.h"
#include "libobd/parameters/supportedoids.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/lambdasource.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/oxygensensorspresent.h"
#include "libobd/powertrain/testequipmentconfiguration.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/protocolfamily.h>
#include <obd/sensorvalue.h>

#include <algorithm>
#include <numeric>

namespace obd {
namespace {

constexpr unsigned char ecuNameInfoType = 0x0A;
constexpr unsigned char standardTests = 10; // of an oxygen sensor in service 05 (SAE J1979)

bool succeeds(IQuery& query, std::shared_ptr<IObdProxy> const& proxy)
{
    return query.update(proxy) == IQuery::UpdateStatus::UpdateOk;
}

char const* traceOf(ConsumptionKind kind)
{
    switch (kind) {
    case ConsumptionKind::Diesel:
        return "Diesel consumption";
    case ConsumptionKind::GasMaf:
        return "Gas (maf) consumption";
    case ConsumptionKind::GasMap:
        return "Gas (map) consumption";
    case ConsumptionKind::None:
        break;
    }
    return "";
}

} // namespace

bool Ecu::isReported(PowertrainParameter const& parameter) const
{
    return hasOid(ObdMode::CurrentData, ParameterIdentifier(parameter.pid()).toOid(), 0);
}

void Ecu::detectModuleFacts()
{
    detectTesterConfiguration1();
    detectTesterConfiguration2();
    if (detectIgnitionType()) {
        addFuelConsumptionParameter();
    }
    addCustomParameters();
}

bool Ecu::detectTesterConfiguration1()
{
    return detectTesterConfiguration(*m_testerConfiguration1, 1);
}

bool Ecu::detectTesterConfiguration2()
{
    return detectTesterConfiguration(*m_testerConfiguration2, 2);
}

bool Ecu::detectTesterConfiguration(TestEquipmentConfiguration& configuration, int number)
{
    if (!isReported(configuration)) {
        tervex::TraceStream << "No tester " << number << " configuration";
        return true;
    }
    if (!succeeds(configuration, m_proxy)) {
        TERVEX_LOG(Error) << "Updating tester configuration " << number << " failed";
        return false;
    }
    return true;
}

bool Ecu::detectIgnitionType()
{
    MonitorStatus status;
    if (!isReported(status)) {
        return true;
    }
    if (!succeeds(status, m_proxy)) {
        return false;
    }
    IgnitionType const type = status.getIgnitionType(*this);
    std::lock_guard const lock(m_mutex);
    m_ignitionType = type;
    return true;
}

void Ecu::addFuelConsumptionParameter()
{
    ConsumptionKind const kind = chooseConsumption(*this, ignitionType());
    if (kind == ConsumptionKind::None) {
        return;
    }
    tervex::TraceStream << traceOf(kind);
    addSupportedId(ObdMode::CurrentData, ParameterIdentifier::FuelConsumption);
    tervex::TraceStream << lambdaSourceText(findLambdaSource(*this));
}

// Derived values then go through the services as if the vehicle had reported them.
void Ecu::addCustomParameters()
{
    addSupportedId(ObdMode::CurrentData, ParameterIdentifier::BatteryVoltage);
    addSupportedId(ObdMode::CurrentData, ParameterIdentifier::EnginePower);
    addSupportedId(ObdMode::CurrentData, ParameterIdentifier::Torque);
    if (BoostPressure::isValid(*this)) {
        addSupportedId(ObdMode::CurrentData, ParameterIdentifier::BoostPressure);
    }
}

bool Ecu::detectStandard()
{
    SaeStandard query(ObdMode::CurrentData, 0);
    if (!isReported(query) || !succeeds(query, m_proxy)) {
        return false;
    }
    ObdStandard const standard = query.standard(*this);
    std::vector<std::shared_ptr<SensorValue>> const values = query.values(*this, UnitSystem::Metric);
    std::lock_guard const lock(m_mutex);
    m_standard = standard;
    m_standardDescription = values.empty() ? std::string() : values.front()->textualValue();
    return true;
}

bool Ecu::detectOxygenSensors()
{
    switch (oxygenSensorBanks()) {
    case OxygenSensorBank::Pid13: {
        OxygenSensorsPresent13 query(ObdMode::CurrentData, 0);
        return updateEcuOxygenSensorLocations(query);
    }
    case OxygenSensorBank::Pid1D: {
        OxygenSensorsPresent1d query(ObdMode::CurrentData, 0);
        return updateEcuOxygenSensorLocations(query);
    }
    case OxygenSensorBank::None:
        break;
    }
    tervex::TraceStream << "No oxygen sensors banks";
    return true;
}

bool Ecu::updateEcuOxygenSensorLocations(OxygenSensorsPresent& query)
{
    if (!succeeds(query, m_proxy)) {
        TERVEX_LOG(Fatal) << "Failed to get supported O2 sensors";
        return false;
    }
    if (std::optional<std::vector<OxygenSensorLocation>> const locations = query.locations(*this)) {
        std::lock_guard const lock(m_mutex);
        m_oxygenSensorLocations = *locations;
    } else {
        tervex::TraceStream << "No oxygen sensors present";
    }
    return true;
}

void Ecu::setFuelTrimByteUsage()
{
    if (oxygenSensorBanks() == OxygenSensorBank::Pid1D && areAllPresentFor1D()) {
        FuelTrim::setByteBInUse(true);
    }
}

bool Ecu::areAllPresentFor1D() const
{
    using Location = OxygenSensorLocation;
    constexpr Location fourBanksOfTwo[] = {Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank2Sensor1,
                                           Location::Bank2Sensor2, Location::Bank3Sensor1, Location::Bank3Sensor2,
                                           Location::Bank4Sensor1, Location::Bank4Sensor2};
    std::vector<Location> const present = oxygenSensorLocations();
    return std::all_of(std::begin(fourBanksOfTwo), std::end(fourBanksOfTwo), [&present](Location location) {
        return std::find(present.begin(), present.end(), location) != present.end();
    });
}

// On CAN there is no service 05: service 06 has its results.
bool Ecu::detectMode05Configuration()
{
    if (isCan(m_protocol)) {
        return true;
    }
    bool result = true;
    for (OxygenSensorLocation const location : oxygenSensorLocations()) {
        result &= detectTestIdentifiers(location);
        std::string list;
        for (unsigned char const tid : supportedTids(location)) {
            list += " 0x" + lowerHex(tid);
        }
        tervex::TraceStream << "Supported 05 TIDS for ECU " << lowerHex(m_id) << " location "
                            << static_cast<int>(location) << list;
    }
    return result;
}

bool Ecu::detectTestIdentifiers(OxygenSensorLocation location)
{
    std::vector<unsigned char> found{0};
    bool const result = detectFirstTestIdentifiers(location, found);
    for (unsigned int base = rangeSize; base <= lastRange && std::find(found.begin(), found.end(), base) != found.end();
         base += rangeSize) {
        Service05Oids query(static_cast<unsigned char>(base), oxygenSensorByte(location));
        if (!succeeds(query, m_proxy)) {
            TERVEX_LOG(Fatal) << "Failed to get supported 05 TIDs 0x" << lowerHex(base + 1) << " - 0x"
                              << lowerHex(base + rangeSize);
            break;
        }
        for (unsigned char const value : query.oids(*this)) {
            auto const tid = static_cast<unsigned char>(value + base);
            addSupportedTid(location, tid);
            found.push_back(tid);
        }
    }
    return result;
}

// A module that reports no test at all has the ten of the standard.
bool Ecu::detectFirstTestIdentifiers(OxygenSensorLocation location, std::vector<unsigned char>& found)
{
    Service05Oids query(0, oxygenSensorByte(location));
    if (!succeeds(query, m_proxy)) {
        TERVEX_LOG(Fatal) << "Failed to get supported 05 TIDs 0x01 - 0x20";
        return false;
    }
    std::vector<unsigned char> tids = query.oids(*this);
    if (tids.empty()) {
        tervex::TraceStream << "No supported TIDs reported for ECU " << lowerHex(m_id);
        tids.resize(standardTests);
        std::iota(tids.begin(), tids.end(), static_cast<unsigned char>(1));
    } else {
        found.insert(found.end(), tids.begin(), tids.end());
    }
    addSupportedTids(location, tids);
    return true;
}

void Ecu::detectEcuName(unsigned int index)
{
    std::string name = "ECU#" + std::to_string(index + 1);
    std::string description = "Control Module 0x" + upperHex(m_id);
    EcuName query;
    bool const told = hasOid(ObdMode::VehicleInformation, ecuNameInfoType, 0) && succeeds(query, m_proxy) &&
                      query.delivered(*this); // the reply may be another module's
    if (told) {
        std::string const acronym = query.ecuAcronym(*this);
        name = acronym.empty() ? name : acronym;
        std::string const full = query.fullDescription(*this);
        std::string const text = full.empty() ? query.description(*this) : full;
        description = text.empty() ? description : text;
    }
    std::lock_guard const lock(m_mutex);
    m_name = name;
    m_description = description;
}

} // namespace obd
