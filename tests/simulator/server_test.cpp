#include "simulator/peerplayer.h"
#include "simulator/server.h"
#include "simulator/simulation.h"
#include "simulator/unsenttext.h"

#include <asio/connect.hpp>
#include <asio/ip/tcp.hpp>
#include <asio/write.hpp>
#include <gtest/gtest.h>

#include <chrono>
#include <fcntl.h>
#include <poll.h>
#include <thread>
#include <unistd.h>

namespace {

using asio::ip::tcp;
using std::chrono::milliseconds;
using std::chrono::steady_clock;

constexpr double fast = 50; // of simulated to real time

/// A file descriptor that a test talks through, with a limit to every wait.
class Line
{
public:
    explicit Line(int descriptor) : m_descriptor(descriptor) {}
    ~Line() { ::close(m_descriptor); }
    Line(Line const&) = delete;
    Line& operator=(Line const&) = delete;

    void send(std::string const& text) const
    {
        ASSERT_EQ(::write(m_descriptor, text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }

    /// All up to and with the prompt; what came if the line ends or stays silent.
    std::string readReply()
    {
        std::string text;
        char byte = 0;
        while (text.empty() || text.back() != '>') {
            pollfd wait{m_descriptor, POLLIN, 0};
            if (::poll(&wait, 1, 2000) <= 0) {
                break;
            }
            if (::read(m_descriptor, &byte, 1) <= 0) {
                m_ended = true;
                break;
            }
            text += byte;
        }
        return text;
    }

    std::string ask(std::string const& command)
    {
        send(command + "\r");
        return readReply();
    }

    bool ended() const { return m_ended; }

private:
    int m_descriptor;
    bool m_ended = false;
};

int connectTo(std::string const& address)
{
    auto const colon = address.rfind(':');
    asio::io_context context;
    tcp::socket socket(context);
    asio::connect(socket, tcp::resolver(context).resolve(address.substr(0, colon), address.substr(colon + 1)));
    int const descriptor = ::dup(socket.native_handle());
    ::fcntl(descriptor, F_SETFL, ::fcntl(descriptor, F_GETFL) & ~O_NONBLOCK);
    return descriptor;
}

milliseconds timeOf(std::function<void()> const& action)
{
    auto const start = steady_clock::now();
    action();
    return std::chrono::duration_cast<milliseconds>(steady_clock::now() - start);
}

TEST(TcpServer, servesOneClientAfterAnother)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0, fast);
    server->start();
    EXPECT_EQ(server->address().substr(0, 10), "127.0.0.1:");
    {
        Line first(connectTo(server->address()));
        EXPECT_EQ(first.ask("ATE0"), "ATE0\rOK\r\r>");
        EXPECT_EQ(first.ask("0100").substr(0, 13), "SEARCHING...\r");
    }
    Line second(connectTo(server->address()));
    EXPECT_EQ(second.ask("ATI"), "ELM327 v1.5\r\r>") << "the adapter has kept its settings";
    EXPECT_EQ(second.ask("0100").substr(0, 5), "41 00");
}

TEST(TcpServer, secondClientWaitsForTheFirstToGo)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0, fast);
    server->start();
    auto first = std::make_unique<Line>(connectTo(server->address()));
    EXPECT_EQ(first->ask("ATE0"), "ATE0\rOK\r\r>");
    Line second(connectTo(server->address()));
    second.send("ATI\r");
    EXPECT_EQ(first->ask("ATI"), "ELM327 v1.5\r\r>");
    first.reset();
    EXPECT_EQ(second.readReply(), "ELM327 v1.5\r\r>");
}

TEST(TcpServer, stopsAtOnceWithAClientOnTheLine)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0, 1);
    server->start();
    Line client(connectTo(server->address()));
    client.ask("ATE0");
    client.send("0100\r");
    EXPECT_LT(timeOf([&] { server->stop(); }), milliseconds(200));
    server->stop();
}

TEST(TcpServer, runsOnTheCallersThreadToo)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0, fast);
    std::thread thread([&] { server->run(); });
    {
        Line client(connectTo(server->address()));
        EXPECT_EQ(client.ask("ATI"), "ATI\rELM327 v1.5\r\r>");
    }
    server->stop();
    thread.join();
}

TEST(TcpServer, stoppedBeforeItRunsItReturns)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0);
    server->stop();
    server->run();
}

