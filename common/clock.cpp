#include <common/clock.h>

#include <atomic>
#include <chrono>
#include <thread>

namespace tervex {
namespace {

// Steady, so that a change of the wall clock neither shortens nor stretches a wait. Starts at one second rather than
// at the machine's uptime, because a time of 0 means "never" to some users of the counter.
class SystemClock : public IClock
{
public:
    unsigned int millis() override
    {
        using namespace std::chrono;
        return static_cast<unsigned int>(duration_cast<milliseconds>(steady_clock::now() - m_start).count() + 1000);
    }
    void sleep(unsigned int ms) override { std::this_thread::sleep_for(std::chrono::milliseconds(ms)); }
    std::time_t wallSeconds() override { return std::time(nullptr); }

private:
    std::chrono::steady_clock::time_point const m_start = std::chrono::steady_clock::now();
};

// Never destroyed: at the process's end threads may still wait and log.
SystemClock& systemClock()
{
    static auto* const instance = new SystemClock;
    return *instance;
}

std::atomic<IClock*> replacedClock{nullptr};

} // namespace

IClock& clock()
{
    IClock* replaced = replacedClock;
    return replaced != nullptr ? *replaced : systemClock();
}

void setClock(IClock* replacement)
{
    replacedClock = replacement;
}

unsigned int currentMillis()
{
    return clock().millis();
}

void sleepMillis(unsigned int ms)
{
    clock().sleep(ms);
}

} // namespace tervex
