#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// How to reach an adapter over TCP.
class TcpDescriptor
{
public:
    OBD_EXPORT TcpDescriptor(std::string const& address, int port);

    std::string const& address() const { return m_address; }
    int port() const { return m_port; }

private:
    std::string m_address;
    int m_port;
};

} // namespace obd
