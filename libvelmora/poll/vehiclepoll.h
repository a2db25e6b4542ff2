#pragma once

#include "libvelmora/poll/pollchoice.h"
#include "libvelmora/poll/poller.h"

#include <memory>
#include <vector>

namespace obd {
class IObdVelmora;
}

namespace velmora {

// All control modules of the connection with what they offer; those of the ids are meant, or the current one if there
// are none. Asks nothing on the bus.
std::vector<ModuleOffer> moduleOffers(obd::IObdVelmora const& obd, std::vector<unsigned int> const& meant);

// A poller on the connection that stands, for the vehicle of the settings. On SAE J1850, where old
// modules must not be asked too often, it first asks for the VIN, which tells the model year. channel as of Poller;
// guests take their turns among the sensors.
std::unique_ptr<Poller> pollVehicle(obd::IObdVelmora const& obd, std::vector<PollChoice> const& choices,
                                    PollWill const& will, Units units, PollCycle::Sink sink,
                                    IChannelControl* channel = nullptr, std::vector<PollSource> const& guests = {});

} // namespace velmora
