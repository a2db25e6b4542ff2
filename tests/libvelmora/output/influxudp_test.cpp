// Line protocol over UDP: its places, the size of its datagrams, and what it tells of a network that refuses.
#include "libvelmora/output/influxoutput.h"
#include "libvelmora/output/lineprotocol.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <sys/socket.h>
#include <unistd.h>

namespace {

using testsupport::march;
using testsupport::reading;
using testsupport::records;
using velmora::parseOutputAddress;
using velmora::toLineProtocol;

// A database's end. Gives its port back when it goes.
class UdpEnd
{
public:
    UdpEnd() : m_socket(::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0))
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t length = sizeof(address);
        EXPECT_EQ(::bind(m_socket, reinterpret_cast<sockaddr*>(&address), length), 0);
        EXPECT_EQ(::getsockname(m_socket, reinterpret_cast<sockaddr*>(&address), &length), 0);
        m_port = ntohs(address.sin_port);
    }
    ~UdpEnd() { ::close(m_socket); }
    UdpEnd(UdpEnd const&) = delete;
    UdpEnd& operator=(UdpEnd const&) = delete;

    std::string place() const { return "127.0.0.1:" + std::to_string(m_port); }
    // The sizes of the datagrams that have come.
    std::vector<ssize_t> sizes() const
    {
        std::vector<ssize_t> result;
        char buffer[4096];
        for (ssize_t count = 0; (count = ::recv(m_socket, buffer, sizeof(buffer), MSG_DONTWAIT)) >= 0;) {
            result.push_back(count);
        }
        return result;
    }

private:
    int m_socket;
    unsigned short m_port = 0;
};

// A line of so many bytes.
velmora::SharedRecord lineOf(std::size_t size)
{
    std::size_t const bare = toLineProtocol(reading("T", std::string())).size();
    return records(reading("T", std::string(size - bare, 'x')))[0];
}

std::string udpTrouble(std::string const& place, int writes)
{
    try {
        auto const output = velmora::makeInfluxOutput(parseOutputAddress("influx:udp://" + place));
        output->open();
        for (int i = 0; i < writes; ++i) {
            output->write(records(reading("RPM", 1.0)));
            ::usleep(1000); // until the refusal is back
        }
    } catch (velmora::Error const& error) {
        return error.what();
    }
    return "";
}

TEST(InfluxUdp, FillsADatagramUpToFourteenHundredBytes)
{
    UdpEnd const end;
    auto const output = velmora::makeInfluxOutput(parseOutputAddress("influx:udp://" + end.place()));
    output->open();
    std::vector<std::pair<std::vector<std::size_t>, std::vector<ssize_t>>> const cases = {
        {{}, {}},
        {{700, 700}, {1400}},
        {{700, 701}, {700, 701}},
        {{700, 700, 100}, {1400, 100}},
        {{1500, 100}, {1500, 100}},
        {{100, 1500, 100}, {100, 1500, 100}},
    };
    for (auto const& [lines, datagrams] : cases) {
        std::vector<velmora::SharedRecord> batch;
        for (std::size_t const size : lines) {
            batch.push_back(lineOf(size));
            batch.push_back(records(velmora::LampState{})[0]); // has no line
        }
        output->write(batch);
        EXPECT_EQ(end.sizes(), datagrams);
    }
}

TEST(InfluxUdp, HoldsOneSocketFromOpenToClose)
{
    UdpEnd const end;
    long const before = testsupport::openDescriptors();
    {
        auto const output = velmora::makeInfluxOutput(parseOutputAddress("influx:udp://" + end.place()));
        EXPECT_EQ(testsupport::openDescriptors(), before);
        output->open();
        output->open(); // again, after a failure
        EXPECT_EQ(testsupport::openDescriptors(), before + 1);
        output->close();
        output->close();
        EXPECT_EQ(testsupport::openDescriptors(), before);
        output->open();
        output->write({});
    }
    EXPECT_EQ(testsupport::openDescriptors(), before) << "at its end, too";
}

TEST(InfluxUdp, TellsWhatIsWrongWithItsPlace)
{
    for (char const* const place : {"nowhere", ":8089", "127.0.0.1:"}) {
        EXPECT_EQ(udpTrouble(place, 0), "\"influx:udp://" + std::string(place) + "\" needs a host and a port");
    }
    EXPECT_TRUE(udpTrouble("127.0.0.1:nowhere", 0).starts_with("Could not find 127.0.0.1:nowhere: "));
    EXPECT_TRUE(udpTrouble("255.255.255.255:1", 0).starts_with("Could not reach 255.255.255.255:1: "));
    std::string const gone = UdpEnd().place();
    EXPECT_EQ(udpTrouble(gone, 2), "Could not send to " + gone + ": Connection refused");
}

TEST(InfluxFiles, BeginAnotherDayByTheirLines)
{
    testsupport::TemporaryFolder const folder;
    auto const output = velmora::makeInfluxOutput(parseOutputAddress("influx:" + folder.file("a") + "?rotate=day"));
    output->open();
    output->write(records(reading("RPM", 1.0)));
    output->write(records(velmora::LampState{}));
    output->write(records(reading("RPM", 2.0, march + 86400000), velmora::LampState{}));
    EXPECT_TRUE(testsupport::isHeldOpen(folder.file("a")));
    output->close();
    EXPECT_FALSE(testsupport::isHeldOpen(folder.file("a")));
    EXPECT_EQ(folder.read("a"), toLineProtocol(reading("RPM", 2.0, march + 86400000)));
    EXPECT_EQ(folder.read("a-20260302T081500Z"), toLineProtocol(reading("RPM", 1.0)));
}

TEST(LineProtocol, HasNoControlCharacters)
{
    velmora::Reading odd = reading("A\x1f"
                                   "B",
                                   std::string("a\x1f"
                                               "b c"));
    odd.vehicle = "a\tb";
    EXPECT_EQ(toLineProtocol(odd), "velmora,vehicle=a_b,module=7E8,sensor=A_B text=\"a b c\" 1772352900250000000\n");
}

} // namespace
