#pragma once

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/channel/portwire.h"
#include "libvelmora/port/iport.h"

#include <memory>

namespace velmora {

// What stands between the library and an open port.
class Link
{
public:
    Link(std::unique_ptr<IPort> port, ChannelOptions options, std::shared_ptr<LearntStore> learnt);
    ~Link();
    Link(Link const&) = delete;
    Link& operator=(Link const&) = delete;

    // What the library opens.
    std::shared_ptr<obd::IDataConnection> connection() const { return m_channel; }
    // What it is told beside the bytes, and what it tells.
    IChannelControl& control() const { return *m_channel; }
    // Ends all waiting on the link for good. Any thread.
    void cut();
    // Whether the port was lost, or the adapter can't be kept at work, rather than the link being cut here.
    bool lost() const;

private:
    std::shared_ptr<PortWire> m_wire;
    std::shared_ptr<FastChannel> m_channel;
};

} // namespace velmora
