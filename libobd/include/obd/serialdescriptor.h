#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// How to reach an adapter over a serial port.
class SerialDescriptor
{
public:
    /// The line rate is to be found out: autoBaudrate true, 9600 baud, initial rate 0.
    OBD_EXPORT SerialDescriptor(std::string const& device, std::string const& description);

    /// The line rate is given, in baud: the one to work with and the one that the adapter starts with.
    OBD_EXPORT SerialDescriptor(std::string const& device, int baudrate, int initialBaudrate,
                                std::string const& description);

    /// Path or name of the port.
    std::string const& device() const { return m_device; }
    bool autoBaudrate() const { return m_autoBaudrate; }
    int baudrate() const { return m_baudrate; }
    int initialBaudrate() const { return m_initialBaudrate; }
    /// For the eye only.
    std::string const& description() const { return m_description; }

private:
    std::string m_device;
    bool m_autoBaudrate;
    int m_baudrate;
    int m_initialBaudrate;
    std::string m_description;
};

} // namespace obd
