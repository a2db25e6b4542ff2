// What an Ecu finds out of its control module beside the supported sets: what scales and selects everything else.

#include "libobd/bytes/bytes.h"
#include "libobd/module/ecu.h"
#include "libobd/parameters/ecuname.h"
#include "libobd/powertrain/boostpressure.h"
#include "libobd/powertrain/codedparameters.h"
#include "libobd/powertrain/consumptionchoice.h"
#include "libobd/powertrain/monitorstatus.h"
#include "libobd/powertrain/testequipmentconfiguration.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/sensorvalue.h>

namespace obd {
namespace {

constexpr unsigned char ecuNameInfoType = 0x0A;

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

bool Ecu::succeeds(IQuery& query) const
{
    return query.update(m_proxy) == IQuery::UpdateStatus::UpdateOk;
}

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
    if (!succeeds(configuration)) {
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
    if (!succeeds(status)) {
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
    if (!isReported(query) || !succeeds(query)) {
        return false;
    }
    ObdStandard const standard = query.standard(*this);
    std::vector<std::shared_ptr<SensorValue>> const values = query.values(*this, UnitSystem::Metric);
    std::lock_guard const lock(m_mutex);
    m_standard = standard;
    m_standardDescription = values.empty() ? std::string() : values.front()->textualValue();
    return true;
}

void Ecu::detectEcuName(unsigned int index)
{
    std::string name = "ECU#" + std::to_string(index + 1);
    std::string description = "Control Module 0x" + upperHex(m_id);
    EcuName query;
    bool const told = hasOid(ObdMode::VehicleInformation, ecuNameInfoType, 0) && succeeds(query) &&
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
