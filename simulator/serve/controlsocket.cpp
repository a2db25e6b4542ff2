#include "simulator/serve/controlsocket.h"

#include "simulator/control/controlerror.h"
#include "simulator/control/controlline.h"
#include "simulator/server.h"

#include <asio/ip/tcp.hpp>
#include <asio/posix/stream_descriptor.hpp>
#include <asio/read_until.hpp>
#include <asio/write.hpp>

#include <cstdio>
#include <unistd.h>

namespace obdsim {

namespace {

using asio::ip::tcp;

constexpr std::size_t longestLine = 4096;

/// Takes the first line off what a read has brought.
std::string takeLine(std::string& buffer, std::size_t size)
{
    std::string line = buffer.substr(0, size);
    buffer.erase(0, size);
    while (!line.empty() && (line.back() == '\n' || line.back() == '\r')) {
        line.pop_back();
    }
    return line;
}

/// One client of the control socket.
class ControlClient : public std::enable_shared_from_this<ControlClient>
{
public:
    ControlClient(tcp::socket socket, ControlHandler const& handler) : m_socket(std::move(socket)), m_handler(handler)
    {}

    void read()
    {
        asio::async_read_until(m_socket, asio::dynamic_buffer(m_buffer, longestLine), '\n',
                               [self = shared_from_this()](asio::error_code const& error, std::size_t size) {
                                   if (!error) {
                                       self->answer(takeLine(self->m_buffer, size));
                                   }
                               });
    }

private:
    void answer(std::string const& line)
    {
        m_reply = controlReply(m_handler, line, ++m_number);
        asio::async_write(m_socket, asio::buffer(m_reply),
                          [self = shared_from_this()](asio::error_code const& error, std::size_t /*size*/) {
                              if (!error) {
                                  self->read();
                              }
                          });
    }

    tcp::socket m_socket;
    ControlHandler m_handler;
    std::string m_buffer;
    std::string m_reply;
    int m_number = 0;
};

} // namespace

std::string controlReply(ControlHandler const& handler, std::string const& line, int number)
{
    try {
        return handler(line) + "ok\n";
    } catch (ControlError const& error) {
        return "error: line " + std::to_string(number) + ", " + error.what() + "\n";
    }
}

class ControlSocket::Listener : public std::enable_shared_from_this<Listener>
{
public:
    Listener(asio::io_context& context, std::uint16_t port, ControlHandler handler)
        : m_acceptor(context), m_handler(std::move(handler))
    {
        try {
            tcp::endpoint const endpoint(asio::ip::address_v4::loopback(), port);
            m_acceptor.open(endpoint.protocol());
            m_acceptor.set_option(tcp::acceptor::reuse_address(true));
            m_acceptor.bind(endpoint);
            m_acceptor.listen();
        } catch (std::system_error const& error) {
            throw ServerError("cannot listen for control lines on 127.0.0.1:" + std::to_string(port) + ": " +
                              error.code().message());
        }
    }

    void accept()
    {
        m_acceptor.async_accept([self = shared_from_this()](asio::error_code const& error, tcp::socket socket) {
            if (!error) {
                std::make_shared<ControlClient>(std::move(socket), self->m_handler)->read();
                self->accept();
            }
        });
    }

    void close()
    {
        asio::error_code ignored;
        m_acceptor.close(ignored);
    }

    std::string address() const { return "127.0.0.1:" + std::to_string(m_acceptor.local_endpoint().port()); }

private:
    tcp::acceptor m_acceptor;
    ControlHandler m_handler;
};

ControlSocket::ControlSocket(asio::io_context& context, std::uint16_t port, ControlHandler handler)
    : m_listener(std::make_shared<Listener>(context, port, std::move(handler)))
{
    m_listener->accept();
}

ControlSocket::~ControlSocket()
{
    m_listener->close();
}

std::string ControlSocket::address() const
{
    return m_listener->address();
}

class ControlInput::Reader : public std::enable_shared_from_this<Reader>
{
public:
    Reader(asio::io_context& context, ControlHandler handler) : m_input(context), m_handler(std::move(handler)) {}

    void begin()
    {
        int const descriptor = ::dup(STDIN_FILENO);
        asio::error_code error;
        // A regular file cannot be waited for; scenarios are for those.
        m_input.assign(descriptor, error);
        if (error && descriptor >= 0) {
            ::close(descriptor);
        } else if (!error) {
            read();
        }
    }

    void close()
    {
        asio::error_code ignored;
        m_input.close(ignored);
    }

private:
    void read()
    {
        asio::async_read_until(m_input, asio::dynamic_buffer(m_buffer, longestLine), '\n',
                               [self = shared_from_this()](asio::error_code const& error, std::size_t size) {
                                   if (!error) {
                                       self->follow(takeLine(self->m_buffer, size));
                                       self->read();
                                   }
                               });
    }

    void follow(std::string const& line)
    {
        ++m_number;
        if (isEmptyControlLine(line)) {
            return;
        }
        std::string const reply = controlReply(m_handler, line, m_number);
        std::FILE* const stream = reply.starts_with("error: ") ? stderr : stdout;
        std::fputs(reply.c_str(), stream);
        std::fflush(stream);
    }

    asio::posix::stream_descriptor m_input;
    ControlHandler m_handler;
    std::string m_buffer;
    int m_number = 0;
};

ControlInput::ControlInput(asio::io_context& context, ControlHandler handler)
    : m_reader(std::make_shared<Reader>(context, std::move(handler)))
{
    // A terminal stops the programs in its background that read from it.
    bool const background = ::isatty(STDIN_FILENO) == 1 && ::tcgetpgrp(STDIN_FILENO) != ::getpgrp();
    if (!background) {
        m_reader->begin();
    }
}

ControlInput::~ControlInput()
{
    m_reader->close();
}

} // namespace obdsim
