#include "libobd/module/ecu.h"

#include "libobd/bytes/bytes.h"
#include "libobd/powertrain/testequipmentconfiguration.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <algorithm>
#include <iterator>
#include <utility>

namespace obd {
namespace {

constexpr unsigned char firstFrame = 0;

std::shared_ptr<std::vector<unsigned char>> seededSet()
{
    return std::make_shared<std::vector<unsigned char>>(1, static_cast<unsigned char>(0));
}

bool holds(std::vector<unsigned char> const& set, unsigned char id)
{
    return std::find(set.begin(), set.end(), id) != set.end();
}

} // namespace

Ecu::Ecu(unsigned int id, ObdProtocol protocol, std::string protocolDescription, std::shared_ptr<IObdProxy> proxy)
    : m_id(id), m_protocol(protocol), m_protocolDescription(std::move(protocolDescription)), m_proxy(std::move(proxy)),
      m_testerConfiguration1(std::make_unique<TestEquipmentConfiguration1>(ObdMode::CurrentData, firstFrame)),
      m_testerConfiguration2(std::make_unique<TestEquipmentConfiguration2>(ObdMode::CurrentData, firstFrame)),
      m_mode01Oids(seededSet()), m_mode06Oids(seededSet()), m_mode08Oids(seededSet()), m_mode09Oids(seededSet())
{}

Ecu::~Ecu() = default;

std::shared_ptr<Ecu::OidSet> Ecu::getOids(ObdMode mode, unsigned char frame) const
{
    switch (mode) {
    case ObdMode::CurrentData:
        return m_mode01Oids;
    case ObdMode::MonitorTests:
        return m_mode06Oids;
    case ObdMode::SystemControl:
        return m_mode08Oids;
    case ObdMode::VehicleInformation:
        return m_mode09Oids;
    case ObdMode::FreezeFrame: {
        auto const found = m_mode02Oids.find(frame);
        if (found != m_mode02Oids.end()) {
            return found->second;
        }
        TERVEX_LOG(Fatal) << "NO Oids for MODE 02 frame " << static_cast<unsigned int>(frame);
        return nullptr;
    }
    default:
        return nullptr;
    }
}

bool Ecu::hasOid(ObdMode mode, unsigned char id, unsigned char frame) const
{
    std::lock_guard const lock(m_mutex);
    std::shared_ptr<OidSet> const set = getOids(mode, frame);
    return set != nullptr && holds(*set, id);
}

void Ecu::addSupportedId(ObdMode mode, unsigned char id)
{
    addSupportedOids(mode, 0, {id});
}

void Ecu::addSupportedOids(ObdMode mode, unsigned char frame, std::vector<unsigned char> const& ids)
{
    std::lock_guard const lock(m_mutex);
    if (std::shared_ptr<OidSet> const set = getOids(mode, frame)) {
        set->insert(set->end(), ids.begin(), ids.end());
    }
}

void Ecu::addSupportedTid(OxygenSensorLocation location, unsigned char tid)
{
    addSupportedTids(location, {tid});
}

void Ecu::addSupportedTids(OxygenSensorLocation location, std::vector<unsigned char> const& tids)
{
    std::lock_guard const lock(m_mutex);
    std::shared_ptr<OidSet>& set = m_mode05Tids[location];
    if (set == nullptr) {
        set = std::make_shared<OidSet>(tids);
    } else {
        set->insert(set->end(), tids.begin(), tids.end());
    }
}

void Ecu::logSupportedPids(ObdMode mode, unsigned char frame) const
{
    std::lock_guard const lock(m_mutex);
    std::shared_ptr<OidSet> const set = getOids(mode, frame);
    if (set == nullptr) {
        return;
    }
    std::string list;
    for (unsigned char const id : *set) {
        list += " 0x" + lowerHex(id) + ",";
    }
    tervex::TraceStream << "Supported 0" << static_cast<int>(mode) << " IDs for ECU 0x" << lowerHex(m_id) << " frame 0x"
                        << lowerHex(frame) << list;
}

std::vector<unsigned char> Ecu::supportedIds(ObdMode mode, unsigned char frame) const
{
    std::lock_guard const lock(m_mutex);
    std::shared_ptr<OidSet> const set = getOids(mode, frame);
    return set != nullptr ? *set : OidSet{};
}

bool Ecu::isSupported(ObdMode mode, unsigned char id, unsigned char frame) const
{
    return hasOid(mode, id, frame);
}

bool Ecu::isSupported(OxygenSensorLocation location, unsigned char tid) const
{
    return holds(supportedTids(location), tid);
}

std::vector<unsigned char> Ecu::supportedTids(OxygenSensorLocation location) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_mode05Tids.find(location);
    return found != m_mode05Tids.end() ? *found->second : OidSet{};
}

void Ecu::resetFreezeFrameConfiguration()
{
    std::lock_guard const lock(m_mutex);
    m_mode02Oids.clear();
}

ObdStandard Ecu::standard() const
{
    std::lock_guard const lock(m_mutex);
    return m_standard;
}

std::string Ecu::standardDescription() const
{
    std::lock_guard const lock(m_mutex);
    return m_standardDescription;
}

std::string Ecu::name() const
{
    std::lock_guard const lock(m_mutex);
    return m_name;
}

std::string Ecu::description() const
{
    std::lock_guard const lock(m_mutex);
    return m_description;
}

OxygenSensorBank Ecu::oxygenSensorBanks() const
{
    if (hasOid(ObdMode::CurrentData, 0x13, 0)) {
        return OxygenSensorBank::Pid13;
    }
    return hasOid(ObdMode::CurrentData, 0x1D, 0) ? OxygenSensorBank::Pid1D : OxygenSensorBank::None;
}

std::vector<OxygenSensorLocation> Ecu::oxygenSensorLocations() const
{
    std::lock_guard const lock(m_mutex);
    return m_oxygenSensorLocations;
}

unsigned int Ecu::equivalenceRatioMax() const
{
    return m_testerConfiguration1->equivalenceRatioMax(*this);
}

unsigned int Ecu::oxygenSensorVoltageMax() const
{
    return m_testerConfiguration1->oxygenSensorVoltageMax(*this);
}

unsigned int Ecu::oxygenSensorCurrentMax() const
{
    return m_testerConfiguration1->oxygenSensorCurrentMax(*this);
}

unsigned int Ecu::intakeManifoldAbsolutePressureMax() const
{
    return m_testerConfiguration1->intakeManifoldAbsolutePressureMax(*this);
}

double Ecu::airFlowRateMax() const
{
    return m_testerConfiguration2->airFlowRateMax(*this);
}

IgnitionType Ecu::ignitionType() const
{
    std::lock_guard const lock(m_mutex);
    return m_ignitionType;
}

} // namespace obd
