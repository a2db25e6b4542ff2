#pragma once

#include "libvelmora/session/session.h"
#include "libvelmora/uds/identifierprobe.h"

#include <velmora/probe.h>

#include <functional>
#include <memory>
#include <string>

namespace velmora {

// Throws Error for a request that makes no sense or may not be sent.
ProbeTask probeTask(ProbeRequest const& request);

// Asks; what an interrupted run of the same module has left is gone on with, of which onResumed is told. Throws Error,
// with what was found so far kept.
std::shared_ptr<ProbeState const> probeModule(Session& session, ProbeRequest const& request,
                                              std::function<void(std::string const& at)> const& onResumed);

} // namespace velmora
