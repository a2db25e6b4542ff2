#pragma once

#include "common/text/text.h"
#include "libvelmora/session/session.h"

#include <obd/iecu.h>
#include <velmora/topics.h>

#include <memory>
#include <type_traits>
#include <vector>

namespace velmora {

// A topic of each selected control module, one after the other. read: a Report of a Session and one of its modules,
// which it selects as the current one.
template <typename Read>
auto readModules(Session& session, Read const& read)
{
    using Report = std::invoke_result_t<Read const&, Session&, obd::IEcu const&>;
    std::vector<ModuleTopic<Report>> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        modules.push_back({ecu->id(), readable(ecu->name()), read(session, *ecu)});
        session.check();
    }
    session.checkAdapter();
    return modules;
}

} // namespace velmora
