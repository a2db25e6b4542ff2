#include "libvelmora/output/clockjudge.h"

#include <cstdlib>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <sys/timex.h>

namespace velmora {

namespace {

constexpr std::int64_t smallestStep = 2000;           // ms; less is the work of a time server that slews
constexpr std::int64_t untilBelieved = 5 * 60 * 1000; // ms without a step until a clock counts as it is
constexpr std::int64_t earliest = 1735689600000LL;    // 2025 began: this program is younger

std::int64_t millisOf(clockid_t id)
{
    timespec time{};
    ::clock_gettime(id, &time);
    using std::chrono::milliseconds;
    return std::chrono::floor<milliseconds>(std::chrono::seconds(time.tv_sec) + std::chrono::nanoseconds(time.tv_nsec))
        .count();
}

std::string bootId()
{
    std::ifstream in("/proc/sys/kernel/random/boot_id");
    std::string id;
    std::getline(in, id);
    return id;
}

} // namespace

ClockLook lookAtClocks()
{
    // Never destroyed: at the process's end an output that hangs may still be at it.
    static auto const* const id = new std::string(bootId());
    static bool const battery = hasClockBattery("/sys/class/rtc");
    timex state{};
    bool const synced = knowsTimeServer(::adjtimex(&state), state.status);
    return {millisOf(CLOCK_REALTIME), millisOf(CLOCK_BOOTTIME), synced, *id, battery};
}

bool knowsTimeServer(int result, int status)
{
    return result != -1 && (status & STA_UNSYNC) == 0;
}

bool hasClockBattery(std::filesystem::path const& clocks)
{
    std::error_code error;
    for (auto const& each : std::filesystem::directory_iterator(clocks, error)) {
        std::ifstream in(each.path() / "hctosys");
        if (in.get() == '1') {
            return true;
        }
    }
    return false;
}

ClockStamp stampOf(ClockLook const& look)
{
    return {look.bootId, look.wall - look.boot};
}

std::int64_t stepBetween(std::int64_t offsetBefore, std::int64_t offset)
{
    std::int64_t const step = offset - offsetBefore;
    return std::llabs(step) < smallestStep ? 0 : step;
}

std::int64_t ClockJudge::look(ClockLook const& now)
{
    std::int64_t const offset = now.wall - now.boot;
    std::int64_t const step = m_known ? stepBetween(m_offset, offset) : 0;
    if (step != 0) {
        m_lastSet = now.boot;
    }
    m_known = true;
    m_offset = offset;
    bool const stable = now.boot - m_lastSet >= untilBelieved;
    if (now.synced || ((stable || now.battery) && now.wall >= earliest)) {
        m_trust = Trust::Sure;
    } else {
        m_trust = stable ? Trust::Never : Trust::Wait;
    }
    return step;
}

} // namespace velmora
