#pragma once

#include "libvelmora/doctor/doctorreport.h"
#include "libvelmora/session/session.h"

namespace velmora {

// Walks the chain from the port to the control modules, as far as it holds. The session must not be connected yet; what
// passes the port goes to the recorder as well. Throws Error only where nothing can be examined: no port, Ctrl-C.
DoctorReport examine(Session& session, DialogueRecorder& recorder);

// One text to attach to a question: the report, versions, settings without what is secret, and all that passed the
// port, without the last six characters of a vehicle identification number unless they are to be kept.
std::string makeBundle(DoctorReport const& report, Session const& session, DialogueRecorder const& recorder,
                       bool keepVin);

} // namespace velmora
