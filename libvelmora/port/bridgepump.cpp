#include "libvelmora/port/bridgepump.h"

#include <string_view>
#include <utility>
#include <vector>

namespace velmora {

BridgePump::BridgePump(std::unique_ptr<IPort> port, std::shared_ptr<obd::DataBridge> bridge)
    : m_port(std::move(port)), m_bridge(std::move(bridge))
{
    m_port->start(
        [this](std::string_view bytes) { m_bridge->set(std::vector<unsigned char>(bytes.begin(), bytes.end())); },
        [this] {
            m_lost = true;
            m_bridge->invalidate();
        });
    m_writer = std::thread([this] { writeLoop(); });
}

BridgePump::~BridgePump()
{
    stop();
}

void BridgePump::stop()
{
    m_stop = true;
    if (m_writer.joinable()) {
        m_writer.join();
    }
    m_port->close();
}

void BridgePump::writeLoop()
{
    std::vector<unsigned char> bytes;
    bool more = true;
    while (more || !m_stop) {
        bytes.clear();
        more = m_bridge->get(bytes);
        if (more) {
            m_port->write(std::string_view(reinterpret_cast<char const*>(bytes.data()), bytes.size()));
        }
    }
}

} // namespace velmora
