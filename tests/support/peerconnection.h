#pragma once

#include "simulator/peer.h"

#include <obd/idataconnection.h>

#include <algorithm>
#include <memory>
#include <string>

/// A connection to a simulated adapter in virtual time: every wait is a jump of the adapter's clock, so that a
/// driver's dialogue of many seconds takes no real time.
class PeerConnection : public obd::IDataConnection
{
public:
    explicit PeerConnection(std::shared_ptr<obdsim::IPeer> peer) : m_peer(std::move(peer)) {}

    void setDelimiter(char delimiter) override { m_delimiter = delimiter; }
    bool isValid() const override { return m_peer->linkIsUp(); }

    bool receive(std::vector<unsigned char>& out, int timeoutMs) override
    {
        const obdsim::Time deadline = m_peer->now() + obdsim::Time(std::max(0, timeoutMs));
        m_pending += m_peer->advanceTo(m_peer->now());
        while (m_pending.find(m_delimiter) == std::string::npos) {
            const auto next = m_peer->nextOutput();
            if (!next || *next > deadline) {
                m_pending += m_peer->advanceTo(deadline);
                return false;
            }
            m_pending += m_peer->advanceTo(*next);
        }
        const auto end = m_pending.find(m_delimiter);
        out.assign(m_pending.begin(), m_pending.begin() + static_cast<std::ptrdiff_t>(end));
        m_pending.erase(0, end + 1);
        return true;
    }

    void send(const std::vector<unsigned char>& bytes) override
    {
        m_peer->receive(std::string(bytes.begin(), bytes.end()));
    }
    void addLogger(obd::IConnectionLogger* /*logger*/) override {}
    void removeLogger(obd::IConnectionLogger* /*logger*/) override {}

    obdsim::IPeer& peer() { return *m_peer; }

private:
    std::shared_ptr<obdsim::IPeer> m_peer;
    std::string m_pending;
    char m_delimiter = '>';
};
