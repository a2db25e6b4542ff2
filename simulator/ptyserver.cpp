#include "simulator/serverloop.h"

#include <asio/posix/stream_descriptor.hpp>

#include <array>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <termios.h>
#include <unistd.h>

namespace obdsim {

namespace {

[[noreturn]] void fail(std::string const& what)
{
    throw ServerError("cannot open a pseudo-terminal: " + what + ": " + std::strerror(errno));
}

/// The bytes pass as they are: no echo, no line editing, no CR to LF.
void makeRaw(int descriptor)
{
    termios settings{};
    if (tcgetattr(descriptor, &settings) != 0) {
        fail("tcgetattr");
    }
    cfmakeraw(&settings);
    if (tcsetattr(descriptor, TCSANOW, &settings) != 0) {
        fail("tcsetattr");
    }
}

class PtyEndpoint : public Endpoint
{
public:
    PtyEndpoint(asio::io_context& context, std::shared_ptr<IPeer> peer, double speed)
        : Endpoint(context, std::move(peer), speed), m_master(context)
    {
        int const master = posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK | O_CLOEXEC);
        if (master < 0) {
            fail("posix_openpt");
        }
        m_master.assign(master);
        std::array<char, 128> path{};
        if (grantpt(master) != 0 || unlockpt(master) != 0 || ptsname_r(master, path.data(), path.size()) != 0) {
            fail("ptsname");
        }
        m_path = path.data();
        // One open end of our own keeps the device alive between two clients.
        m_slave = open(m_path.c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
        if (m_slave < 0) {
            fail(m_path);
        }
        makeRaw(m_slave);
    }

    ~PtyEndpoint() override { closeSlave(); }
    PtyEndpoint(PtyEndpoint const&) = delete;
    PtyEndpoint& operator=(PtyEndpoint const&) = delete;

    std::string address() const override { return m_path; }

    void begin() override
    {
        player().connect([this](std::string const& bytes) { send(bytes); }, [this] { hangUp(); });
        read();
    }

private:
    void read()
    {
        m_master.async_read_some(asio::buffer(m_buffer), [this](asio::error_code const& error, std::size_t size) {
            if (!error) {
                player().receive(std::string_view(m_buffer.data(), size));
                read();
            }
        });
    }

    /// A terminal that nobody reads fills up; what does not fit is lost, as on a wire.
    void send(std::string const& bytes)
    {
        asio::error_code ignored;
        m_master.non_blocking(true, ignored);
        m_master.write_some(asio::buffer(bytes), ignored);
    }

    void hangUp()
    {
        player().disconnect();
        asio::error_code ignored;
        m_master.close(ignored);
        closeSlave();
    }

    void closeSlave()
    {
        if (m_slave >= 0) {
            close(m_slave);
            m_slave = -1;
        }
    }

    asio::posix::stream_descriptor m_master;
    std::string m_path;
    int m_slave = -1;
    std::array<char, 512> m_buffer{};
};

} // namespace

std::unique_ptr<IServer> servePseudoTerminals(Peers const& peers, double speed)
{
    auto server = std::make_unique<ServerLoop>();
    for (auto const& peer : peers) {
        server->add(std::make_unique<PtyEndpoint>(server->context(), peer, speed));
    }
    return server;
}

std::unique_ptr<IServer> servePseudoTerminal(std::shared_ptr<IPeer> peer, double speed)
{
    return servePseudoTerminals(Peers{std::move(peer)}, speed);
}

} // namespace obdsim
