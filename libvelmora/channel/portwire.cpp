#include "libvelmora/channel/portwire.h"

#include <utility>

namespace velmora {

namespace {

// Beyond this nobody reads any more what an adapter says unasked.
constexpr std::size_t mostUnread = 1U << 20U;
// A port without a thread is looked after by who asks for the link, no more often than that.
constexpr WireTime lookPause{100};

} // namespace

PortWire::PortWire(std::unique_ptr<IPort> port)
    : m_port(std::move(port)), m_pulled(dynamic_cast<IPulledPort*>(m_port.get()))
{
    if (m_pulled == nullptr) {
        start();
    }
}

PortWire::~PortWire()
{
    m_port->close();
}

void PortWire::start()
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
        [this] { endLink(true); });
}

void PortWire::write(std::string_view bytes)
{
    m_port->write(bytes);
}

std::string PortWire::read(WireTime until)
{
    if (m_pulled != nullptr) {
        return pull(until);
    }
    std::unique_lock lock(m_mutex);
    std::chrono::steady_clock::time_point const limit{until};
    auto const done = [this] { return !m_incoming.empty() || !m_open || m_givenUp; };
    if (!done() && limit > std::chrono::steady_clock::now()) { // most reads only look
        m_wake.wait_until(lock, limit, done);
    }
    return std::exchange(m_incoming, {});
}

std::string PortWire::pull(WireTime until)
{
    std::string bytes;
    {
        std::lock_guard const lock(m_mutex);
        if (!m_open) {
            return bytes;
        }
        until = m_givenUp ? WireTime(0) : until;
    }
    if (!m_pulled->pull(bytes, IPulledPort::Moment(until))) {
        endLink(true);
    } else if (bytes.size() >= mostUnread) {
        endLink(false);
    }
    m_seenUp = now().count();
    return bytes;
}

WireTime PortWire::now() const
{
    return std::chrono::duration_cast<WireTime>(std::chrono::steady_clock::now().time_since_epoch());
}

bool PortWire::isUp() const
{
    lookAfterLink();
    std::lock_guard const lock(m_mutex);
    return m_open && !m_givenUp;
}

void PortWire::giveUp()
{
    {
        std::lock_guard const lock(m_mutex);
        m_givenUp = true;
        m_wake.notify_one();
    }
    if (m_pulled != nullptr) {
        m_pulled->interrupt();
    }
}

bool PortWire::resume()
{
    lookAfterLink();
    std::lock_guard const lock(m_mutex);
    m_givenUp = false;
    return m_open;
}

bool PortWire::lost() const
{
    lookAfterLink();
    std::lock_guard const lock(m_mutex);
    return m_lost;
}

// Nobody else finds out that the link of a port without a thread is gone while nothing is read.
void PortWire::lookAfterLink() const
{
    if (m_pulled == nullptr || now().count() - m_seenUp < lookPause.count()) {
        return;
    }
    m_seenUp = now().count();
    if (!m_pulled->isUp()) {
        endLink(true);
    }
}

void PortWire::endLink(bool lost) const
{
    std::lock_guard const lock(m_mutex);
    m_lost = m_lost || (lost && m_open && !m_givenUp);
    m_open = false;
    m_wake.notify_one(); // with the mutex held: who sees the link gone may end this object at once
}

} // namespace velmora
