#include "libvelmora/http/httpserver.h"

#include "libvelmora/http/httpconnection.h"
#include "libvelmora/http/httpcore.h"
#include "libvelmora/http/httpstream.h"

#include <velmora/error.h>

#include <boost/asio/post.hpp>

#include <thread>
#include <vector>

namespace velmora {

namespace {

namespace net = boost::asio;
using net::ip::tcp;

template <typename Item>
std::vector<Item> copyOf(std::set<Item> const& items)
{
    return {items.begin(), items.end()};
}

} // namespace

struct HttpServer::Core : HttpCore
{
    using HttpCore::HttpCore;

    void listen(HttpPlace const& place);
    void accept();
    void closeAll();
    template <typename Do>
    void forReaders(std::string const& path, Do action) const;

    tcp::acceptor acceptor{context};
    std::thread thread;
};

void HttpServer::Core::listen(HttpPlace const& place)
{
    try {
        tcp::resolver resolver(context);
        tcp::endpoint const endpoint = *resolver.resolve(place.host, std::to_string(place.port)).begin();
        acceptor.open(endpoint.protocol());
        acceptor.set_option(tcp::acceptor::reuse_address(true));
        acceptor.bind(endpoint);
        acceptor.listen();
    } catch (boost::system::system_error const& error) {
        acceptor.close();
        throw Error(ErrorKind::Failed,
                    "Could not listen on " + place.host + ":" + std::to_string(place.port) + ": " +
                        error.code().message(),
                    {"does another program use the port? does the machine have the address?"});
    }
}

void HttpServer::Core::accept()
{
    acceptor.async_accept([this](boost::system::error_code const& error, tcp::socket socket) {
        if (error == net::error::operation_aborted) {
            return;
        }
        if (!error && connectionCount() < limits.connections) {
            serveHttp(*this, std::move(socket));
        }
        accept();
    });
}

void HttpServer::Core::closeAll()
{
    acceptor.close();
    for (auto const& connection : copyOf(connections)) {
        connection->close();
    }
    for (auto const& stream : copyOf(streams)) {
        stream->close();
    }
}

template <typename Do>
void HttpServer::Core::forReaders(std::string const& path, Do action) const
{
    for (std::shared_ptr<HttpStream> const& stream : copyOf(streams)) {
        if (stream->reads(path)) {
            action(*stream);
        }
    }
}

HttpServer::HttpServer(HttpLimits const& limits) : m_core(std::make_unique<Core>(limits)) {}

HttpServer::~HttpServer()
{
    stop();
}

void HttpServer::addRoute(std::string const& method, std::string const& path, Handler handler)
{
    m_core->routes.add(method, path, std::move(handler));
}

void HttpServer::addStream(std::string const& path, HttpEvents greeting, HttpEvents catchUp)
{
    m_core->routes.addStream(path, std::move(greeting), std::move(catchUp));
}

void HttpServer::setGate(HttpGate gate)
{
    m_core->routes.setGate(std::move(gate));
}

void HttpServer::start(HttpPlace const& place)
{
    m_core->listen(place);
    m_core->accept();
    m_core->thread = std::thread([this] { m_core->context.run(); });
}

unsigned short HttpServer::port() const
{
    return m_core->acceptor.local_endpoint().port();
}

void HttpServer::publish(std::string const& path, std::string const& event)
{
    net::post(m_core->context, [core = m_core.get(), path, event] {
        core->forReaders(path, [&event](HttpStream& stream) { stream.publish(event); });
    });
}

void HttpServer::publishLatest(std::string const& path, std::string const& event)
{
    net::post(m_core->context, [core = m_core.get(), path, event] {
        core->forReaders(path, [&event](HttpStream& stream) { stream.publishLatest(event); });
    });
}

std::size_t HttpServer::readers() const
{
    return m_core->readers;
}

void HttpServer::stop()
{
    if (!m_core->thread.joinable()) {
        return;
    }
    net::post(m_core->context, [core = m_core.get()] { core->closeAll(); });
    m_core->thread.join();
}

} // namespace velmora
