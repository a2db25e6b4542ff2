#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/output/holdingoutput.h"
#include "libvelmora/output/opening/outputfactory.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::ClockLook;
using velmora::fromMillis;
using velmora::SqliteOutput;

// A machine that starts in 1970 until a time server sets its clock. Times are told in milliseconds since its start.
struct YoungMachine
{
    ClockLook look{0, 0, false, "boot-1"};
    std::vector<std::string> told;

    void at(std::int64_t boot) { look = {look.wall - look.boot + boot, boot, look.synced, look.bootId}; }
    // It turns out that it was started in March.
    void set(bool byServer = true)
    {
        look.wall = march + look.boot;
        look.synced = byServer;
    }
    velmora::OutputContext context()
    {
        velmora::OutputContext context;
        context.clocks = [this] { return look; };
        context.tell = [this](std::string const& text) { told.push_back(text); };
        return context;
    }
    // Made so long ago by the clock that ruled then.
    velmora::Reading rpm(double value, std::int64_t time) const
    {
        return reading("RPM", value, look.wall - look.boot + time);
    }
};

std::vector<std::string> numbers(velmora::Database& database, std::string const& sql)
{
    std::vector<std::string> result;
    velmora::Statement statement(database, sql);
    while (statement.next()) {
        result.push_back(statement.text(0));
    }
    return result;
}

std::string const readingsSince =
    "SELECT (time - " + std::to_string(march) + ") || '=' || value FROM reading ORDER BY 1";

TEST(ClockRepair, ADatabaseIsRepairedInItsTables)
{
    TemporaryFolder const folder;
    YoungMachine machine;
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + folder.file("a.db")), machine.context().clocks);
    output.open();
    machine.at(5000);
    velmora::Trip trip;
    trip.begin = fromMillis(1000);
    trip.end = fromMillis(4000);
    output.write(records(machine.rpm(1.0, 3000), machine.rpm(2.0, 3002), machine.rpm(3.0, 5000),
                         velmora::Event{fromMillis(4500), "van", "lamp_on", 0x7E8, ""},
                         velmora::Event{fromMillis(4500), "van", "engine_start", {}, ""},
                         velmora::ModuleInfo{fromMillis(4000), "van", 0x7E8, "ECM", "", ""},
                         velmora::CodeChange{fromMillis(4000), "van", 0x7E8, "P0301", "pending", "", true},
                         velmora::CodeChange{fromMillis(4600), "van", 0x7E8, "P0301", "pending", "", false}, trip));
    EXPECT_EQ(output.database().number("SELECT count(*) FROM undated"), 9);
    velmora::Reading const late = machine.rpm(4.0, 6900); // still by the old clock
    machine.at(7000);
    machine.set();
    output.write(records(late, machine.rpm(5.0, 6950)));
    velmora::Database& database = output.database();
    EXPECT_THAT(numbers(database, readingsSince), ElementsAre("3000=1", "3002=2", "5000=3", "6900=4", "6950=5"));
    auto const since = [&](std::string const& column, std::string const& table) {
        return numbers(database, "SELECT " + column + " - " + std::to_string(march) + " FROM " + table);
    };
    EXPECT_THAT(since("time", "event"), ElementsAre("4500", "4500"));
    EXPECT_THAT(since("begin", "trip"), ElementsAre("1000"));
    EXPECT_THAT(since("end", "trip"), ElementsAre("4000"));
    EXPECT_THAT(since("seen", "module"), ElementsAre("4000"));
    EXPECT_THAT(since("since", "code"), ElementsAre("4000"));
    EXPECT_THAT(since("gone", "code"), ElementsAre("4600"));
    EXPECT_EQ(database.number("SELECT count(*) FROM undated"), 0);
    EXPECT_EQ(database.number("SELECT count(*) FROM clock"), 0);
}

