#include <obd/tcpdescriptor.h>

namespace obd {

TcpDescriptor::TcpDescriptor(std::string const& address, int port) : m_address(address), m_port(port) {}

} // namespace obd
