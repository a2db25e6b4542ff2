#include "libvelmora/output/influxoutput.h"

#include "libvelmora/output/linefile.h"
#include "libvelmora/output/lineprotocol.h"

#include <velmora/error.h>

#include <cerrno>
#include <cstring>
#include <netdb.h>
#include <sys/socket.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr std::size_t largestDatagram = 1400; // larger ones are cut in pieces on the way, of which one may be lost

class InfluxFileOutput : public IOutput
{
public:
    explicit InfluxFileOutput(OutputAddress const& address) : m_file(address) {}

    void open() override { m_file.setHeader(""); }
    void write(Records records) override
    {
        std::string lines;
        WallTime now;
        for (SharedRecord const& record : records) {
            if (auto const* const reading = std::get_if<Reading>(record.get())) {
                lines += toLineProtocol(*reading);
                now = reading->time;
            }
        }
        m_file.add(lines, now);
    }
    void close() override { m_file.close(); }

private:
    LineFile m_file;
};

class InfluxUdpOutput : public IOutput
{
public:
    explicit InfluxUdpOutput(std::string const& place) : m_place(place)
    {
        std::size_t const colon = place.rfind(':');
        if (colon == std::string::npos || colon == 0 || colon + 1 == place.size()) {
            throw Error(ErrorKind::WrongUse, "\"influx:udp://" + place + "\" needs a host and a port",
                        {"such as influx:udp://127.0.0.1:8089"});
        }
        m_host = place.substr(0, colon);
        m_port = place.substr(colon + 1);
    }
    ~InfluxUdpOutput() override { shut(); }

    void open() override
    {
        addrinfo hints{};
        hints.ai_socktype = SOCK_DGRAM;
        addrinfo* found = nullptr;
        int const failure = ::getaddrinfo(m_host.c_str(), m_port.c_str(), &hints, &found);
        if (failure != 0) {
            throw Error(ErrorKind::Failed, "Could not find " + m_place + ": " + ::gai_strerror(failure));
        }
        std::unique_ptr<addrinfo, decltype(&::freeaddrinfo)> const list(found, &::freeaddrinfo);
        shut();
        m_socket = ::socket(found->ai_family, SOCK_DGRAM | SOCK_CLOEXEC, 0);
        if (m_socket < 0 || ::connect(m_socket, found->ai_addr, found->ai_addrlen) != 0) {
            throw Error(ErrorKind::Failed, "Could not reach " + m_place + ": " + std::strerror(errno));
        }
    }

    // A batch that failed half way is sent again: the same measurement, tags and time overwrite.
    void write(Records records) override
    {
        std::string datagram;
        for (SharedRecord const& record : records) {
            auto const* const reading = std::get_if<Reading>(record.get());
            std::string const line = reading == nullptr ? "" : toLineProtocol(*reading);
            if (datagram.size() + line.size() > largestDatagram) {
                send(datagram);
                datagram.clear();
            }
            datagram += line;
        }
        send(datagram);
    }

    void close() override { shut(); }

private:
    void send(std::string const& datagram) const
    {
        if (!datagram.empty() && ::send(m_socket, datagram.data(), datagram.size(), MSG_NOSIGNAL) < 0) {
            throw Error(ErrorKind::Failed, "Could not send to " + m_place + ": " + std::strerror(errno),
                        {"does a database listen there for line protocol over UDP?"});
        }
    }

    void shut()
    {
        if (m_socket >= 0) {
            ::close(m_socket);
            m_socket = -1;
        }
    }

    std::string const m_place;
    std::string m_host;
    std::string m_port;
    int m_socket = -1;
};

} // namespace

std::unique_ptr<IOutput> makeInfluxOutput(OutputAddress const& address)
{
    std::string const scheme = "udp://";
    if (address.target.starts_with(scheme)) {
        return std::make_unique<InfluxUdpOutput>(address.target.substr(scheme.size()));
    }
    return std::make_unique<InfluxFileOutput>(address);
}

} // namespace velmora
