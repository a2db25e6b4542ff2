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

    std::string const& name() const { return m_name; }
    std::string const& address() const { return m_address; }
    int port() const { return m_port; }

private:
    std::string m_name;
    std::string m_address;
    int m_port;
};

} // namespace obd
