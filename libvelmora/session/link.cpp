#include "libvelmora/session/link.h"

#include <obd/databridge.h>

#include <utility>

namespace velmora {

Link::Link(std::unique_ptr<IPort> port)
    : m_bridge(std::make_shared<obd::DataBridge>()), m_pump(std::move(port), m_bridge)
{}

Link::~Link()
{
    cut();
}

std::shared_ptr<obd::IDataConnection> Link::connection() const
{
    return m_bridge;
}

void Link::cut()
{
    m_bridge->invalidate();
}

} // namespace velmora
