#include "libvelmora/port/serialport.h"

#include "libvelmora/port/asioport.h"

#include <velmora/error.h>

#include <asio/serial_port.hpp>

#include <cerrno>
#include <fcntl.h>
#include <sys/ioctl.h>
#include <termios.h>

namespace velmora {

namespace {

[[noreturn]] void failOpen(SerialAddress const& address, asio::error_code const& error)
{
    std::string const what = "Could not open the serial port " + address.device + ": " + error.message();
    if (error == asio::error_code(ENOENT, asio::error::get_system_category())) {
        throw Error(ErrorKind::PortFailed, what,
                    {"is the adapter plugged in? `velmora ports` lists what is there",
                     "a Bluetooth adapter needs no serial port: --port bt://MAC, as `velmora ports` lists them"});
    }
    if (error == asio::error_code(EACCES, asio::error::get_system_category())) {
        throw Error(ErrorKind::PortFailed, what,
                    {"your user may not use serial ports: add it to the group dialout and log in again"});
    }
    bool const isFolder = error == asio::error_code(EISDIR, asio::error::get_system_category());
    if (isFolder || error == asio::error_code(ENOTTY, asio::error::get_system_category())) {
        throw Error(ErrorKind::PortFailed, address.device + " is no serial port",
                    {"`velmora ports` lists what is there", "a recorded car is replay:FILE"});
    }
    throw Error(ErrorKind::PortFailed, what,
                {"does another program hold the port?", "is it the right port? `velmora ports` lists what is there"});
}

} // namespace

std::unique_ptr<IPort> openSerialPort(SerialAddress const& address)
{
    auto context = std::make_unique<asio::io_context>();
    asio::serial_port port(*context);
    asio::error_code error;
    port.open(address.device, error);
    if (error) {
        failOpen(address, error);
    }
    if (::ioctl(port.native_handle(), TIOCEXCL) != 0) {
        error.assign(errno, asio::error::get_system_category());
        failOpen(address, error);
    }
    using Line = asio::serial_port_base;
    port.set_option(Line::character_size(8), error);
    port.set_option(Line::parity(Line::parity::none), error);
    port.set_option(Line::stop_bits(Line::stop_bits::one), error);
    port.set_option(Line::flow_control(Line::flow_control::none), error);
    port.set_option(Line::baud_rate(address.baud), error);
    if (error) {
        leaveToOthers(port);
        throw Error(ErrorKind::PortFailed,
                    "The serial port " + address.device + " refuses " + std::to_string(address.baud) + " baud",
                    {"usual rates are 9600, 38400, 57600, 115200: choose with --baud"});
    }
    return std::make_unique<AsioPort<asio::serial_port>>(std::move(context), std::move(port));
}

} // namespace velmora
