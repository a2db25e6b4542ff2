// What stands before an output of lines while the clock may still be set.
#include "libvelmora/output/holdingoutput.h"
#include "libvelmora/output/recordtime.h"
#include "tests/support/records.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::march;
using testsupport::reading;
using testsupport::records;
using velmora::ClockLook;

struct HeldBack
{
    ClockLook look{march, 1000, false, "boot"};
    std::vector<std::string> calls;
    std::vector<std::string> told;
    std::vector<std::int64_t> times;
    velmora::HoldingOutput output;

    HeldBack() : output(std::make_unique<Inner>(*this), velmora::parseOutputAddress("csv:a"), context()) {}

    velmora::OutputContext context()
    {
        velmora::OutputContext context;
        context.clocks = [this] { return look; };
        context.tell = [this](std::string const& text) { told.push_back(text); };
        return context;
    }
    std::vector<std::string> write(int count)
    {
        calls.clear();
        std::vector<velmora::SharedRecord> batch;
        for (int i = 0; i < count; ++i) {
            batch.push_back(records(reading("RPM", 1.0, look.wall))[0]);
        }
        output.write(batch);
        return calls;
    }

private:
    struct Inner : velmora::IOutput
    {
        explicit Inner(HeldBack& theHeld) : held(theHeld) {}
        void open() override { held.calls.emplace_back("open"); }
        void write(velmora::Records records) override
        {
            held.calls.push_back("write " + std::to_string(records.size()));
            for (velmora::SharedRecord const& each : records) {
                held.times.push_back(velmora::toMillis(velmora::timeOf(*each)));
            }
        }
        void close() override { held.calls.emplace_back("close"); }
        velmora::OutputState state() override { return {true, 3}; }

        HeldBack& held;
    };
};

TEST(HoldingOutput, KeepsTheOutputGoingWhileItHoldsLinesBack)
{
    HeldBack held;
    held.output.open();
    EXPECT_THAT(held.calls, ElementsAre("open"));
    EXPECT_EQ(velmora::HoldingOutput::most, 20000U);
    EXPECT_EQ(held.output.state().waiting, 3U) << "its own";
    EXPECT_THAT(held.write(2), ElementsAre("write 0")) << "what it does by time goes on";
    EXPECT_EQ(held.output.state().waiting, 2U);
    EXPECT_EQ(held.output.state().up, true);
    held.look.synced = true;
    EXPECT_THAT(held.write(1), ElementsAre("write 3"));
    EXPECT_EQ(held.output.state().waiting, 3U);
    EXPECT_THAT(held.write(0), ElementsAre("write 0"));
    held.look.synced = false; // the time server is gone
    EXPECT_THAT(held.write(1), ElementsAre("write 0"));
    held.calls.clear();
    held.output.close();
    EXPECT_THAT(held.calls, ElementsAre("write 1", "close"));
    EXPECT_EQ(held.output.state().waiting, 3U);
    EXPECT_EQ(held.told.size(), 1U);
}

TEST(HoldingOutput, RepairsNothingOnceTheClockIsRight)
{
    HeldBack held;
    held.output.open();
    held.write(1);
    held.look.synced = true;
    held.write(1);
    held.look.wall += 3600000; // summer time, by somebody's mistake
    auto const stamped = records(reading("RPM", 1.0, march));
    held.output.write(stamped);
    EXPECT_THAT(held.times, ElementsAre(march, march, march));
}

TEST(HoldingOutput, TellsOnceThatNobodySetsTheClock)
{
    HeldBack held;
    held.look = {1000, 1000, false, "boot"};
    held.output.open();
    held.look = {300000, 300000, false, "boot"};
    EXPECT_THAT(held.told, IsEmpty());
    EXPECT_THAT(held.write(1), ElementsAre("write 1"));
    EXPECT_THAT(held.write(1), ElementsAre("write 1"));
    EXPECT_THAT(held.told, ElementsAre("csv:a: the clock was not set since the machine's start; times are written as "
                                       "it tells them"));
    held.calls.clear();
    held.output.close();
    EXPECT_THAT(held.calls, ElementsAre("close")) << "nothing is left";
    EXPECT_EQ(held.told.size(), 1U);
}

} // namespace
