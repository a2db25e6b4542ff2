#pragma once

#include "libvelmora/channel/wire.h"
#include "simulator/peer.h"

#include <algorithm>
#include <chrono>
#include <memory>
#include <string>

namespace support {

// A simulated adapter as a wire, in virtual time: every wait is a jump of the adapter's clock.
class PeerWire : public velmora::IWire
{
public:
    explicit PeerWire(std::shared_ptr<obdsim::IPeer> peer) : m_peer(std::move(peer)) {}

    void write(std::string_view bytes) override
    {
        m_sent += bytes;
        if (isUp()) {
            m_peer->receive(bytes);
        }
    }

    std::string read(velmora::WireTime until) override
    {
        obdsim::Time const limit = std::max<obdsim::Time>(until, m_peer->now());
        std::string bytes = m_peer->advanceTo(m_peer->now());
        while (bytes.empty() && isUp()) {
            auto const next = m_peer->nextOutput();
            if (!next || *next > limit) {
                bytes = m_peer->advanceTo(limit);
                break;
            }
            bytes = m_peer->advanceTo(*next);
        }
        return bytes;
    }

    velmora::WireTime now() const override { return std::chrono::ceil<velmora::WireTime>(m_peer->now()); }
    bool isUp() const override { return !m_givenUp && m_peer->linkIsUp(); }
    void giveUp() override { m_givenUp = true; }
    bool resume() override
    {
        m_givenUp = false;
        return isUp();
    }

    // All that was ever sent, and forgets it.
    std::string takeSent() { return std::exchange(m_sent, {}); }
    obdsim::IPeer& peer() { return *m_peer; }

private:
    std::shared_ptr<obdsim::IPeer> m_peer;
    std::string m_sent;
    bool m_givenUp = false;
};

} // namespace support
