#include "libvelmora/port/tcpport.h"

#include "libvelmora/port/asioport.h"

#include <velmora/error.h>

#include <asio/connect.hpp>
#include <asio/ip/tcp.hpp>

#include <chrono>

namespace velmora {

namespace {

constexpr std::chrono::seconds connectLimit(10);
constexpr std::chrono::milliseconds stopStep(100);

[[noreturn]] void failConnect(TcpAddress const& address, std::string const& why)
{
    throw Error(ErrorKind::PortFailed, "Could not connect to " + toString(address) + ": " + why,
                {"is this computer in the adapter's Wi-Fi network?",
                 "is the address right? most Wi-Fi adapters use 192.168.0.10:35000",
                 "an adapter serves one program at a time: close the others"});
}

} // namespace

std::unique_ptr<IPort> openTcpPort(TcpAddress const& address, OpeningStop const& stop)
{
    using asio::ip::tcp;
    auto context = std::make_unique<asio::io_context>();
    asio::error_code error;
    tcp::resolver resolver(*context);
    auto const endpoints = resolver.resolve(address.host, std::to_string(address.port), error);
    if (error) {
        failConnect(address, error.message());
    }
    tcp::socket socket(*context);
    error = asio::error::timed_out;
    asio::async_connect(socket, endpoints,
                        [&error](asio::error_code const& result, tcp::endpoint const&) { error = result; });
    auto const end = std::chrono::steady_clock::now() + connectLimit;
    while (!context->stopped() && std::chrono::steady_clock::now() < end) {
        if (stop && stop()) {
            failInterruptedOpening();
        }
        context->run_for(stopStep);
    }
    if (error) {
        failConnect(address, error == asio::error::timed_out ? "no answer" : error.message());
    }
    socket.set_option(tcp::no_delay(true), error);
    return std::make_unique<AsioPort<tcp::socket>>(std::move(context), std::move(socket));
}

} // namespace velmora
