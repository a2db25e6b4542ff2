#include "libvelmora/channel/portwire.h"

#include <utility>

namespace velmora {

namespace {

// Beyond this nobody reads any more what an adapter says unasked.
constexpr std::size_t mostUnread = 1U << 20U;

} // namespace

PortWire::PortWire(std::unique_ptr<IPort> port) : m_port(std::move(port))
{
    m_port->start(
        [this](std::string_view bytes) {
            {
                std::lock_guard const lock(m_mutex);
                if (m_open) { // a port that floods goes on until it is closed
                    m_incoming += bytes;
                    m_open = m_incoming.size() <= mostUnread;
                }
            }
            m_wake.notify_one(); // with the mutex free, so that who reads is not woken to wait for it
        },
        [this] {
            std::lock_guard const lock(m_mutex);
            m_lost = m_open && !m_givenUp;
            m_open = false;
            m_wake.notify_one();
        });
}

PortWire::~PortWire()
{
    m_port->close();
}

void PortWire::write(std::string_view bytes)
{
    m_port->write(bytes);
}

std::string PortWire::read(WireTime until)
{
    std::unique_lock lock(m_mutex);
    std::chrono::steady_clock::time_point const limit{until};
    auto const done = [this] { return !m_incoming.empty() || !m_open || m_givenUp; };
    if (!done() && limit > std::chrono::steady_clock::now()) { // most reads only look
        m_wake.wait_until(lock, limit, done);
    }
    return std::exchange(m_incoming, {});
}

WireTime PortWire::now() const
{
    return std::chrono::duration_cast<WireTime>(std::chrono::steady_clock::now().time_since_epoch());
}

bool PortWire::isUp() const
{
    std::lock_guard const lock(m_mutex);
    return m_open && !m_givenUp;
}

void PortWire::giveUp()
{
    std::lock_guard const lock(m_mutex);
    m_givenUp = true;
    m_wake.notify_one();
}

bool PortWire::resume()
{
    std::lock_guard const lock(m_mutex);
    m_givenUp = false;
    return m_open;
}

bool PortWire::lost() const
{
    std::lock_guard const lock(m_mutex);
    return m_lost;
}

} // namespace velmora
