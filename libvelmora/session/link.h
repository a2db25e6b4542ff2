#pragma once

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/channel/plainchannel.h"
#include "libvelmora/channel/portwire.h"
#include "libvelmora/port/iport.h"

#include <functional>
#include <memory>

namespace velmora {

// What stands between the library and an open port.
class Link
{
public:
    // What the library opens in place of the channel; null for the channel.
    using Maker = std::function<std::shared_ptr<obd::IDataConnection>(std::shared_ptr<IWire> const& wire)>;

    Link(std::unique_ptr<IPort> port, ChannelOptions options, std::shared_ptr<LearntStore> learnt,
         Maker const& make = nullptr);
    ~Link();
    Link(Link const&) = delete;
    Link& operator=(Link const&) = delete;

    // What the library opens.
    std::shared_ptr<obd::IDataConnection> connection() const { return m_connection; }
    // The bare bytes, for who talks to the adapter in place of the library.
    std::shared_ptr<obd::IDataConnection> plainConnection() const { return std::make_shared<PlainChannel>(m_wire); }
    // What it is told beside the bytes, and what it tells.
    IChannelControl& control() const;
    // Ends all waiting on the link for good. Any thread.
    void cut();
    // Whether the port was lost, or the adapter can't be kept at work, rather than the link being cut here.
    bool lost() const;
    // Whether it is the port that was lost.
    bool portLost() const { return m_wire->lost(); }
    // Whether the link is lost because the adapter reset itself again and again.
    bool adapterResets() const { return m_channel->adapterResets(); }
    // Whether it is lost because the adapter says nothing at all any more.
    bool adapterGone() const { return m_channel->adapterGone(); }

private:
    std::shared_ptr<PortWire> m_wire;
    std::shared_ptr<FastChannel> m_channel;
    std::shared_ptr<obd::IDataConnection> m_connection;
};

} // namespace velmora
