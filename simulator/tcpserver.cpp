#include "simulator/serverloop.h"
#include "simulator/unsenttext.h"

#include <asio/ip/tcp.hpp>
#include <asio/write.hpp>

#include <array>

namespace obdsim {

namespace {

using asio::ip::tcp;

/// Accepts a client when the one before has gone; the others wait in the queue of
/// the system, as before a real adapter that speaks to one host at a time.
class TcpEndpoint : public Endpoint
{
public:
    TcpEndpoint(asio::io_context& context, std::shared_ptr<IPeer> peer, std::string const& host, std::uint16_t port,
                double speed)
        : Endpoint(context, std::move(peer), speed), m_context(context), m_acceptor(context), m_socket(context)
    {
        listen(host, port);
    }

    std::string address() const override { return m_address; }

    void begin() override { accept(); }

private:
    static std::string textOf(tcp::endpoint const& endpoint)
    {
        std::string const host = endpoint.address().to_string();
        return (endpoint.address().is_v6() ? "[" + host + "]" : host) + ":" + std::to_string(endpoint.port());
    }

    void listen(std::string const& host, std::uint16_t port)
    {
        try {
            auto const endpoints = tcp::resolver(m_context).resolve(host, std::to_string(port));
            tcp::endpoint const endpoint = *endpoints.begin();
            m_acceptor.open(endpoint.protocol());
            m_acceptor.set_option(tcp::acceptor::reuse_address(true));
            m_acceptor.bind(endpoint);
            m_acceptor.listen();
            m_address = textOf(m_acceptor.local_endpoint());
        } catch (std::system_error const& error) {
            throw ServerError("cannot listen on " + host + ":" + std::to_string(port) + ": " + error.code().message());
        }
    }

    void accept()
    {
        m_acceptor.async_accept([this](asio::error_code const& error, tcp::socket socket) {
            if (error) {
                return;
            }
            m_socket = std::move(socket);
            asio::error_code ignored;
            m_socket.set_option(tcp::no_delay(true), ignored);
            player().connect([this](std::string bytes) { send(std::move(bytes)); }, [this] { hangUp(); });
            read();
        });
    }

    void read()
    {
        m_socket.async_read_some(asio::buffer(m_buffer), [this](asio::error_code const& error, std::size_t size) {
            if (error) {
                hangUp();
                accept();
                return;
            }
            player().receive(std::string_view(m_buffer.data(), size));
            read();
        });
    }

    void send(std::string bytes)
    {
        bool const idle = m_unsent.empty();
        m_unsent.push(std::move(bytes));
        if (idle && !m_unsent.empty()) {
            write();
        }
    }

    void write()
    {
        asio::async_write(m_socket, asio::buffer(m_unsent.front()),
                          [this](asio::error_code const& error, std::size_t /*size*/) {
                              if (error || m_unsent.empty()) {
                                  return; // the pending read sees the end, too
                              }
                              m_unsent.pop();
                              if (!m_unsent.empty()) {
                                  write();
                              }
                          });
    }

    /// Ends the conversation; the pending read then brings the next client in.
    void hangUp()
    {
        player().disconnect();
        asio::error_code ignored;
        m_socket.shutdown(tcp::socket::shutdown_both, ignored);
        m_socket.close(ignored);
        m_unsent.clear();
    }

    asio::io_context& m_context;
    tcp::acceptor m_acceptor;
    tcp::socket m_socket;
    std::string m_address;
    std::array<char, 512> m_buffer{};
    UnsentText m_unsent;
};

} // namespace

std::unique_ptr<IServer> serveTcp(Peers const& peers, std::string const& host, std::uint16_t port, double speed)
{
    constexpr std::size_t lastPort = 0xFFFF;
    if (port != 0 && port + peers.size() - 1 > lastPort) {
        throw ServerError("there are no " + std::to_string(peers.size()) + " ports from " + std::to_string(port) +
                          " on");
    }
    auto server = std::make_unique<ServerLoop>();
    for (std::size_t i = 0; i < peers.size(); ++i) {
        auto const own = static_cast<std::uint16_t>(port == 0 ? 0 : port + i);
        server->add(std::make_unique<TcpEndpoint>(server->context(), peers[i], host, own, speed));
    }
    return server;
}

std::unique_ptr<IServer> serveTcp(std::shared_ptr<IPeer> peer, std::string const& host, std::uint16_t port,
                                  double speed)
{
    return serveTcp(Peers{std::move(peer)}, host, port, speed);
}

} // namespace obdsim
