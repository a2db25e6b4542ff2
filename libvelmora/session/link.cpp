#include "libvelmora/session/link.h"

#include <utility>

namespace velmora {

Link::Link(std::unique_ptr<IPort> port, ChannelOptions options, std::shared_ptr<LearntStore> learnt, Maker const& make)
    : m_wire(std::make_shared<PortWire>(std::move(port))),
      m_channel(std::make_shared<FastChannel>(m_wire, std::move(options), std::move(learnt))),
      m_connection(make ? make(m_wire) : m_channel)
{}

Link::~Link()
{
    cut();
}

IChannelControl& Link::control() const
{
    auto* const made = dynamic_cast<IChannelControl*>(m_connection.get());
    return made != nullptr ? *made : *m_channel;
}

void Link::cut()
{
    m_wire->giveUp();
}

bool Link::lost() const
{
    return m_wire->lost() || m_channel->adapterFails();
}

} // namespace velmora
