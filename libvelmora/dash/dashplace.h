#pragma once

#include "libvelmora/output/outputaddress.h"
#include "libvelmora/report/json.h"

#include <set>
#include <string>
#include <string_view>

namespace velmora {

// Whether an option of the page says yes. Throws Error for what is neither yes nor no.
bool isAllowed(OutputAddress const& address, std::string const& key);

// Names of hosts with commas between them. Throws Error.
std::set<std::string> hostNamesOf(std::string_view list);

// An address by which others reach this machine, for a server that listens on all of them.
std::string ownAddress();

// On one line; what is no UTF-8 is replaced.
std::string dumpedJson(Json const& value);

} // namespace velmora
