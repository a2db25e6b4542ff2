#include "simulator/peerplayer.h"

#include <utility>

namespace obdsim {

namespace {

using Clock = std::chrono::steady_clock;
using RealMs = std::chrono::duration<double, std::milli>;

} // namespace

PeerPlayer::PeerPlayer(asio::io_context& context, std::shared_ptr<IPeer> peer, double speed)
    : m_peer(std::move(peer)), m_speed(speed), m_start(Clock::now()), m_offset(m_peer->now()), m_timer(context)
{}

void PeerPlayer::connect(Output output, LinkLost linkLost)
{
    m_output = std::move(output);
    m_linkLost = std::move(linkLost);
    m_peer->advanceTo(virtualNow());
    m_peer->connect();
    arm();
}

void PeerPlayer::receive(std::string_view bytes)
{
    catchUp();
    m_peer->receive(bytes);
    arm();
}

void PeerPlayer::catchUp()
{
    std::string const before = m_peer->advanceTo(virtualNow());
    if (m_output && !before.empty()) {
        m_output(before);
    }
}

void PeerPlayer::goOn()
{
    arm();
}

void PeerPlayer::disconnect()
{
    m_timer.cancel();
    m_output = nullptr;
    m_linkLost = nullptr;
}

Time PeerPlayer::virtualNow() const
{
    RealMs const passed = Clock::now() - m_start;
    return m_offset + std::chrono::floor<Time>(passed * m_speed);
}

/// Sets the timer to the peer's next output. A broken link is told at once.
void PeerPlayer::arm()
{
    if (!m_output) {
        return;
    }
    auto const next = m_peer->nextWake();
    if (!next && m_peer->linkIsUp()) {
        m_timer.cancel();
        return;
    }
    RealMs const wait = RealMs(next ? *next - m_offset : Time(0)) / m_speed;
    m_timer.expires_at(m_start + std::chrono::ceil<Clock::duration>(wait));
    m_timer.async_wait([this](asio::error_code const& error) {
        if (!error) {
            play();
        }
    });
}

void PeerPlayer::play()
{
    if (!m_output) {
        return;
    }
    std::string const bytes = m_peer->advanceTo(virtualNow());
    if (!bytes.empty()) {
        m_output(bytes);
    }
    if (!m_peer->linkIsUp() && !m_peer->nextOutput()) {
        LinkLost const lost = std::exchange(m_linkLost, nullptr);
        if (lost) {
            lost();
        }
        return;
    }
    arm();
}

} // namespace obdsim
