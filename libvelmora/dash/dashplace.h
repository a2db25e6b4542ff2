#pragma once

#include "libvelmora/output/outputaddress.h"

#include <set>
#include <string>
#include <string_view>

struct ifaddrs;

namespace velmora {

// Whether an option of the page says yes. Throws Error for what is neither yes nor no.
bool isAllowed(OutputAddress const& address, std::string const& key);

// Names of hosts with commas between them. Throws Error.
std::set<std::string> hostNamesOf(std::string_view list);

// An address by which others reach this machine, for a server that listens on all of them.
std::string ownAddress();

// The same of a list of the system's interfaces: the first of IPv4 that is up and not the machine's own.
std::string addressAmong(ifaddrs const* list);

// Where a browser finds the page that is served there, with the token that lets it in; no token may be needed.
std::string pageLink(std::string const& place, unsigned short port, std::string const& token);

} // namespace velmora
