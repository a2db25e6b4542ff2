// The file of a spool, and what its sender does when that or the connection fails.
#include "libvelmora/output/mqtt/spoolsender.h"
#include "tests/support/process/broker.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::TemporaryFolder;
using velmora::Database;
using velmora::Spool;
using velmora::SpoolSender;

std::string spoolTrouble(std::string const& file)
{
    try {
        Spool(file, 1 << 20);
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
        return error.what();
    }
    return "";
}

TEST(SpoolFile, IsNoOtherDatabase)
{
    TemporaryFolder const folder;
    Database(folder.file("other")).execute("CREATE TABLE x (y)");
    EXPECT_EQ(spoolTrouble(folder.file("other")), folder.file("other") + " is no spool");
    EXPECT_EQ(spoolTrouble(folder.file("s")), "");
    EXPECT_EQ(spoolTrouble(folder.file("s")), "") << "again";
    Database(folder.file("s")).execute("DELETE FROM meta");
    EXPECT_EQ(spoolTrouble(folder.file("s")), folder.file("s") + " is no spool");
}

TEST(SpoolFile, KeepsAMegabyteOfBallast)
{
    TemporaryFolder const folder;
    Spool spool(folder.file("s"), 1 << 20);
    EXPECT_EQ(std::filesystem::file_size(folder.file("s-ballast")), 1U << 20U);
    std::filesystem::remove(folder.file("s-ballast"));
    spool.add({"a"});
    spool.forget(0);
    EXPECT_TRUE(std::filesystem::exists(folder.file("s-ballast"))) << "there is room again";
    Database(folder.file("s")).execute("DROP TABLE row");
    EXPECT_THROW(spool.add({"b"}), velmora::Error);
    EXPECT_TRUE(std::filesystem::exists(folder.file("s-ballast"))) << "the disk is not full";
}

TEST(SpoolFile, CountsWhatItHoldsAndHeld)
{
    TemporaryFolder const folder;
    Spool spool(folder.file("s"), 1 << 20);
    EXPECT_EQ(spool.span(), 0);
    EXPECT_EQ(spool.newest(), 0);
    spool.add({"a", "b", "c", "d"}, Spool::Time::Unsure);
    EXPECT_EQ(spool.span(), 4);
    spool.forget(1);
    EXPECT_EQ(spool.span(), 3);
    std::vector<Spool::Row> const rows = spool.after(2, 1);
    ASSERT_EQ(rows.size(), 1U) << "no more than that";
    EXPECT_EQ(rows[0].seq, 3);
    EXPECT_EQ(rows[0].text, "c");
    EXPECT_EQ(rows[0].time, Spool::Time::Unsure);
    spool.forget(4);
    EXPECT_EQ(spool.span(), 0);
    EXPECT_EQ(spool.newest(), 4);
    using Trust = velmora::ClockJudge::Trust;
    EXPECT_EQ(Spool::timeBy(Trust::Wait), Spool::Time::Held);
    EXPECT_EQ(Spool::timeBy(Trust::Sure), Spool::Time::Sure);
    EXPECT_EQ(Spool::timeBy(Trust::Never), Spool::Time::Unsure);
}

TEST(SpoolFile, KeepsItsStampUntilItIsReleased)
{
    TemporaryFolder const folder;
    {
        Spool spool(folder.file("s"), 1 << 20);
        EXPECT_FALSE(spool.heldStamp());
        spool.keepStamp({"boot", 12345});
        spool.add({"[5]", "[6]"}, Spool::Time::Held);
    }
    Spool spool(folder.file("s"), 1 << 20);
    EXPECT_EQ(spool.heldStamp()->bootId, "boot");
    EXPECT_EQ(spool.heldStamp()->offset, 12345);
    spool.shiftHeld(10, {"boot", 12355});
    EXPECT_EQ(spool.heldStamp()->offset, 12355);
    EXPECT_TRUE(spool.after(0, 9).empty());
    spool.release(velmora::ClockJudge::Trust::Sure);
    EXPECT_FALSE(spool.heldStamp());
    EXPECT_EQ(spool.after(0, 9).at(0).text, "[15]");
    EXPECT_EQ(spool.after(0, 9).at(1).text, "[16]");
    spool.shiftHeld(10, {"boot", 12365});
    EXPECT_EQ(spool.after(0, 9).at(0).text, "[15]") << "is dated for good";
}

TEST(SpoolFile, MakesRoomAboveItsSizeAndNotAtIt)
{
    TemporaryFolder const folder;
    Spool(folder.file("s"), 1 << 20).add(std::vector<std::string>(400, std::string(100, 'x')));
    Database counter(folder.file("s"), Database::Access::ReadOnly);
    auto const used = static_cast<unsigned long long>(
        (counter.number("PRAGMA page_count") - counter.number("PRAGMA freelist_count")) *
        counter.number("PRAGMA page_size"));
    EXPECT_GT(used, 40000U);
    EXPECT_EQ(Spool(folder.file("s"), used).makeRoom().last, 0);
    Spool spool(folder.file("s"), used - 1);
    Spool::Gap const gap = spool.makeRoom();
    EXPECT_EQ(gap.first, 1);
    EXPECT_EQ(gap.last, 41);
    EXPECT_EQ(spool.rows(), 359);
    while (spool.makeRoom().last > 0) {
    }
    EXPECT_GT(spool.rows(), 250) << "pages that are free count no longer";
    std::int64_t const dropped = spool.dropped();
    EXPECT_EQ(dropped, 400 - spool.rows());
    spool.forget(400);
    Spool tiny(folder.file("s"), 1);
    EXPECT_EQ(tiny.makeRoom().last, 0) << "there is nothing to drop";
    EXPECT_EQ(tiny.dropped(), dropped);
}