// Rows that move onto the places of others of theirs.
TEST(ClockRepair, ADatabaseLosesNoReadingThatMovesOntoAnother)
{
    for (std::int64_t const step : {3000, -3000}) {
        TemporaryFolder const folder;
        YoungMachine machine;
        machine.look = {march, 0, false, "boot-1"};
        SqliteOutput output(velmora::parseOutputAddress("sqlite:" + folder.file("a.db")), machine.context().clocks);
        output.open();
        std::vector<velmora::SharedRecord> rows;
        for (int i = 0; i < 9; ++i) {
            rows.push_back(std::make_shared<velmora::Record const>(machine.rpm(i, 1000 * i)));
        }
        output.write(rows);
        machine.at(9000);
        machine.look.wall += step;
        machine.look.synced = true;
        output.write({});
        EXPECT_EQ(output.database().number("SELECT count(*) FROM reading"), 9) << step;
        EXPECT_EQ(output.database().number("SELECT min(time) FROM reading"), march + step);
        EXPECT_EQ(output.database().number("SELECT sum(value * time) - sum(value) * " + std::to_string(march + step) +
                                           " FROM reading"),
                  204 * 1000); // each value has its own time still: the sum of squares to 8
    }
}

TEST(ClockRepair, ADatabaseRemembersAcrossRunsAndTellsWhatNobodyWillKnow)
{
    TemporaryFolder const folder;
    YoungMachine machine;
    auto const address = velmora::parseOutputAddress("sqlite:" + folder.file("a.db"));
    auto const run = [&](double value, std::int64_t time) {
        SqliteOutput output(address, machine.context().clocks);
        output.open();
        machine.at(time);
        output.write(records(machine.rpm(value, time)));
        output.close();
    };
    run(1.0, 1000);
    machine.set(false); // between two runs of the watch; by whom is not known
    run(2.0, 2000);
    machine.look.bootId = "boot-2"; // the machine was started anew before anybody was sure
    machine.look.synced = true;
    run(3.0, 3000);
    velmora::Database database(folder.file("a.db"));
    EXPECT_THAT(numbers(database, readingsSince), ElementsAre("1000=1", "2000=2", "3000=3"));
    EXPECT_THAT(numbers(database, "SELECT place || ' ' || boot || ' ' || (time - " + std::to_string(march) +
                                      ") FROM undated ORDER BY time"),
                ElementsAre("reading boot-1 1000", "reading boot-1 2000"));
}

TEST(ClockRepair, AnOlderDatabaseGetsTheTables)
{
    TemporaryFolder const folder;
    auto const address = velmora::parseOutputAddress("sqlite:" + folder.file("a.db"));
    for (int i = 0; i < 2; ++i) {
        SqliteOutput output(address);
        output.open();
        output.write(records(reading("RPM", 1.0, march + i)));
        EXPECT_EQ(output.database().number("PRAGMA user_version"), 2);
        EXPECT_EQ(output.database().number("SELECT count(*) FROM reading"), i + 1);
        output.database().execute("DROP TABLE undated; DROP TABLE clock; PRAGMA user_version=1");
        output.close();
    }
}

TEST(ClockRepair, LinesWaitUntilTheClockIsRight)
{
    TemporaryFolder const folder;
    for (std::string const& kind : {std::string("csv-long:"), std::string("ndjson:"), std::string("influx:")}) {
        YoungMachine machine;
        std::string const file = kind.substr(0, kind.size() - 1);
        auto const output =
            velmora::makeOutput(velmora::parseOutputAddress(kind + folder.file(file)), machine.context());
        output->open();
        machine.at(5000);
        output->write(records(machine.rpm(1.0, 4000)));
        output->write({});
        EXPECT_EQ(output->state().waiting, 1U) << kind;
        velmora::Reading const late = machine.rpm(2.0, 6900);
        machine.at(7000);
        machine.set();
        output->write(records(late, machine.rpm(3.0, 6950)));
        EXPECT_FALSE(output->state().waiting) << kind;
        output->close();
        std::istringstream in(folder.read(file));
        std::vector<std::string> times;
        for (std::string line; std::getline(in, line);) {
            for (std::int64_t const time : {4000, 6900, 6950}) {
                std::string const text = kind == "influx:" ? std::to_string(march + time) + "000000"
                                                           : velmora::utcTime(fromMillis(march + time));
                if (line.find(text) != std::string::npos) {
                    times.push_back(std::to_string(time));
                }
            }
        }
        EXPECT_THAT(times, ElementsAre("4000", "6900", "6950")) << kind << folder.read(file);
        EXPECT_THAT(machine.told, IsEmpty());
    }
}

