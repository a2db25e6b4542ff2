#include <obd/connectiondescriptors.h>

#include <algorithm>
#include <cctype>

namespace obd {

namespace {

bool isSpace(char letter)
{
    return std::isspace(static_cast<unsigned char>(letter)) != 0;
}

std::string stripped(std::string const& text)
{
    auto const first = std::find_if_not(text.begin(), text.end(), isSpace);
    auto const last = std::find_if_not(text.rbegin(), std::make_reverse_iterator(first), isSpace).base();
    return {first, last};
}

} // namespace

BluetoothDescriptor::BluetoothDescriptor(std::string const& name, std::string const& address, int port)
    : m_name(stripped(name)), m_address(address), m_port(port)
{}

SerialDescriptor::SerialDescriptor(std::string const& device, std::string const& description)
    : m_device(device), m_autoBaudrate(true), m_baudrate(9600), m_initialBaudrate(0), m_description(description)
{}

SerialDescriptor::SerialDescriptor(std::string const& device, int baudrate, int initialBaudrate,
                                   std::string const& description)
    : m_device(device), m_autoBaudrate(false), m_baudrate(baudrate), m_initialBaudrate(initialBaudrate),
      m_description(description)
{}

TcpDescriptor::TcpDescriptor(std::string const& address, int port) : m_address(address), m_port(port) {}

} // namespace obd
