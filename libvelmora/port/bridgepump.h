#pragma once

#include "libvelmora/port/iport.h"

#include <obd/databridge.h>

#include <atomic>
#include <memory>
#include <thread>

namespace velmora {

// Moves bytes between an open port and a data bridge, until it is stopped or the link is lost; a loss invalidates the
// bridge.
class BridgePump
{
public:
    BridgePump(std::unique_ptr<IPort> port, std::shared_ptr<obd::DataBridge> bridge);
    ~BridgePump();
    BridgePump(BridgePump const&) = delete;
    BridgePump& operator=(BridgePump const&) = delete;

    // Whether the link broke, rather than being stopped here.
    bool lost() const { return m_lost; }

    // Ends both directions, after what is queued for the adapter has been handed to the port.
    void stop();

private:
    void writeLoop();

    std::unique_ptr<IPort> m_port;
    std::shared_ptr<obd::DataBridge> m_bridge;
    std::atomic<bool> m_stop{false};
    std::atomic<bool> m_lost{false};
    std::thread m_writer;
};

} // namespace velmora
