#pragma once

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>

namespace velmora {

// What the machine's clocks tell at one moment. A machine without a clock battery starts in the past until a time
// server sets it; the time since boot goes on through that, and through suspension.
struct ClockLook
{
    std::int64_t wall = 0; // ms since 1970
    std::int64_t boot = 0; // ms since the machine's start
    bool synced = false;   // the kernel knows of a time server
    std::string bootId;    // new with each start of the machine
    bool battery = false;  // at that start it was set by a clock that runs on without power
};

using ClockSource = std::function<ClockLook()>;

// By which clock something was dated: the machine's start, and how far the wall clock was ahead of the time since then.
struct ClockStamp
{
    std::string bootId;
    std::int64_t offset = 0; // ms
};
ClockStamp stampOf(ClockLook const& look);

// By how many milliseconds the clock was set between two offsets; 0 for what a time server slews.
std::int64_t stepBetween(std::int64_t offsetBefore, std::int64_t offset);

// The machine's own.
ClockLook lookAtClocks();

// What adjtimex tells by its result and the status bits.
bool knowsTimeServer(int result, int status);

// Whether one of the clocks in that folder of the kernel's has set the system clock at the start.
bool hasClockBattery(std::filesystem::path const& clocks);

// Judges whether the wall clock can be believed, by its way beside the time since boot.
class ClockJudge
{
public:
    enum class Trust
    {
        Wait, // it may still be set
        Sure,
        Never, // it was not set in all that time, and can't be right
    };

    // Takes a look; tells by how many milliseconds the clock was set since the look before, 0 if it only ran on.
    std::int64_t look(ClockLook const& now);
    Trust trust() const { return m_trust; }

private:
    bool m_known = false;
    std::int64_t m_offset = 0;  // wall less boot
    std::int64_t m_lastSet = 0; // on the clock since boot
    Trust m_trust = Trust::Wait;
};

} // namespace velmora
