#include <obd/serialdescriptor.h>

namespace obd {

SerialDescriptor::SerialDescriptor(std::string const& device, std::string const& description)
    : m_device(device), m_autoBaudrate(true), m_baudrate(9600), m_initialBaudrate(0), m_description(description)
{}

SerialDescriptor::SerialDescriptor(std::string const& device, int baudrate, int initialBaudrate,
                                   std::string const& description)
    : m_device(device), m_autoBaudrate(false), m_baudrate(baudrate), m_initialBaudrate(initialBaudrate),
      m_description(description)
{}

} // namespace obd