TEST(ClockRepair, LinesThatNobodyCanDateAreWrittenAsTheyAreAndThatIsTold)
{
    TemporaryFolder const folder;
    YoungMachine machine;
    auto const output =
        velmora::makeOutput(velmora::parseOutputAddress("csv-long:" + folder.file("a")), machine.context());
    output->open();
    output->write(records(machine.rpm(1.0, 0)));
    machine.at(299000);
    output->write({});
    EXPECT_EQ(folder.read("a").find("1970-01-01T00:00:00.000Z"), std::string::npos);
    machine.at(300000);
    output->write(records(machine.rpm(2.0, 300000)));
    output->close();
    EXPECT_THAT(folder.read("a"), HasSubstr("1970-01-01T00:00:00.000Z,van"));
    EXPECT_THAT(folder.read("a"), HasSubstr("1970-01-01T00:05:00.000Z,van"));
    EXPECT_THAT(machine.told, ElementsAre(HasSubstr("the clock was not set")));

    YoungMachine hasty; // the watch ends before anybody knows
    auto const other =
        velmora::makeOutput(velmora::parseOutputAddress("csv-long:" + folder.file("b")), hasty.context());
    other->open();
    other->write(records(hasty.rpm(1.0, 0)));
    other->close();
    EXPECT_THAT(folder.read("b"), HasSubstr("1970-01-01T00:00:00.000Z,van"));
    EXPECT_THAT(hasty.told, ElementsAre(HasSubstr("the clock was not set")));
}

TEST(ClockRepair, OnlySoManyLinesWait)
{
    TemporaryFolder const folder;
    YoungMachine machine;
    auto const output =
        velmora::makeOutput(velmora::parseOutputAddress("csv-long:" + folder.file("a")), machine.context());
    output->open();
    std::vector<velmora::SharedRecord> const many(velmora::HoldingOutput::most, records(machine.rpm(1.0, 0))[0]);
    output->write(many);
    std::uintmax_t const header = std::filesystem::file_size(folder.file("a"));
    EXPECT_THAT(machine.told, IsEmpty());
    output->write(records(machine.rpm(1.0, 0)));
    std::string const text = folder.read("a").substr(header);
    EXPECT_EQ(std::ranges::count(text, '\n'), velmora::HoldingOutput::most + 1);
    EXPECT_THAT(machine.told, ElementsAre(HasSubstr("the clock was not set")));
    output->close();
}

// What can't be written is given again, and repaired no second time.
TEST(ClockRepair, AFailedWriteLosesNoRepair)
{
    TemporaryFolder const folder;
    YoungMachine machine;
    auto const output = velmora::makeOutput(velmora::parseOutputAddress("csv:" + folder.file("a")), machine.context());
    output->open();
    std::filesystem::create_directory(folder.file("a"));
    output->write(records(machine.rpm(1.0, 0)));
    velmora::Reading const late = machine.rpm(2.0, 6900);
    machine.at(7000);
    machine.set();
    auto const batch = records(late);
    EXPECT_THROW(output->write(batch), std::exception);
    std::filesystem::remove(folder.file("a"));
    output->write(batch);
    output->close();
    EXPECT_EQ(folder.read("a"), "time,7E8 RPM (rpm)\n2026-03-01T08:15:00.250Z,1\n2026-03-01T08:15:07.150Z,2\n");
}

} // namespace
