#pragma once

#include "libvelmora/http/httpcore.h"

namespace velmora {

// Takes one request after the other from a socket, until one for a stream hands it over to an HttpStream. The
// connection lives as long as it stands in the core, which must outlive it.
void serveHttp(HttpCore& core, boost::asio::ip::tcp::socket socket);

} // namespace velmora
