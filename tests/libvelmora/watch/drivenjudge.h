#pragma once

#include "libvelmora/watch/sleepjudge.h"
#include "tests/support/driventime.h"

namespace velmora::test {

// A judge of the vehicle's sleep, and the time that a test lets pass for it.
struct DrivenJudge
{
    testsupport::DrivenTime time;
    SleepJudge judge;

    explicit DrivenJudge(BatterySettings const& settings = {}) : judge(settings, time.steady()) {}

    void pass(std::chrono::milliseconds duration)
    {
        time.pass(duration);
        judge.onTime(time.steady());
    }
    SleepJudge::State volts(double value)
    {
        judge.onVolts(value, time.steady());
        return judge.state();
    }
};

} // namespace velmora::test
