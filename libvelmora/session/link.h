#pragma once

#include "libvelmora/port/bridgepump.h"
#include "libvelmora/port/iport.h"

#include <obd/idataconnection.h>

#include <memory>

namespace obd {
class DataBridge;
}

namespace velmora {

// What stands between the library and an open port.
class Link
{
public:
    explicit Link(std::unique_ptr<IPort> port);
    ~Link();
    Link(Link const&) = delete;
    Link& operator=(Link const&) = delete;

    // What the library opens.
    std::shared_ptr<obd::IDataConnection> connection() const;
    // Ends all waiting on the link for good. Any thread.
    void cut();
    // Whether the port was lost, rather than the link being cut here.
    bool lost() const { return m_pump.lost(); }

private:
    std::shared_ptr<obd::DataBridge> m_bridge;
    BridgePump m_pump;
};

} // namespace velmora
