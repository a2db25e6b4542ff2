#include "libvelmora/output/clockkeeper.h"
#include "tests/support/records.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using testsupport::march;
using testsupport::reading;
using velmora::ClockKeeper;
using velmora::ClockLook;
using velmora::ClockStamp;

// Rows as a keeper finds them, with what it did to them.
struct NotedRows final : velmora::IHeldRows
{
    std::optional<ClockStamp> stamp;
    std::vector<std::string> done;

    std::optional<ClockStamp> heldStamp() override { return stamp; }
    void keepStamp(ClockStamp const& kept) override
    {
        stamp = kept;
        done.push_back("stamp " + kept.bootId + " " + std::to_string(kept.offset));
    }
    void shiftHeld(std::int64_t millis, ClockStamp const& kept) override
    {
        stamp = kept;
        done.push_back("shift " + std::to_string(millis));
    }
    void release(velmora::ClockJudge::Trust trust) override
    {
        stamp.reset();
        done.push_back(trust == velmora::ClockJudge::Trust::Sure ? "sure" : "never");
    }
};

class ClockKeeperTest : public testing::Test
{
protected:
    std::vector<std::string> begin()
    {
        m_rows.done.clear();
        m_keeper.begin(m_rows);
        return m_rows.done;
    }
    std::vector<std::string> resume()
    {
        m_rows.done.clear();
        m_keeper.resume(m_rows);
        return m_rows.done;
    }
    std::int64_t dated(std::int64_t millis) const
    {
        auto const record = std::make_shared<velmora::Record const>(reading("RPM", 1.0, millis));
        return velmora::toMillis(std::get<velmora::Reading>(*m_keeper.dated(record)).time);
    }

    ClockLook m_look{1000000, 20000, false, "one"};
    NotedRows m_rows;
    ClockKeeper m_keeper{[this] { return m_look; }};
};

TEST_F(ClockKeeperTest, HoldsAndRepairsWhatAWrongClockDated)
{
    EXPECT_THAT(resume(), ElementsAre("stamp one 980000"));
    m_look = {1001000, 21000, false, "one"};
    EXPECT_THAT(begin(), ElementsAre()) << "held by the same clock";
    EXPECT_EQ(dated(1000500), 1000500);
    m_keeper.done();
    std::int64_t const step = march - 1003000;
    m_look = {march, 23000, true, "one"};
    EXPECT_THAT(begin(), ElementsAre("shift " + std::to_string(step), "sure"));
    EXPECT_EQ(dated(1002000), 1002000 + step) << "stamped before the clock was set";
    EXPECT_EQ(dated(march - 1000), march - 1000) << "and behind that";
    std::int64_t const middle = march - step / 2;
    EXPECT_EQ(dated(middle), middle) << "as near to either";
    EXPECT_EQ(dated(middle - 1), middle - 1 + step);
    m_keeper.done();
    m_look = {march + 5000, 24000, true, "one"};
    EXPECT_THAT(begin(), ElementsAre()) << "nothing is held any more";
    EXPECT_EQ(dated(march), march);
    EXPECT_EQ(m_keeper.look().boot, 24000);
}

TEST_F(ClockKeeperTest, GivesUpWhatAnotherStartOfTheMachineDated)
{
    m_rows.stamp = ClockStamp{"before", 980000};
    EXPECT_THAT(resume(), ElementsAre("never")) << "nobody will ever know how wrong they are";
    EXPECT_THAT(begin(), ElementsAre("stamp one 980000"));
}

TEST_F(ClockKeeperTest, GoesOnWhereAnEarlierRunHeldRows)
{
    m_rows.stamp = ClockStamp{"one", 970000};
    EXPECT_THAT(resume(), ElementsAre("shift 10000"));
    EXPECT_THAT(resume(), ElementsAre()) << "they are dated right already";
    m_look = {march, 20000, true, "one"};
    EXPECT_THAT(resume(), ElementsAre("shift " + std::to_string(march - 1000000), "sure"));
}

TEST_F(ClockKeeperTest, HoldsNothingUnderAClockThatIsSure)
{
    m_look.synced = true;
    EXPECT_THAT(resume(), ElementsAre());
    EXPECT_EQ(m_keeper.trust(), velmora::ClockJudge::Trust::Sure);
    m_look.wall += 100000;
    EXPECT_THAT(begin(), ElementsAre());
    EXPECT_EQ(dated(1000000), 1000000) << "nothing was held";
}

TEST_F(ClockKeeperTest, RepeatsAStepThatWasNotDone)
{
    resume();
    m_look = {march, 22000, false, "one"};
    begin();
    EXPECT_EQ(dated(1001000), 1001000 + march - 1002000);
    m_rows.stamp = ClockStamp{"one", 980000}; // the change was rolled back
    EXPECT_THAT(begin(), testing::Contains("shift " + std::to_string(march - 1002000)));
    EXPECT_EQ(dated(1001000), 1001000 + march - 1002000) << "the same records come again";
}

} // namespace
