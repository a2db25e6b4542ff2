// The only file that includes Boost.Beast, which takes long to compile.
#include "libvelmora/http/httpserver.h"

#include <velmora/error.h>

#include <boost/asio/io_context.hpp>
#include <boost/asio/ip/tcp.hpp>
#include <boost/asio/post.hpp>
#include <boost/asio/steady_timer.hpp>
#include <boost/asio/write.hpp>
#include <boost/beast/core.hpp>
#include <boost/beast/http.hpp>

#include <algorithm>
#include <atomic>
#include <set>
#include <thread>
#include <utility>

namespace velmora {

namespace {

namespace beast = boost::beast;
namespace http = boost::beast::http;
namespace net = boost::asio;
using net::ip::tcp;
constexpr int streamBuffer = 64 * 1024; // of the system, so that what a slow reader gets is not old

using Reply = http::response<http::string_body>;
using ErrorCode = boost::system::error_code;

HttpRequest toRequest(http::request<http::string_body> const& from)
{
    HttpRequest request;
    request.method = std::string(from.method_string());
    std::string const target(from.target());
    std::size_t const question = target.find('?');
    request.path = target.substr(0, question);
    request.query = question == std::string::npos ? "" : target.substr(question + 1);
    for (auto const& field : from) {
        std::string name(field.name_string());
        std::ranges::transform(name, name.begin(),
                               [](char c) { return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c; });
        request.headers.emplace_back(std::move(name), std::string(field.value()));
    }
    request.body = from.body();
    return request;
}

} // namespace

struct HttpServer::Core
{
    class Client;

    explicit Core(HttpLimits const& chosen) : limits(chosen) {}

    void accept();
    template <typename Do>
    void forReaders(std::string const& path, Do action) const;

    HttpLimits const limits;
    HttpRoutes routes; // does not change after start
    net::io_context context{1};
    tcp::acceptor acceptor{context};
    std::set<std::shared_ptr<Client>> clients; // the server's thread, as what the clients hold
    std::atomic<std::size_t> readers{0};       // of all streams
    std::thread thread;
};

// One connection: one request after the other, or a stream from the first request for one on.
class HttpServer::Core::Client : public std::enable_shared_from_this<Client>
{
public:
    Client(Core& core, tcp::socket socket)
        : m_core(core), m_stream(std::move(socket)), m_buffer(2 * core.limits.header), m_timer(core.context)
    {}

    void read();
    void close();
    bool reads(std::string const& path) const { return m_route != nullptr && m_route->path == path; }
    void publish(std::string const& event);
    void publishLatest(std::string const& event);

private:
    using Parser = http::request_parser<http::string_body>;

    void onRead(ErrorCode const& error);
    void refuse(unsigned int status, std::string const& text);
    void reply(HttpResponse const& response, bool keepAlive, bool headOnly);
    void send(bool keepAlive, bool headOnly);
    void beginStream(HttpRoutes::Route const& route, HttpRequest const& request);
    void writePending();
    void catchUp();
    void schedulePing();
    void watchForEnd();

