#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// How to reach an adapter over Bluetooth.
class BluetoothDescriptor
{
public:
    /// White space at both ends of the name is stripped. port is the RFCOMM channel.
    OBD_EXPORT BluetoothDescriptor(std::string const& name, std::string const& address, int port);

    std::string const& name() const { return m_name; }       ///< for people
    std::string const& address() const { return m_address; } ///< as it was given
    int port() const { return m_port; }                      ///< the RFCOMM channel

private:
    std::string m_name;
    std::string m_address;
    int m_port;
};

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
    bool autoBaudrate() const { return m_autoBaudrate; }      ///< whether the line rate is to be found out
    int baudrate() const { return m_baudrate; }               ///< baud, to work with
    int initialBaudrate() const { return m_initialBaudrate; } ///< baud, that the adapter starts with; 0 if unknown
    /// For the eye only.
    std::string const& description() const { return m_description; }

private:
    std::string m_device;
    bool m_autoBaudrate;
    int m_baudrate;
    int m_initialBaudrate;
    std::string m_description;
};

/// How to reach an adapter over TCP.
class TcpDescriptor
{
public:
    /// A host name or address, and a port.
    OBD_EXPORT TcpDescriptor(std::string const& address, int port);

    std::string const& address() const { return m_address; } ///< host name or address
    int port() const { return m_port; }                      ///< as it was given

private:
    std::string m_address;
    int m_port;
};

} // namespace obd
