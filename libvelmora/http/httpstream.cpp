#include "libvelmora/http/httpstream.h"

#include <boost/asio/write.hpp>

namespace velmora {

namespace {

constexpr int streamBuffer = 64 * 1024; // of the system, so that what a slow reader gets is not old
constexpr char const* streamHead = "HTTP/1.1 200 OK\r\nContent-Type: text/event-stream\r\nCache-Control: no-store\r\n"
                                   "X-Content-Type-Options: nosniff\r\nConnection: close\r\n\r\n";

using StreamErrorCode = boost::system::error_code;

} // namespace

HttpStream::HttpStream(HttpCore& core, boost::asio::ip::tcp::socket socket, HttpRoutes::Route const& route,
                       HttpRequest const& request)
    : m_core(core), m_socket(std::move(socket)), m_route(route), m_request(request), m_ping(core.context)
{}

void HttpStream::begin()
{
    m_core.streams.insert(shared_from_this());
    ++m_core.readers;
    StreamErrorCode ignored;
    m_socket.set_option(boost::asio::socket_base::send_buffer_size(streamBuffer), ignored);
    m_pending = streamHead + m_route.greeting(m_request);
    writePending();
    schedulePing();
    watchForEnd();
}

void HttpStream::close()
{
    StreamErrorCode ignored;
    m_ping.cancel();
    m_socket.shutdown(boost::asio::ip::tcp::socket::shutdown_both, ignored);
    m_socket.close(ignored);
    if (m_core.streams.erase(shared_from_this()) > 0) {
        --m_core.readers;
    }
}

void HttpStream::publish(std::string const& event)
{
    m_pending += event;
    if (m_pending.size() > m_core.limits.streamBacklog) {
        close();
        return;
    }
    writePending();
}

void HttpStream::publishLatest(std::string const& event)
{
    if (!m_writing.empty()) {
        m_behind = true;
        return;
    }
    publish(event);
}

void HttpStream::writePending()
{
    if (!m_writing.empty() || m_pending.empty()) {
        return;
    }
    m_writing.swap(m_pending);
    m_writingSince = std::chrono::steady_clock::now();
    boost::asio::async_write(m_socket, boost::asio::buffer(m_writing),
                             [self = shared_from_this()](StreamErrorCode const& error, std::size_t) {
                                 self->m_writing.clear();
                                 if (error) {
                                     self->close();
                                 } else {
                                     self->catchUp();
                                     self->writePending();
                                 }
                             });
}

void HttpStream::catchUp()
{
    if (std::exchange(m_behind, false) && m_route.catchUp) {
        m_pending += m_route.catchUp(m_request);
    }
}

bool HttpStream::isStuck() const
{
    return !m_writing.empty() && std::chrono::steady_clock::now() - m_writingSince > m_core.limits.streamStall;
}

void HttpStream::schedulePing()
{
    m_ping.expires_after(m_core.limits.streamPing);
    m_ping.async_wait([self = shared_from_this()](StreamErrorCode const& error) {
        if (error || !self->m_socket.is_open()) {
            return;
        }
        if (self->isStuck()) {
            self->close();
            return;
        }
        self->publish(": \n\n");
        self->schedulePing();
    });
}

// A reader says nothing more; when reading ends, it has gone.
void HttpStream::watchForEnd()
{
    m_socket.async_read_some(boost::asio::buffer(m_ignored),
                             [self = shared_from_this()](StreamErrorCode const& error, std::size_t) {
                                 if (error) {
                                     self->close();
                                 } else {
                                     self->watchForEnd();
                                 }
                             });
}

} // namespace velmora