TEST(TcpServer, lostLinkClosesTheConnectionAndTheNextOneIsServed)
{
    auto const peer = obdsim::simulate({"petrol-can11", "elm327-v1.5", {"loss@14"}});
    auto const server = obdsim::serveTcp(peer, "127.0.0.1", 0, fast);
    server->start();
    {
        Line client(connectTo(server->address()));
        EXPECT_EQ(client.ask("ATE0"), "ATE0\rOK\r\r>");
        EXPECT_EQ(client.ask("ATI"), "ELM");
        EXPECT_TRUE(client.ended());
    }
    Line next(connectTo(server->address()));
    EXPECT_EQ(next.ask("ATE0"), "OK\r\r>");
}

TEST(PeerPlayer, whatIsDueIsSaidBeforeMoreIsHeard)
{
    asio::io_context context;
    obdsim::PeerPlayer player(context, obdsim::simulate({}), 1e6);
    std::string said;
    player.connect([&said](std::string const& bytes) { said += bytes; }, [] {});
    player.receive("ATI\r");
    auto const end = steady_clock::now() + std::chrono::seconds(5);
    while (said.find('>') == std::string::npos && steady_clock::now() < end) {
        player.catchUp();
    }
    EXPECT_EQ(said, "ATI\rELM327 v1.5\r\r>");
}

TEST(UnsentText, holdsWhatFitsAndTakesMoreWhenItIsRead)
{
    obdsim::UnsentText text;
    for (int i = 0; i < 100; ++i) {
        text.push(std::string(1000, 'A'));
    }
    EXPECT_EQ(text.size(), 65000U);
    text.pop();
    text.push("B");
    EXPECT_EQ(text.size(), 64001U);
    text.clear();
    EXPECT_TRUE(text.empty());
    text.push("C");
    EXPECT_EQ(text.front(), "C");
    text.push(std::string(obdsim::UnsentText::mostBytes - 1, 'D'));
    EXPECT_EQ(text.size(), 65536U) << "to the last byte";
    text.push("E");
    EXPECT_EQ(text.size(), 65536U);
}

TEST(TcpServer, portInUseIsTold)
{
    auto const server = obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0);
    std::string const address = server->address();
    auto const port = static_cast<std::uint16_t>(std::stoi(address.substr(address.rfind(':') + 1)));
    try {
        obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", port);
        FAIL();
    } catch (obdsim::ServerError const& error) {
        EXPECT_EQ(std::string(error.what()).find("cannot listen on " + address), 0U) << error.what();
    }
    EXPECT_THROW(obdsim::serveTcp(obdsim::simulate({}), "256.1.1.1.1", 0), obdsim::ServerError);
}

TEST(PtyServer, servesProgramsThatOpenItsDevice)
{
    auto const server = obdsim::servePseudoTerminal(obdsim::simulate({}), fast);
    server->start();
    {
        Line first(::open(server->address().c_str(), O_RDWR | O_NOCTTY));
        EXPECT_EQ(first.ask("ATZ"), "ATZ\r\r\rELM327 v1.5\r\r>") << "no byte changed by the terminal";
        EXPECT_EQ(first.ask("ATE0"), "ATE0\rOK\r\r>");
    }
    Line second(::open(server->address().c_str(), O_RDWR | O_NOCTTY));
    EXPECT_EQ(second.ask("ATI"), "ELM327 v1.5\r\r>");
}

TEST(PtyServer, stopsAtOnceAndTakesItsDeviceAway)
{
    auto server = obdsim::servePseudoTerminal(obdsim::simulate({}));
    server->start();
    std::string const path = server->address();
    EXPECT_LT(timeOf([&] { server->stop(); }), milliseconds(200));
    server.reset();
    EXPECT_NE(::access(path.c_str(), F_OK), 0);
}

TEST(PtyServer, whoNeverReadsHoldsNobodyUp)
{
    auto const server = obdsim::servePseudoTerminal(obdsim::simulate({}), 1e4);
    server->start();
    Line const client(::open(server->address().c_str(), O_RDWR | O_NOCTTY));
    for (int i = 0; i < 400; ++i) {
        client.send("ATPPS\r");
        std::this_thread::sleep_for(std::chrono::microseconds(100)); // each is read, and answered with 450 bytes
    }
    EXPECT_LT(timeOf([&] { server->stop(); }), milliseconds(1000));
}

