#include "libvelmora/session/cyclemeter.h"

#include <gtest/gtest.h>

namespace {

using std::chrono::milliseconds;
using velmora::CycleMeter;

class Cycle : public testing::Test
{
protected:
    void request(int at) { meter.onRequest(CycleMeter::Time() + milliseconds(at)); }
    void done(int at) { meter.onDone(CycleMeter::Time() + milliseconds(at)); }

    CycleMeter meter;
};

TEST_F(Cycle, LosesNothingBeforeItHasBegun)
{
    EXPECT_EQ(meter.lostShare(), 0.0);
    done(500); // something else on the dispatcher
    request(1000);
    EXPECT_EQ(meter.lostShare(), 0.0);
    done(1030);
    EXPECT_EQ(meter.lostShare(), 0.0);
}

TEST_F(Cycle, LosesTheTimeBetweenAReadingAndTheNextRequest)
{
    request(0);
    done(30);
    request(40);
    done(70);
    EXPECT_DOUBLE_EQ(meter.lostShare(), 10.0 / 70.0);
}

TEST_F(Cycle, AReadingOfSeveralRequestsLosesNothingBetweenThem)
{
    request(0);
    request(50);
    done(100);
    EXPECT_EQ(meter.lostShare(), 0.0);
}

} // namespace
