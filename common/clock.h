#pragma once

#include <ctime>

namespace tervex {

// The one source of time. Tests replace it, so that waiting costs nothing.
class IClock
{
public:
    virtual ~IClock() = default;

    // A counter of milliseconds that wraps at 2^32.
    virtual unsigned int millis() = 0;
    virtual void sleep(unsigned int ms) = 0;
    // Seconds since the epoch, as std::time gives them.
    virtual std::time_t wallSeconds() = 0;
};

// The clock in force: the system's, unless a test has put in another.
IClock& clock();

// Puts in a clock, or the system's with nullptr. The clock must outlive its stay; swap only while no thread waits.
void setClock(IClock* replacement);

// A counter of milliseconds. Take differences modulo 2^32, so that they survive the wrap.
unsigned int currentMillis();

// Blocks the calling thread.
void sleepMillis(unsigned int ms);

} // namespace tervex
