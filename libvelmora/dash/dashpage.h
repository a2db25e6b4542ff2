#pragma once

#include "libvelmora/http/httpserver.h"

namespace velmora {

// Serves the page itself, with its scripts and styles, from the program's own memory.
void addDashPage(HttpServer& server);

// What goes with every reply: nothing from elsewhere, no inline script, no frame around it.
std::vector<std::pair<std::string, std::string>> dashHeaders();

} // namespace velmora
