#include "libvelmora/output/mqtt/spoolsender.h"
#include "libvelmora/output/mqtt/spooltext.h"
#include "tests/support/process/broker.h"
#include "tests/support/process/smalldisk.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::TemporaryFolder;
using velmora::Spool;
using velmora::SpoolSender;

TEST(MqttSpool, NumbersRiseAndAreNeverUsedAgain)
{
    TemporaryFolder const folder;
    std::string id;
    {
        Spool spool(folder.file("s"), 1 << 20);
        id = spool.id();
        EXPECT_EQ(id.size(), 16U);
        spool.add({"a", "b", "c"});
        spool.forget(2);
        EXPECT_EQ(spool.after(0, 10).size(), 1U);
        spool.forget(3);
    }
    Spool spool(folder.file("s"), 1 << 20);
    EXPECT_EQ(spool.id(), id);
    spool.add({"d"});
    EXPECT_EQ(spool.after(0, 10).at(0).seq, 4);
    EXPECT_NE(Spool(folder.file("t"), 1 << 20).id(), id);
}

TEST(MqttSpool, ACapDropsTheOldestAndTellsWhich)
{
    TemporaryFolder const folder;
    Spool spool(folder.file("s"), 100000);
    EXPECT_EQ(spool.makeRoom().last, 0);
    spool.add(std::vector<std::string>(2000, std::string(100, 'x')));
    Spool::Gap const gap = spool.makeRoom();
    EXPECT_EQ(gap.first, 1);
    EXPECT_EQ(gap.last, 201);
    EXPECT_EQ(spool.dropped(), 201);
    EXPECT_EQ(spool.after(0, 1).at(0).seq, 202);
}

// In a process of its own, on a small disk. Tells how it went by its exit code.
enum SpoolDisk : int
{
    SpoolFine = 0,
    SpoolNoDisk = 20,
    SpoolNoBallast,
    SpoolNeverFull,
    SpoolBallastKept,
    SpoolLost,
    SpoolNotRecovered
};

int fillSpool(std::string const& folder)
{
    if (!testsupport::mountSmallDisk(folder, 8)) {
        return SpoolNoDisk;
    }
    Spool spool(folder + "/s", 1 << 30);
    if (!std::filesystem::exists(folder + "/s-ballast")) {
        return SpoolNoBallast;
    }
    std::vector<std::string> const batch(33, std::string(100, 'x'));
    std::int64_t added = 0;
    try {
        for (; added < 100000; added += 33) {
            spool.add(batch);
        }
        return SpoolNeverFull;
    } catch (velmora::Error const&) {
        if (std::filesystem::exists(folder + "/s-ballast")) {
            return SpoolBallastKept;
        }
    }
    if (spool.rows() != added || spool.newest() != added) {
        return SpoolLost;
    }
    try {
        spool.forget(1000); // which writes, too
        spool.add(batch);
    } catch (velmora::Error const&) {
        return SpoolNotRecovered;
    }
    return spool.rows() == added - 1000 + 33 ? SpoolFine : SpoolLost;
}

