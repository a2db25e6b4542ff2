#pragma once

#include "tests/support/dispatchloop.h"
#include "tests/support/wire/peerconnection.h"

#include <common/clock.h>

#include <atomic>
#include <memory>
#include <thread>

// The library's time is the simulated adapter's: pauses between requests are driven through. The worker's polls of an
// empty queue cost none, so that a drive is the same on every machine. Each clock begins an hour after the one before,
// for the derived sensors keep their samples from connection to connection. In force for its lifetime.
class DriveClock : public tervex::IClock
{
public:
    explicit DriveClock(std::shared_ptr<PeerConnection> car) : m_car(std::move(car)), m_begin(s_nextBegin)
    {
        s_nextBegin += 3600000;
        tervex::setClock(this);
    }
    ~DriveClock() override { tervex::setClock(nullptr); }
    DriveClock(DriveClock const&) = delete;
    DriveClock& operator=(DriveClock const&) = delete;

    unsigned int millis() override
    {
        return m_begin + static_cast<unsigned int>(std::chrono::duration_cast<obdsim::Ms>(m_car->now()).count());
    }
    void sleep(unsigned int ms) override
    {
        static constexpr unsigned int pollMs = 10;
        if (ms == pollMs) {
            std::this_thread::sleep_for(std::chrono::microseconds(10));
            return;
        }
        if (support::DispatchLoop* const loop = m_followed) {
            loop->awaitCaughtUp();
        }
        m_car->pass(obdsim::Ms(ms));
    }

    // From now on no pause passes before the loop has dispatched what was asked of it, so that a busy machine, on which
    // the application hears of readings late, drives the same as an idle one. Null ends it.
    void follow(support::DispatchLoop* loop) { m_followed = loop; }

    std::time_t wallSeconds() override { return 1709802302; }

private:
    static inline unsigned int s_nextBegin = 0;

    std::shared_ptr<PeerConnection> m_car;
    unsigned int const m_begin;
    std::atomic<support::DispatchLoop*> m_followed{nullptr};
};