// A sender, and what it hands over.
struct Sending
{
    TemporaryFolder folder;
    Spool spool{folder.file("s"), 1 << 24};
    std::vector<nlohmann::json> sent;
    std::vector<std::string> told;
    SpoolSender::Time now{100h};
    SpoolSender sender;

    explicit Sending(bool waitsForMark)
        : sender(
              spool, "van", waitsForMark,
              [this](std::string const& payload) {
                  sent.push_back(nlohmann::json::parse(payload));
                  return std::optional(static_cast<int>(sent.size()));
              },
              [this](std::string const& text) { told.push_back(text); })
    {}
    // Rows that go in a batch of their own each.
    void addBatches(int count)
    {
        for (int i = 0; i < count; ++i) {
            spool.add({"[1]"}, (spool.newest() + 1) % 2 == 0 ? Spool::Time::Sure : Spool::Time::Unsure);
        }
    }
    void up()
    {
        sender.onUp(now);
        sender.pump();
    }
};

TEST(SpoolSending, CutsAtAHundredThousandBytes)
{
    Sending sending(false);
    sending.spool.add({"[\"" + std::string(50000 - 4, 'x') + "\"]", "[\"" + std::string(50001 - 4, 'x') + "\"]"});
    sending.up();
    EXPECT_EQ(sending.sent.size(), 2U);
}

TEST(SpoolSending, ForgetsNothingThatIsKeptByALaterDelivery)
{
    Sending sending(false);
    sending.addBatches(3);
    sending.up();
    ASSERT_EQ(sending.sent.size(), 3U);
    sending.sender.onDelivered(1, sending.now);
    sending.sender.onDelivered(3, sending.now);
    EXPECT_EQ(sending.spool.rows(), 2);
    sending.sender.onDown();
    sending.up();
    ASSERT_EQ(sending.sent.size(), 5U);
    EXPECT_EQ(sending.sent[3]["after"], 1);
    EXPECT_EQ(sending.sent[3]["stored"], 1);
}

TEST(SpoolSending, KnowsNothingOfTheBatchesOfAConnectionThatBroke)
{
    Sending sending(false);
    sending.spool.add({"[1]"});
    sending.up();
    sending.sender.onDown();
    sending.spool.add({"[2]"});
    sending.up();
    ASSERT_EQ(sending.sent.size(), 2U);
    EXPECT_EQ(sending.sent[1]["last"], 2) << "both at once";
    sending.sender.onDelivered(2, sending.now);
    EXPECT_EQ(sending.spool.rows(), 0);
    EXPECT_FALSE(sending.sender.isUnderway());
}

TEST(SpoolSending, HasPatienceFromEachDeliveryOn)
{
    Sending sending(false);
    sending.addBatches(2);
    sending.now += 1h;
    sending.up();
    EXPECT_FALSE(sending.sender.isStuck(sending.now + 29s)) << "since it is up";
    sending.now += 29s;
    sending.sender.onDelivered(1, sending.now);
    EXPECT_FALSE(sending.sender.isStuck(sending.now + 29s));
    EXPECT_TRUE(sending.sender.isUnderway());
    sending.now += 30s;
    EXPECT_TRUE(sending.sender.isStuck(sending.now));
    sending.sender.onDelivered(2, sending.now);
    EXPECT_FALSE(sending.sender.isUnderway());
    EXPECT_FALSE(sending.sender.isStuck(sending.now + 1h)) << "all has arrived";
}

TEST(SpoolSending, SendsOnBehindAMark)
{
    Sending sending(true);
    sending.addBatches(2);
    sending.up();
    sending.addBatches(1);
    sending.sender.onMark(1, sending.now);
    ASSERT_EQ(sending.sent.size(), 3U) << "what has come meanwhile";
    EXPECT_EQ(sending.sent[2]["after"], 2);
    EXPECT_EQ(sending.sent[2]["stored"], 1);
    sending.sender.onDown();
    sending.sender.onUp(sending.now);
    sending.sender.onMark(2, sending.now); // of what the connection before had sent
    ASSERT_EQ(sending.sent.size(), 4U);
    EXPECT_EQ(sending.sent[3]["after"], 2);
}

TEST(SpoolSending, TellsAFileThatFails)
{
    Sending sending(false);
    sending.addBatches(2);
    sending.up();
    Database(sending.folder.file("s")).execute("ALTER TABLE row RENAME TO other");
    sending.sender.onDelivered(1, sending.now);
    EXPECT_THAT(sending.told, ElementsAre(HasSubstr("Could not use"), HasSubstr("Could not use")))
        << "neither forgotten nor read";
    Database(sending.folder.file("s")).execute("ALTER TABLE other RENAME TO row");
    sending.sender.onDelivered(2, sending.now);
    EXPECT_EQ(sending.spool.rows(), 0);
}

} // namespace
