#include "libvelmora/poll/vehiclepoll.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
#include <obd/iecuservice.h>
#include <obd/iobdvelmora.h>
#include <obd/isensorservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/vehiclemodelyear.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// The year of the vehicle, 0 where it tells none.
int modelYear()
{
    return obd::GetVehicleModelYear(obd::EcuServiceBuilder::createEcuService()->fetchVehicleIdentificationNumber());
}

std::vector<PollSource> makeSources(std::vector<PollChoice> const& choices, obd::IVelmoraSettings const& settings)
{
    std::vector<PollSource> sources;
    for (PollChoice const& choice : choices) {
        if (auto parameter = obd::ParameterFactory().createParameter(*choice.ecu, settings, choice.id)) {
            sources.push_back({choice.ecu, std::move(parameter), choice.hertz});
        }
    }
    return sources;
}

} // namespace

std::vector<ModuleOffer> moduleOffers(obd::IObdVelmora const& obd, std::vector<unsigned int> const& meant)
{
    obd::IEcuManager& manager = *obd.getEcuManager();
    std::shared_ptr<obd::IEcu> const current = manager.getCurrentEcu();
    std::vector<ModuleOffer> offers;
    for (std::shared_ptr<obd::IEcu> const& ecu : manager.getEcus()) {
        // What a module offers is told by the service, which works with the current one.
        manager.setCurrentEcu(ecu->id());
        bool const isMeant =
            meant.empty() ? ecu == current : std::find(meant.begin(), meant.end(), ecu->id()) != meant.end();
        offers.push_back({ecu, offeredSensors(*obd::SensorServiceBuilder::createSensorService()), isMeant});
    }
    if (current != nullptr) {
        manager.setCurrentEcu(current->id());
    }
    return offers;
}

std::unique_ptr<Poller> pollVehicle(obd::IObdVelmora const& obd, std::vector<PollChoice> const& choices,
                                    PollWill const& will, Units units, PollCycle::Sink sink, IChannelControl* channel,
                                    std::vector<PollSource> const& guests)
{
    std::shared_ptr<obd::IObdProxy> const proxy = obd.getConnectionManager()->getProxy();
    obd::IVelmoraSettings const& settings = *obd.getSettings();
    obd::ObdProtocol const protocol = proxy->protocol();
    PollPace const pace = choosePace(will, protocol, protocol == obd::ObdProtocolJ1850 ? modelYear() : 0);
    std::vector<PollSource> sources = makeSources(choices, settings);
    sources.insert(sources.end(), guests.begin(), guests.end());
    return std::make_unique<Poller>(proxy, sources, pace, units, std::move(sink), channel);
}

} // namespace velmora
