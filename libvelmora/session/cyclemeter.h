#pragma once

#include "libvelmora/session/dispatchloop.h"

#include <obd/iconnectionmanager.h>
#include <obd/idataconnection.h>

#include <chrono>
#include <mutex>

namespace velmora {

// How much of its time a cycle of repeating requests loses between them. A reading goes by way of the main thread
// before its request is queued again; where nothing else is queued meanwhile, the bus waits. Safe from any thread.
class CycleMeter
{
public:
    using Time = std::chrono::steady_clock::time_point;

    void onRequest(Time now); // something was sent
    void onDone(Time now);    // the worker has done with a reading, its pause to spare slow adapters included

    // The part of the time since the first request in which nothing was asked, 0 to 1.
    double lostShare() const;

private:
    mutable std::mutex m_mutex;
    bool m_begun = false;
    bool m_asking = false;
    Time m_since; // the last change of m_asking
    Time::duration m_asked{0};
    Time::duration m_lost{0};
};

// Feeds a meter from a connection and from the loop that dispatches for as long as it lives.
class CycleTap : public obd::IConnectionLogger
{
public:
    // Both must outlive it.
    CycleTap(obd::IConnectionManager& manager, DispatchLoop& loop);
    ~CycleTap() override;
    CycleTap(CycleTap const&) = delete;
    CycleTap& operator=(CycleTap const&) = delete;

    CycleMeter const& meter() const { return m_meter; }

private:
    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

    obd::IConnectionManager& m_manager;
    DispatchLoop& m_loop;
    CycleMeter m_meter;
};

} // namespace velmora
