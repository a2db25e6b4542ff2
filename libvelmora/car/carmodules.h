#pragma once

#include "libvelmora/session/session.h"

#include <velmora/modules.h>

#include <string>
#include <vector>

namespace velmora {

// The modules of the vehicle: those that are remembered, or looked for now, and then remembered by VIN; on legacy buses
// those of the connection. Tells its progress. Throws Error.
std::vector<FoundModule> findModules(Session& session, ModuleSearch const& search);

// Of each selected module; none of one that can't be asked alone.
std::vector<ModuleTopic<ModuleIdentifiers>> readIdentifiers(Session& session);

// Of the selected modules and, where all are, of those that were found before. named: the maker that the user chose, or
// empty. Throws Error.
std::vector<UdsModuleReport> readUdsReports(Session& session, std::string const& named);

} // namespace velmora