    Core& m_core;
    beast::tcp_stream m_stream;
    beast::flat_buffer m_buffer;
    std::unique_ptr<Parser> m_parser;
    std::unique_ptr<Reply> m_reply;
    std::unique_ptr<http::response_serializer<http::string_body>> m_serializer;
    HttpRoutes::Route const* m_route = nullptr; // of a stream
    HttpRequest m_request;                      // that for the stream
    std::string m_pending;                      // events that wait
    std::string m_writing;                      // events under way
    std::chrono::steady_clock::time_point m_writingSince;
    bool m_behind = false;     // has missed some of publishLatest
    net::steady_timer m_timer; // until a late reply, or the next ping
    char m_ignored = 0;
};

void HttpServer::Core::Client::read()
{
    m_parser = std::make_unique<Parser>();
    m_parser->header_limit(static_cast<std::uint32_t>(m_core.limits.header));
    m_parser->body_limit(m_core.limits.body);
    m_stream.expires_after(m_core.limits.time);
    http::async_read(m_stream, m_buffer, *m_parser,
                     [self = shared_from_this()](ErrorCode const& error, std::size_t) { self->onRead(error); });
}

void HttpServer::Core::Client::close()
{
    ErrorCode ignored;
    m_timer.cancel();
    m_stream.socket().shutdown(tcp::socket::shutdown_both, ignored);
    m_stream.close();
    if (m_core.clients.erase(shared_from_this()) > 0 && m_route != nullptr) {
        --m_core.readers;
    }
}

void HttpServer::Core::Client::onRead(ErrorCode const& error)
{
    if (error == http::error::header_limit || error == http::error::buffer_overflow) {
        refuse(431, "The header is too long");
    } else if (error == http::error::body_limit) {
        refuse(413, "The body is too long");
    } else if (error.category() == http::make_error_code(http::error::bad_method).category() &&
               error != http::error::end_of_stream && error != http::error::partial_message) {
        refuse(400, "This is no HTTP request");
    } else if (error) {
        close();
    } else {
        bool const keepAlive = m_parser->get().keep_alive();
        HttpRequest const request = toRequest(m_parser->release());
        HttpRoutes::Route const* const stream = m_core.routes.stream(request);
        if (stream != nullptr) {
            beginStream(*stream, request);
        } else {
            reply(m_core.routes.answer(request), keepAlive, request.method == "HEAD");
        }
    }
}

void HttpServer::Core::Client::refuse(unsigned int status, std::string const& text)
{
    reply(plainResponse(status, text), false, false);
}

void HttpServer::Core::Client::reply(HttpResponse const& response, bool keepAlive, bool headOnly)
{
    m_reply = std::make_unique<Reply>(static_cast<http::status>(response.status), 11);
    m_reply->set(http::field::content_type, response.contentType);
    m_reply->set(http::field::cache_control, "no-store");
    m_reply->set("X-Content-Type-Options", "nosniff");
    for (auto const& [name, value] : response.headers) {
        m_reply->set(name, value);
    }
    m_reply->keep_alive(keepAlive);
    m_reply->body() = response.body;
    m_reply->prepare_payload();
    m_serializer = std::make_unique<http::response_serializer<http::string_body>>(*m_reply);
    if (response.delay.count() == 0) {
        send(keepAlive, headOnly);
        return;
    }
    m_stream.expires_never();
    m_timer.expires_after(response.delay);
    m_timer.async_wait([self = shared_from_this(), keepAlive, headOnly](ErrorCode const& error) {
        if (!error) {
            self->send(keepAlive, headOnly);
        }
    });
}

void HttpServer::Core::Client::send(bool keepAlive, bool headOnly)
{
    auto const done = [self = shared_from_this(), keepAlive](ErrorCode const& error, std::size_t) {
        if (error || !keepAlive) {
            self->close();
        } else {
            self->read();
        }
    };
    m_stream.expires_after(m_core.limits.time);
    if (headOnly) {
        http::async_write_header(m_stream, *m_serializer, done);
    } else {
        http::async_write(m_stream, *m_serializer, done);
    }
}

void HttpServer::Core::Client::beginStream(HttpRoutes::Route const& route, HttpRequest const& request)
{
    m_route = &route;
    m_request = request;
    ++m_core.readers;
    ErrorCode ignored;
    m_stream.socket().set_option(net::socket_base::send_buffer_size(streamBuffer), ignored);
    m_pending = "HTTP/1.1 200 OK\r\nContent-Type: text/event-stream\r\nCache-Control: no-store\r\n"
                "X-Content-Type-Options: nosniff\r\nConnection: close\r\n\r\n";
    m_pending += route.greeting(request);
    m_stream.expires_never();
    writePending();
    schedulePing();
    watchForEnd();
}

void HttpServer::Core::Client::publish(std::string const& event)
{
    m_pending += event;
    if (m_pending.size() > m_core.limits.streamBacklog) {
        close();
        return;
    }
    writePending();
}

void HttpServer::Core::Client::publishLatest(std::string const& event)
{
    if (!m_writing.empty()) {
        m_behind = true;
        return;
    }
    publish(event);
}

void HttpServer::Core::Client::writePending()
{
    if (!m_writing.empty() || m_pending.empty()) {
        return;
    }
    m_writing.swap(m_pending);
    m_writingSince = std::chrono::steady_clock::now();
    net::async_write(m_stream.socket(), net::buffer(m_writing),
                     [self = shared_from_this()](ErrorCode const& error, std::size_t) {
                         self->m_writing.clear();
                         if (error) {
                             self->close();
                         } else {
                             self->catchUp();
                             self->writePending();
                         }
                     });
}

void HttpServer::Core::Client::catchUp()
{
    if (std::exchange(m_behind, false) && m_route->catchUp) {
        m_pending += m_route->catchUp(m_request);
    }
}

void HttpServer::Core::Client::schedulePing()
{
    m_timer.expires_after(m_core.limits.streamPing);
    m_timer.async_wait([self = shared_from_this()](ErrorCode const& error) {
        if (error || !self->m_stream.socket().is_open()) {
            return;
        }
        bool const stuck = !self->m_writing.empty() &&
                           std::chrono::steady_clock::now() - self->m_writingSince > self->m_core.limits.streamStall;
        if (stuck) {
            self->close();
            return;
        }
        self->publish(": \n\n");
        self->schedulePing();
    });
}

// A reader says nothing more; when reading ends, it has gone.
void HttpServer::Core::Client::watchForEnd()
{
    m_stream.socket().async_read_some(net::buffer(&m_ignored, 1),
                                      [self = shared_from_this()](ErrorCode const& error, std::size_t) {
                                          if (error) {
                                              self->close();
                                          } else {
                                              self->watchForEnd();
                                          }
                                      });
}

void HttpServer::Core::accept()
{
    acceptor.async_accept([this](ErrorCode const& error, tcp::socket socket) {
        if (error == net::error::operation_aborted) {
            return;
        }
        if (!error && clients.size() < limits.connections) {
            auto const client = std::make_shared<Client>(*this, std::move(socket));
            clients.insert(client);
            client->read();
        }
        accept();
    });
}

template <typename Do>
void HttpServer::Core::forReaders(std::string const& path, Do action) const
{
    std::vector<std::shared_ptr<Client>> const now(clients.begin(), clients.end());
    for (std::shared_ptr<Client> const& client : now) {
        if (client->reads(path)) {
            action(*client);
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
    try {
        tcp::resolver resolver(m_core->context);
        tcp::endpoint const endpoint = *resolver.resolve(place.host, std::to_string(place.port)).begin();
        m_core->acceptor.open(endpoint.protocol());
        m_core->acceptor.set_option(tcp::acceptor::reuse_address(true));
        m_core->acceptor.bind(endpoint);
        m_core->acceptor.listen();
    } catch (boost::system::system_error const& error) {
        m_core->acceptor.close();
        throw Error(ErrorKind::Failed,
                    "Could not listen on " + place.host + ":" + std::to_string(place.port) + ": " +
                        error.code().message(),
                    {"does another program use the port? does the machine have the address?"});
    }
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
        core->forReaders(path, [&event](Core::Client& client) { client.publish(event); });
    });
}

void HttpServer::publishLatest(std::string const& path, std::string const& event)
{
    net::post(m_core->context, [core = m_core.get(), path, event] {
        core->forReaders(path, [&event](Core::Client& client) { client.publishLatest(event); });
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
    net::post(m_core->context, [core = m_core.get()] {
        core->acceptor.close();
        std::vector<std::shared_ptr<Core::Client>> const clients(core->clients.begin(), core->clients.end());
        for (std::shared_ptr<Core::Client> const& client : clients) {
            client->close();
        }
    });
    m_core->thread.join();
}

} // namespace velmora
