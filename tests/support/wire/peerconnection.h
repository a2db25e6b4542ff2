#pragma once

#include "simulator/peer.h"

#include <obd/idataconnection.h>

#include <algorithm>
#include <atomic>
#include <memory>
#include <mutex>
#include <string>

/// A connection to a simulated adapter in virtual time: every wait is a jump of the adapter's clock, so that a
/// driver's dialogue of many seconds takes no real time. Safe from any thread.
class PeerConnection : public obd::IDataConnection
{
public:
    explicit PeerConnection(std::shared_ptr<obdsim::IPeer> peer) : m_peer(std::move(peer)) {}

    void setDelimiter(char delimiter) override { m_delimiter = delimiter; }
    bool isValid() const override
    {
        std::lock_guard const lock(m_mutex);
        return !m_broken && m_peer->linkIsUp();
    }

    bool receive(std::vector<unsigned char>& out, int timeoutMs) override
    {
        std::lock_guard const lock(m_mutex);
        if (m_broken) {
            return false;
        }
        obdsim::Time const deadline = m_peer->now() + obdsim::Ms(std::max(0, timeoutMs));
        pull(m_peer->now());
        while (m_pending.find(m_delimiter) == std::string::npos) {
            auto const next = m_peer->nextOutput();
            if (!next || *next > deadline) {
                pull(deadline);
                return false;
            }
            pull(*next);
        }
        auto const end = m_pending.find(m_delimiter);
        out.assign(m_pending.begin(), m_pending.begin() + static_cast<std::ptrdiff_t>(end));
        m_pending.erase(0, end + 1);
        for (auto* logger : m_loggers) {
            logger->onDataReceived(out);
        }
        return true;
    }

    void send(std::vector<unsigned char> const& bytes) override
    {
        std::lock_guard const lock(m_mutex);
        m_peer->receive(std::string(bytes.begin(), bytes.end()));
        for (auto* logger : m_loggers) {
            logger->onDataSent(bytes);
        }
    }
    void addLogger(obd::IConnectionLogger* logger) override
    {
        std::lock_guard const lock(m_mutex);
        m_loggers.push_back(logger);
    }
    void removeLogger(obd::IConnectionLogger* logger) override
    {
        std::lock_guard const lock(m_mutex);
        auto const found = std::find(m_loggers.begin(), m_loggers.end(), logger);
        if (found != m_loggers.end()) {
            m_loggers.erase(found);
        }
    }

    /// Time that passes without a word from the host.
    void pass(obdsim::Time time)
    {
        std::lock_guard const lock(m_mutex);
        pull(m_peer->now() + time);
    }
    obdsim::Time now() const
    {
        std::lock_guard const lock(m_mutex);
        return m_peer->now();
    }
    /// The link is gone from here on.
    void breakLink() { m_broken = true; }
    /// All bytes that the adapter has said so far.
    std::size_t bytesReceived() const { return m_bytesReceived; }

    obdsim::IPeer& peer() { return *m_peer; }

private:
    void pull(obdsim::Time time)
    {
        std::string const bytes = m_peer->advanceTo(time);
        m_bytesReceived += bytes.size();
        m_pending += bytes;
    }

    mutable std::mutex m_mutex; // a leaf, but for the loggers
    std::shared_ptr<obdsim::IPeer> m_peer;
    std::vector<obd::IConnectionLogger*> m_loggers;
    std::string m_pending;
    std::atomic<std::size_t> m_bytesReceived{0};
    std::atomic<char> m_delimiter{'>'};
    std::atomic<bool> m_broken{false};
};