TEST(MqttSpool, AFullDiskGivesTheBallastSoThatWhatWasSentCanBeForgotten)
{
    TemporaryFolder const folder;
    pid_t const child = ::fork();
    if (child == 0) {
        ::_exit(fillSpool(folder.path().string()));
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    if (WEXITSTATUS(status) == SpoolNoDisk) {
        GTEST_SKIP() << "a disk of its own can't be mounted here";
    }
    EXPECT_EQ(WEXITSTATUS(status), SpoolFine);
}

// Takes what a sender hands over, and numbers it.
struct Sent
{
    TemporaryFolder const folder;
    Spool spool{folder.file("s"), 1 << 24};
    std::vector<nlohmann::json> batches;
    std::vector<std::string> told;
    bool takes = true;
    SpoolSender sender;
    SpoolSender::Time now{1h};

    explicit Sent(bool waitsForMark)
        : sender(
              spool, "van", waitsForMark,
              [this](std::string const& payload) {
                  batches.push_back(nlohmann::json::parse(payload));
                  return takes ? std::optional(static_cast<int>(batches.size())) : std::nullopt;
              },
              [this](std::string const& text) { told.push_back(text); })
    {}
    void add(int count)
    {
        spool.add(std::vector<std::string>(static_cast<std::size_t>(count), "[0,\"7E8\",\"RPM\",1,\"rpm\"]"));
    }
    void up()
    {
        sender.onUp(now);
        sender.pump();
    }
};

TEST(SpoolSender, ForgetsInOrderAndSendsAgainWhatNobodyVouchedFor)
{
    Sent sent(false);
    sent.add(2500);
    sent.sender.pump();
    EXPECT_TRUE(sent.batches.empty()); // no connection
    sent.up();
    ASSERT_EQ(sent.batches.size(), 3U);
    EXPECT_EQ(sent.batches[1]["after"], 1000);
    EXPECT_EQ(sent.batches[2]["last"], 2500);
    sent.sender.onDelivered(2, sent.now);
    EXPECT_EQ(sent.spool.rows(), 2500); // the first may still be lost
    sent.sender.onDelivered(1, sent.now);
    EXPECT_EQ(sent.spool.rows(), 500);
    sent.sender.onDown();
    sent.sender.onDelivered(3, sent.now); // of the connection that broke
    EXPECT_EQ(sent.spool.rows(), 500);
    sent.up();
    ASSERT_EQ(sent.batches.size(), 4U);
    EXPECT_EQ(sent.batches[3]["after"], 2000);
    EXPECT_EQ(sent.batches[3]["stored"], 2000);
    EXPECT_EQ(sent.batches[3]["readings"].size(), 500U);
    sent.sender.onDelivered(4, sent.now);
    EXPECT_EQ(sent.spool.rows(), 0);
}

TEST(SpoolSender, WaitsForTheConsumersMarkAndBelievesNoneThatCannotBe)
{
    Sent sent(true);
    sent.add(10);
    sent.up();
    sent.sender.onDelivered(1, sent.now);
    EXPECT_EQ(sent.spool.rows(), 10);
    sent.sender.onMark(11, sent.now);
    EXPECT_EQ(sent.spool.rows(), 10);
    EXPECT_THAT(sent.told, ElementsAre(HasSubstr("11, which was never sent")));
    sent.sender.onMark(4, sent.now);
    EXPECT_EQ(sent.spool.rows(), 6);
    sent.sender.onMark(3, sent.now); // an older message
    EXPECT_EQ(sent.spool.rows(), 6);
    sent.now += 29s;
    EXPECT_FALSE(sent.sender.isStuck(sent.now));
    sent.sender.onMark(4, sent.now); // says nothing new
    sent.now += 1s;
    EXPECT_TRUE(sent.sender.isStuck(sent.now)); // lost on the way: over a new connection, then
    sent.up();
    ASSERT_EQ(sent.batches.size(), 2U);
    EXPECT_EQ(sent.batches[1]["after"], 4);
    EXPECT_EQ(sent.batches[1]["last"], 10);
    sent.now += 59s;
    EXPECT_FALSE(sent.sender.isStuck(sent.now)); // a consumer that is away gets it again ever more seldom
    sent.now += 1s;
    EXPECT_TRUE(sent.sender.isStuck(sent.now));
    sent.sender.onMark(9, sent.now);
    sent.now += 30s;
    EXPECT_TRUE(sent.sender.isStuck(sent.now));
    sent.sender.onMark(10, sent.now);
    sent.now += 1h;
    EXPECT_FALSE(sent.sender.isStuck(sent.now)); // nothing waits
}

TEST(SpoolSender, KeepsAWindowAndAMessagesSize)
{
    Sent sent(false);
    sent.add(21000);
    sent.up();
    EXPECT_EQ(sent.batches.size(), 20U);
    sent.sender.onRefused(1);
    sent.takes = false;
    sent.sender.pump();
    EXPECT_EQ(sent.batches.size(), 21U);
    EXPECT_EQ(sent.batches.back()["after"], 0);
    Sent large(false);
    large.spool.add(std::vector<std::string>(10, "{\"text\":\"" + std::string(60000, 'x') + "\"}"));
    large.up();
    EXPECT_EQ(large.batches.size(), 10U);
    EXPECT_EQ(large.batches[0]["events"][0]["seq"], 1);
}

TEST(SpoolSender, HoldsWhatIsNotDatedYetAndMarksWhatNeverWas)
{
    Sent sent(false);
    sent.spool.add({"[5,\"7E8\",\"RPM\",1,\"rpm\"]", R"({"time":6,"event":"x"})", R"({"begin":7,"end":8})"},
                   Spool::Time::Held);
    sent.up();
    EXPECT_TRUE(sent.batches.empty());
    sent.spool.shiftHeld(1000, {"boot", 1000});
    EXPECT_EQ(sent.spool.heldStamp()->offset, 1000);
    sent.spool.release(velmora::ClockJudge::Trust::Never);
    sent.add(1);
    sent.sender.pump();
    ASSERT_EQ(sent.batches.size(), 2U); // one clock a batch
    EXPECT_EQ(sent.batches[0]["clock"], false);
    EXPECT_EQ(sent.batches[0]["readings"][0][1], 1005);
    EXPECT_EQ(sent.batches[0]["events"][0]["time"], 1006);
    EXPECT_EQ(sent.batches[0]["events"][1]["end"], 1008);
    EXPECT_EQ(sent.batches[1]["clock"], true);
    EXPECT_FALSE(sent.spool.heldStamp());
}

} // namespace
