#include "libobd/connection/ecumanager.h"

#include "libobd/bytes/bytes.h"
#include "libobd/powertrain/consumptionchoice.h"

#include <common/logrecord.h>
#include <obd/iconnectionnotifier.h>
#include <obd/iecu.h>
#include <obd/iobdproxy.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterdescriptor.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorpids.h>

#include <algorithm>
#include <utility>

namespace obd {

namespace {

constexpr unsigned int priority = 0;

// The identifiers of service 01, with that of the freeze frame's trouble code, which some modules report in service 02
// alone, at its place.
std::vector<unsigned char> displayedIds(IEcu const& ecu)
{
    std::vector<unsigned char> ids = ecu.supportedIds(ObdMode::CurrentData, 0);
    if (std::find(ids.begin(), ids.end(), freezeFrameCodePid) != ids.end()) {
        return ids;
    }
    std::vector<unsigned char> const frame = ecu.supportedIds(ObdMode::FreezeFrame, 0);
    if (std::find(frame.begin(), frame.end(), freezeFrameCodePid) != frame.end()) {
        auto const above =
            std::find_if(ids.begin(), ids.end(), [](unsigned char id) { return id > freezeFrameCodePid; });
        if (above != ids.end()) {
            ids.insert(above, freezeFrameCodePid);
        }
    }
    return ids;
}

std::shared_ptr<PowertrainParameter> createParameter(ParameterFactory& factory, IEcu const& ecu, unsigned char id)
{
    ParameterIdentifier::Id const identifier = ParameterIdentifier(id).id();
    if (id == freezeFrameCodePid) {
        return factory.createFreezeFrameParameter(identifier, 0);
    }
    if (identifier == ParameterIdentifier::FuelConsumption) {
        return createConsumption(ecu, ecu.ignitionType(), {0.0, 0.0, 0.0}); // for its description alone
    }
    return factory.createParameter(identifier);
}

} // namespace

EcuManager::EcuManager(IConnectionNotifier& notifier, IObdProxy* proxy, IVelmoraSettings* settings)
    : m_notifier(notifier), m_proxy(proxy), m_settings(settings), m_unitSystem(settings->unitSystem())
{
    m_notifier.attach(priority, this);
    m_settings->attach(this);
}

EcuManager::~EcuManager()
{
    m_settings->detach(this);
    m_notifier.detach(priority, this);
}

std::shared_ptr<IEcu> EcuManager::getCurrentEcu()
{
    std::lock_guard const lock(m_mutex);
    return m_currentEcu;
}

void EcuManager::setCurrentEcu(unsigned int id)
{
    std::shared_ptr<IEcu> selected = find(id);
    {
        std::lock_guard const lock(m_mutex);
        m_currentEcu.swap(selected);
    }
    fire(EcuManagerEvent::CurrentEcuChanged);
}

void EcuManager::getEcuIds(std::vector<unsigned int>& ids)
{
    for (std::shared_ptr<IEcu> const& ecu : getEcus()) {
        ids.push_back(ecu->id());
    }
}

std::vector<std::shared_ptr<IEcu>> EcuManager::getEcus()
{
    std::lock_guard const lock(m_mutex);
    return m_ecus;
}

std::string EcuManager::getEcuName(unsigned int id)
{
    std::shared_ptr<IEcu> const ecu = find(id);
    return ecu != nullptr ? ecu->name() : std::string();
}

std::string EcuManager::getEcuDescription(unsigned int id)
{
    std::shared_ptr<IEcu> const ecu = find(id);
    return ecu != nullptr ? ecu->description() : std::string();
}

std::vector<std::shared_ptr<ParameterDescriptor>> EcuManager::getParameters(unsigned int id)
{
    ParameterFactory factory;
    std::vector<std::shared_ptr<ParameterDescriptor>> parameters;
    std::shared_ptr<IEcu> const ecu = find(id);
    if (ecu == nullptr) {
        return parameters;
    }
    UnitSystem const system = unitSystem();
    for (unsigned char const oid : displayedIds(*ecu)) {
        if ((oid & 0x1F) == 0) {
            continue; // the support masks are no parameters
        }
        if (std::shared_ptr<PowertrainParameter> const parameter = createParameter(factory, *ecu, oid)) {
            parameters.push_back(std::make_shared<ParameterDescriptor>(parameter, ecu, system));
        } else {
            TERVEX_LOG(Error) << "Failed to create sensor 0x" << lowerHex(oid);
        }
    }
    return parameters;
}

UnitSystem EcuManager::unitSystem()
{
    std::lock_guard const lock(m_mutex);
    return m_unitSystem;
}

std::shared_ptr<IEcu> EcuManager::find(unsigned int id)
{
    for (std::shared_ptr<IEcu> const& ecu : getEcus()) {
        if (ecu->id() == id) {
            return ecu;
        }
    }
    return nullptr;
}

void EcuManager::replace(std::vector<std::shared_ptr<IEcu>> ecus, std::shared_ptr<IEcu> current)
{
    {
        std::lock_guard const lock(m_mutex);
        m_ecus.swap(ecus);
        m_currentEcu.swap(current);
    }
    fire(EcuManagerEvent::EcuListChanged);
    fire(EcuManagerEvent::CurrentEcuChanged);
}

void EcuManager::onConnectionOpened()
{
    replace(m_proxy->ecus(), m_proxy->firstEcu());
}

void EcuManager::onConnectionClosed()
{
    replace({}, nullptr);
}

void EcuManager::onEvent(VelmoraSettingsEvent const& event)
{
    if (event == VelmoraSettingsEvent::UnitSystemChanged) {
        UnitSystem const system = m_settings->unitSystem();
        std::lock_guard const lock(m_mutex);
        m_unitSystem = system;
    }
}

} // namespace obd
