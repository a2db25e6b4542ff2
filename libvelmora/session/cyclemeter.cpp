#include "libvelmora/session/cyclemeter.h"

namespace velmora {

void CycleMeter::onRequest(Time now)
{
    std::lock_guard const lock(m_mutex);
    if (m_asking) {
        return; // a further request of the same reading
    }
    m_lost += m_begun ? now - m_since : Time::duration(0);
    m_begun = true;
    m_asking = true;
    m_since = now;
}

void CycleMeter::onDone(Time now)
{
    std::lock_guard const lock(m_mutex);
    if (m_asking) {
        m_asked += now - m_since;
        m_asking = false;
        m_since = now;
    }
}

double CycleMeter::lostShare() const
{
    std::lock_guard const lock(m_mutex);
    auto const lost = std::chrono::duration<double>(m_lost).count();
    auto const all = std::chrono::duration<double>(m_lost + m_asked).count();
    return all > 0.0 ? lost / all : 0.0;
}

CycleTap::CycleTap(obd::IConnectionManager& manager, DispatchLoop& loop) : m_manager(manager), m_loop(loop)
{
    m_manager.addLogger(this);
    m_loop.setListener([this] { m_meter.onDone(std::chrono::steady_clock::now()); });
}

CycleTap::~CycleTap()
{
    m_loop.setListener(nullptr);
    m_manager.removeLogger(this);
}

void CycleTap::onDataSent(std::vector<unsigned char> const& /*data*/)
{
    m_meter.onRequest(std::chrono::steady_clock::now());
}

void CycleTap::onDataReceived(std::vector<unsigned char> const& /*data*/) {}

} // namespace velmora
