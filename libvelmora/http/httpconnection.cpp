// The only file that includes Boost.Beast, which takes long to compile.
#include "libvelmora/http/httpconnection.h"

#include "libvelmora/http/httpstream.h"

#include <boost/asio/steady_timer.hpp>
#include <boost/beast/core.hpp>
#include <boost/beast/http.hpp>

#include <algorithm>
#include <string>

namespace velmora {

namespace {

namespace beast = boost::beast;
namespace http = boost::beast::http;

using HttpErrorCode = boost::system::error_code;
using HttpParser = http::request_parser<http::string_body>;
using HttpReply = http::response<http::string_body>;
using HttpReplySerializer = http::response_serializer<http::string_body>;

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

bool isNoHttp(HttpErrorCode const& error)
{
    return error.category() == http::make_error_code(http::error::bad_method).category() &&
           error != http::error::end_of_stream && error != http::error::partial_message;
}

class HttpConnection : public IHttpConnection, public std::enable_shared_from_this<HttpConnection>
{
public:
    HttpConnection(HttpCore& core, boost::asio::ip::tcp::socket socket)
        : m_core(core), m_stream(std::move(socket)), m_buffer(2 * core.limits.header), m_delay(core.context)
    {}

    void read();
    void close() override;

private:
    void onRead(HttpErrorCode const& error);
    void answer();
    void refuse(unsigned int status, std::string const& text);
    void reply(HttpResponse const& response, bool keepAlive, bool headOnly);
    void send(bool keepAlive, bool headOnly);

    HttpCore& m_core;
    beast::tcp_stream m_stream;
    beast::flat_buffer m_buffer;
    std::unique_ptr<HttpParser> m_parser;
    std::unique_ptr<HttpReply> m_reply;
    std::unique_ptr<HttpReplySerializer> m_serializer;
    boost::asio::steady_timer m_delay; // of a late reply
};

void HttpConnection::read()
{
    m_parser = std::make_unique<HttpParser>();
    m_parser->header_limit(static_cast<std::uint32_t>(m_core.limits.header));
    m_parser->body_limit(m_core.limits.body);
    m_stream.expires_after(m_core.limits.time);
    http::async_read(m_stream, m_buffer, *m_parser,
                     [self = shared_from_this()](HttpErrorCode const& error, std::size_t) { self->onRead(error); });
}

void HttpConnection::close()
{
    HttpErrorCode ignored;
    m_delay.cancel();
    m_stream.socket().shutdown(boost::asio::ip::tcp::socket::shutdown_both, ignored);
    m_stream.close();
    m_core.connections.erase(shared_from_this());
}

void HttpConnection::onRead(HttpErrorCode const& error)
{
    if (error == http::error::header_limit || error == http::error::buffer_overflow) {
        refuse(431, "The header is too long");
    } else if (error == http::error::body_limit) {
        refuse(413, "The body is too long");
    } else if (isNoHttp(error)) {
        refuse(400, "This is no HTTP request");
    } else if (error) {
        close();
    } else {
        answer();
    }
}

void HttpConnection::answer()
{
    bool const keepAlive = m_parser->get().keep_alive();
    HttpRequest const request = toRequest(m_parser->release());
    if (HttpRoutes::Route const* const stream = m_core.routes.stream(request)) {
        std::make_shared<HttpStream>(m_core, m_stream.release_socket(), *stream, request)->begin();
        m_core.connections.erase(shared_from_this());
    } else {
        reply(m_core.routes.answer(request), keepAlive, request.method == "HEAD");
    }
}

void HttpConnection::refuse(unsigned int status, std::string const& text)
{
    reply(plainResponse(status, text), false, false);
}

void HttpConnection::reply(HttpResponse const& response, bool keepAlive, bool headOnly)
{
    m_reply = std::make_unique<HttpReply>(static_cast<http::status>(response.status), 11);
    m_reply->set(http::field::content_type, response.contentType);
    m_reply->set(http::field::cache_control, "no-store");
    m_reply->set("X-Content-Type-Options", "nosniff");
    for (auto const& [name, value] : response.headers) {
        m_reply->set(name, value);
    }
    m_reply->keep_alive(keepAlive);
    m_reply->body() = response.body;
    m_reply->prepare_payload();
    m_serializer = std::make_unique<HttpReplySerializer>(*m_reply);
    if (response.delay.count() == 0) {
        send(keepAlive, headOnly);
        return;
    }
    m_delay.expires_after(response.delay);
    m_delay.async_wait([self = shared_from_this(), keepAlive, headOnly](HttpErrorCode const& error) {
        if (!error) {
            self->send(keepAlive, headOnly);
        }
    });
}

void HttpConnection::send(bool keepAlive, bool headOnly)
{
    auto const done = [self = shared_from_this(), keepAlive](HttpErrorCode const& error, std::size_t) {
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

} // namespace

void serveHttp(HttpCore& core, boost::asio::ip::tcp::socket socket)
{
    auto const connection = std::make_shared<HttpConnection>(core, std::move(socket));
    core.connections.insert(connection);
    connection->read();
}

} // namespace velmora
