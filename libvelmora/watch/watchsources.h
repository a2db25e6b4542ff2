#pragma once

#include "libvelmora/output/record.h"
#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/session/session.h"
#include "libvelmora/uds/signalchoice.h"

#include <string>
#include <vector>

namespace velmora {

// What is to be read of an open session: by wishes such as "7E8:RPM@10hz", or by none what trips need and most people
// look at. Engine speed and vehicle speed are always among them, if the vehicle has them: without, nobody knows whether
// it runs. Wishes that mean signals of one's own are chosen in signals. Throws Error for a wish that the vehicle can't
// fulfil.
std::vector<PollSource> watchSources(Session& session, std::vector<std::string> const& wishes, SignalChoice& signals);

// Adds what further wishes name, as far as the vehicle has it and it is not among them yet.
void addSources(Session& session, std::vector<std::string> const& wishes, std::vector<PollSource>& sources);

// All that the selected modules offer.
std::vector<SensorEntry> offeredEntries(Session& session);

// How they are told to outputs.
SensorList sensorList(std::string const& vehicle, std::vector<PollSource> const& sources);

} // namespace velmora
