#pragma once

#include "libvelmora/http/httpserver.h"

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>

#include <atomic>
#include <memory>
#include <set>
#include <utility> // boost/asio of 1.74 uses it without including it

namespace velmora {

class HttpStream;

// A connection that takes requests. The server's thread.
class IHttpConnection
{
public:
    virtual ~IHttpConnection() = default;
    // Once more does nothing.
    virtual void close() = 0;
};

// What the connections of one server share. The server's thread, but for readers.
struct HttpCore
{
    explicit HttpCore(HttpLimits const& chosen) : limits(chosen) {}

    std::size_t connectionCount() const { return connections.size() + streams.size(); }

    HttpLimits const limits;
    HttpRoutes routes; // does not change after start
    boost::asio::io_context context{1};
    std::set<std::shared_ptr<IHttpConnection>> connections;
    std::set<std::shared_ptr<HttpStream>> streams;
    std::atomic<std::size_t> readers{0}; // of all streams
};

} // namespace velmora
