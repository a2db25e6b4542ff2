#pragma once

#include <common/clock.h>

#include <atomic>

namespace support {

// Time that a test moves. Puts itself in force for its lifetime; sleeping moves it on at once.
class FakeClock : public tervex::IClock
{
public:
    explicit FakeClock(unsigned int startMs = 1000, std::time_t wall = 1709802302) : m_millis(startMs), m_wall(wall)
    {
        tervex::setClock(this);
    }
    ~FakeClock() override { tervex::setClock(nullptr); }
    FakeClock(FakeClock const&) = delete;
    FakeClock& operator=(FakeClock const&) = delete;

    unsigned int millis() override { return m_millis; }
    void sleep(unsigned int ms) override { m_millis += ms; }
    std::time_t wallSeconds() override { return m_wall; }

    void advance(unsigned int ms) { m_millis += ms; }
    void setWallSeconds(std::time_t wall) { m_wall = wall; }

private:
    std::atomic<unsigned int> m_millis;
    std::atomic<std::time_t> m_wall;
};

} // namespace support
