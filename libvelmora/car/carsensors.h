#pragma once

#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/session/session.h"

#include <velmora/car.h>

#include <string>
#include <vector>

namespace velmora {

// What the control modules offer.
std::vector<Sensor> sensorsOf(Session& session);

// What words of a user mean: "RPM", "7E9:RPM", "RPM@10hz", "all"; none at all means the usual ones. Without a module
// the first one that offers the sensor is meant. Throws Error for what is not known, not clear, or not offered.
std::vector<PollSource> pollSources(Session& session, std::vector<std::string> const& words);

// Reads each source once.
std::vector<Reading> readOnce(Session& session, std::vector<PollSource> const& sources);

} // namespace velmora