TEST(PtyServer, itsDevicesAreNotInherited)
{
    auto const server = obdsim::servePseudoTerminal(obdsim::simulate({}), fast);
    int devices = 0;
    for (int file = 3; file < 256; ++file) {
        if (::isatty(file) != 0) {
            ++devices;
            EXPECT_NE(::fcntl(file, F_GETFD) & FD_CLOEXEC, 0) << file;
        }
    }
    EXPECT_EQ(devices, 2) << "both ends";
}

TEST(PtyServer, lostLinkTakesTheDeviceAway)
{
    auto const peer = obdsim::simulate({"petrol-can11", "elm327-v1.5", {"loss@14"}});
    auto const server = obdsim::servePseudoTerminal(peer, fast);
    server->start();
    Line client(::open(server->address().c_str(), O_RDWR | O_NOCTTY));
    EXPECT_EQ(client.ask("ATE0"), "ATE0\rOK\r\r>");
    std::string const rest = client.ask("ATI");
    EXPECT_EQ(rest, std::string("ELM").substr(0, rest.size())) << "the hang-up may take unread bytes with it";
    EXPECT_TRUE(client.ended());
}

std::uint16_t portOf(std::string const& address)
{
    return static_cast<std::uint16_t>(std::stoi(address.substr(address.rfind(':') + 1)));
}

TEST(TcpServer, aFleetHasPortsInARow)
{
    for (int tries = 0; tries < 50; ++tries) {
        std::uint16_t const port = portOf(obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", 0)->address());
        try {
            auto const fleet =
                obdsim::serveTcp({obdsim::simulate({}), obdsim::simulate({}), obdsim::simulate({})}, "127.0.0.1", port);
            std::vector<std::string> const all = fleet->addresses();
            ASSERT_EQ(all.size(), 3U);
            EXPECT_EQ(fleet->address(), all[0]);
            for (std::uint16_t i = 0; i < 3; ++i) {
                EXPECT_EQ(portOf(all[i]), port + i);
            }
            return;
        } catch (obdsim::ServerError const&) {
            // Another program has one of them.
        }
    }
    FAIL() << "no three ports in a row";
}

TEST(TcpServer, itsPortIsFreeAsSoonAsItHasGone)
{
    auto server =
        obdsim::serveTcp(obdsim::simulate({"petrol-can11", "elm327-v1.5", {"loss@14"}}), "127.0.0.1", 0, fast);
    std::uint16_t const port = portOf(server->address());
    server->start();
    Line client(connectTo(server->address()));
    client.ask("ATE0");
    EXPECT_EQ(client.ask("ATI"), "ELM");
    EXPECT_TRUE(client.ended()) << "by the server, whose end of it lives on for a minute";
    server.reset();
    EXPECT_NO_THROW(obdsim::serveTcp(obdsim::simulate({}), "127.0.0.1", port));
}

TEST(TcpServer, aClockThatHasRunGoesOn)
{
    auto const peer = obdsim::simulate({});
    peer->advanceTo(std::chrono::hours(1));
    auto const server = obdsim::serveTcp(peer, "127.0.0.1", 0, fast);
    server->start();
    Line client(connectTo(server->address()));
    EXPECT_EQ(client.ask("ATI"), "ATI\rELM327 v1.5\r\r>") << "no hour later";
    server->stop();
    EXPECT_GE(peer->now(), std::chrono::hours(1));
    EXPECT_LT(peer->now(), std::chrono::hours(2));
}

TEST(TcpServer, aFleetNeedsAPortForEachCar)
{
    auto const said = [](std::size_t cars, std::uint16_t port) -> std::string {
        try {
            obdsim::Peers peers;
            for (std::size_t i = 0; i < cars; ++i) {
                peers.push_back(obdsim::simulate({}));
            }
            obdsim::serveTcp(peers, "127.0.0.1", port);
        } catch (obdsim::ServerError const& error) {
            return error.what();
        }
        return "";
    };
    EXPECT_EQ(said(2, 65535), "there are no 2 ports from 65535 on");
    EXPECT_EQ(said(3, 65534), "there are no 3 ports from 65534 on");
    for (std::size_t const cars : {1U, 2U}) {
        std::string const what = said(cars, static_cast<std::uint16_t>(65536 - cars));
        EXPECT_EQ(what.find("there are no"), std::string::npos) << what << ": at most one of them is in use";
    }
    EXPECT_EQ(said(3, 0), "") << "any free ones";
}

} // namespace
