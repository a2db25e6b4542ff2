// The file of a database: who holds it, what lies beside it, how long it is waited for, and what exactly comes into it.
#include "libvelmora/output/database/sqliteoutput.h"
#include "tests/support/openfiles.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <fstream>
#include <thread>

namespace {

using testing::ElementsAre;
using testsupport::isHeldOpen;
using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::Database;
using velmora::SqliteOutput;

struct DatabaseFile
{
    TemporaryFolder folder;
    std::string file = folder.file("a.db");

    std::unique_ptr<SqliteOutput> output(std::string const& settings = "") const
    {
        auto result = std::make_unique<SqliteOutput>(velmora::parseOutputAddress("sqlite:" + file + settings));
        result->open();
        return result;
    }
    std::uintmax_t ahead() const
    {
        std::error_code error;
        std::uintmax_t const size = std::filesystem::file_size(file + "-wal", error);
        return error ? 0 : size;
    }
    std::vector<std::string> texts(std::string const& sql) const
    {
        Database database(file, Database::Access::ReadOnly);
        velmora::Statement statement(database, sql);
        std::vector<std::string> result;
        while (statement.next()) {
            result.push_back(statement.isNull(0) ? "-" : statement.text(0));
        }
        return result;
    }
};

std::string databaseTrouble(std::string const& file, Database::Access access = Database::Access::Write)
{
    try {
        Database(file, access).number("SELECT count(*) FROM sqlite_schema");
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.hints().size(),
                  error.kind() == velmora::ErrorKind::WrongUse || access == Database::Access::Write)
            << "what to do";
        return error.what();
    }
    return "";
}

TEST(SqliteFile, IsLetGoOfWhateverHappens)
{
    DatabaseFile const at;
    {
        auto const output = at.output();
        output->write(records(reading("RPM", 1.0)));
        EXPECT_TRUE(isHeldOpen(at.file));
        output->open(); // again, after a failure
        output->write(records(reading("RPM", 2.0)));
        output->close();
        EXPECT_FALSE(isHeldOpen(at.file));
        output->close();
    }
    {
        auto const output = at.output();
        output->write(records(reading("RPM", 3.0)));
    }
    EXPECT_FALSE(isHeldOpen(at.file)) << "without being closed";
    std::ofstream(at.folder.file("none")) << std::string(5000, 'x');
    EXPECT_EQ(databaseTrouble(at.folder.file("none")), at.folder.file("none") + " is no database");
    EXPECT_FALSE(isHeldOpen(at.folder.file("none")));
    EXPECT_EQ(databaseTrouble(at.folder.file("no/file")),
              "Could not open " + at.folder.file("no/file") + ": No such file or directory");
    EXPECT_EQ(databaseTrouble(at.folder.file("missing"), Database::Access::ReadOnly),
              "Could not open " + at.folder.file("missing") + ": unable to open database file");
    EXPECT_FALSE(std::filesystem::exists(at.folder.file("missing"))) << "who only reads makes no file";
}

TEST(SqliteFile, IsWaitedForWhileAnotherWrites)
{
    DatabaseFile const at;
    auto const output = at.output();
    Database other(at.file);
    auto hold = std::make_unique<velmora::Transaction>(other);
    std::thread holder([&hold] {
        std::this_thread::sleep_for(std::chrono::milliseconds(30));
        hold.reset();
    });
    EXPECT_NO_THROW(output->write(records(reading("RPM", 1.0))));
    holder.join();
    EXPECT_EQ(other.number("SELECT count(*) FROM reading"), 1);
}

TEST(SqliteFile, LiesWholeInOneFileAfterAMinuteWithoutRecords)
{
    DatabaseFile const at;
    auto const output = at.output();
    output->write(records(velmora::Event{velmora::fromMillis(march), "van", "x", {}, ""}));
    auto const rest = [&](int calls) {
        for (int i = 0; i < calls; ++i) {
            output->write({});
        }
        return at.ahead();
    };
    bool const sure = velmora::lookAtClocks().synced || output->database().number("SELECT count(*) FROM clock") == 0;
    if (!sure) {
        GTEST_SKIP() << "this machine's clock may still be set, and each call follows it";
    }
    EXPECT_GT(rest(59), 0U);
    EXPECT_EQ(rest(1), 0U);
    {
        DatabaseFile const fresh;
        auto const unused = fresh.output();
        for (int i = 0; i < 59; ++i) {
            unused->write({});
        }
        EXPECT_GT(fresh.ahead(), 0U) << "its tables";
        unused->write({});
        EXPECT_EQ(fresh.ahead(), 0U);
    }
    output->write(records(reading("RPM", 1.0)));
    EXPECT_GT(rest(30), 0U);
    output->write(records(reading("RPM", 2.0)));
    EXPECT_GT(rest(59), 0U) << "counted from the last record";
    EXPECT_EQ(rest(1), 0U);
    output->write(records(reading("RPM", 3.0)));
    Database const reader(at.file, Database::Access::ReadOnly);
    output->close();
    EXPECT_EQ(at.ahead(), 0U) << "and at the end, though another reads";
}

TEST(SqliteFile, KeepsItsBallastWheneverThereIsRoom)
{
    DatabaseFile const at;
    auto const output = at.output();
    std::string const ballast = at.file + "-ballast";
    EXPECT_EQ(std::filesystem::file_size(ballast), 2U << 20U);
    std::filesystem::remove(ballast);
    output->write(records(reading("RPM", 1.0)));
    EXPECT_TRUE(std::filesystem::exists(ballast));
    output->database().execute("CREATE TRIGGER no BEFORE INSERT ON event BEGIN SELECT RAISE(FAIL, 'no'); END");
    EXPECT_THROW(output->write(records(velmora::Event{})), velmora::Error);
    EXPECT_TRUE(std::filesystem::exists(ballast)) << "the disk is not full";
    EXPECT_FALSE(output->database().isFull());
}

TEST(SqliteFile, TakesWhatComesBehindAFailureAsItIs)
{
    DatabaseFile const at;
    auto const output = at.output();
    output->database().execute("CREATE TRIGGER no BEFORE INSERT ON event BEGIN SELECT RAISE(FAIL, 'no'); END");
    auto const event = [](char const* text) {
        return records(velmora::Event{velmora::fromMillis(march), "van", "x", {}, text});
    };
    EXPECT_THROW(output->write(event("first")), velmora::Error);
    output->database().execute("DROP TRIGGER no");
    output->write(event("second"));
    EXPECT_THAT(at.texts("SELECT text FROM event"), ElementsAre("second"));
    velmora::Statement wrong(output->database(), "SELECT abs(?)");
    wrong.bind(1, std::numeric_limits<std::int64_t>::min());
    EXPECT_THROW(wrong.next(), velmora::Error) << "has no absolute value";
    wrong.bind(1, std::int64_t{-5});
    EXPECT_TRUE(wrong.next());
    EXPECT_EQ(wrong.number(0), 5);
}

TEST(SqliteFile, HoldsWholeNumbersAsSuchAndNoOthers)
{
    DatabaseFile const at;
    std::pair<double, char const*> const cases[] = {
        {0.0, "integer 0"},       {-3.0, "integer -3"},
        {-2.5, "real -2.5"},      {8999999999999999.0, "integer 8999999999999999"},
        {9e15, "real 9.0e+15"},   {-8999999999999999.0, "integer -8999999999999999"},
        {-9e15, "real -9.0e+15"}, {std::nan(""), "null -"},
        {1e300, "real 1.0e+300"}, {HUGE_VAL, "null -"},
    };
    std::vector<velmora::SharedRecord> batch;
    std::vector<std::string> expected;
    for (auto const& [number, text] : cases) {
        batch.push_back(records(reading("X", number, march + static_cast<long long>(batch.size())))[0]);
        expected.emplace_back(text);
    }
    at.output()->write(batch);
    EXPECT_EQ(at.texts("SELECT typeof(value) || ' ' || ifnull(value, '-') FROM reading ORDER BY time"), expected);
}

TEST(SqliteFile, RepairsWhatWasStampedBetweenItsOpeningAndTheFirstRecords)
{
    DatabaseFile const at;
    velmora::ClockLook look{1000000, 1000, false, "boot"};
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + at.file), [&look] { return look; });
    output.open();
    look = {march, 2000, true, "boot"}; // by a time server
    output.write(records(reading("RPM", 1.0, 1000500), reading("RPM", 2.0, march - 100)));
    EXPECT_THAT(at.texts("SELECT " + std::to_string(march) + " - time FROM reading ORDER BY time"),
                ElementsAre("500", "100"));
}

TEST(SqliteFile, RepairsNothingOnceTheClockIsRight)
{
    DatabaseFile const at;
    velmora::ClockLook look{march, 1000, false, "boot"};
    SqliteOutput output(velmora::parseOutputAddress("sqlite:" + at.file), [&look] { return look; });
    output.open();
    output.write(records(reading("RPM", 1.0)));
    look.synced = true;
    output.write(records(reading("RPM", 2.0, march + 1)));
    look.wall += 3600000;
    output.write(records(reading("RPM", 3.0, march + 2)));
    EXPECT_THAT(at.texts("SELECT time - " + std::to_string(march) + " FROM reading ORDER BY time"),
                ElementsAre("0", "1", "2"));
    EXPECT_THAT(at.texts("SELECT count(*) FROM undated"), ElementsAre("0"));
}

TEST(SqliteFile, HasEachRowWhole)
{
    DatabaseFile const at;
    using namespace velmora;
    auto const time = [](int millis) { return fromMillis(march + millis); };
    Reading bus = reading("SPEED", 2.0, march + 1);
    bus.vehicle = "bus";
    bus.module = 0x7E9;
    bus.pid = "010D";
    bus.unit = "km/h";
    Reading other = reading("RPM", 3.0, march + 2);
    other.vehicle = "bus";
    at.output()->write(records(
        reading("RPM", 1.0), bus, other, Event{time(3), "van", "lamp_on", 1, "On"},
        Event{time(4), "bus", "parked", {}, "It stands"}, ModuleInfo{time(5), "van", 1, "ECM", "Engine", "V1"},
        ModuleInfo{time(6), "bus", 2, "TCM", "Gearbox", ""}, CodeChange{time(7), "van", 1, "P1", "pending", "A"},
        CodeChange{time(8), "van", 1, "P1", "confirmed", "B"}, CodeChange{time(9), "van", 1, "P2", "pending", "C"},
        CodeChange{time(10), "van", 2, "P1", "pending", "D"}, CodeChange{time(11), "bus", 1, "P1", "pending", "E"},
        CodeChange{time(12), "van", 1, "P1", "pending", "again"},
        CodeChange{time(20), "van", 1, "P1", "pending", "F", false}));
    std::string const since = " - " + std::to_string(march);
    auto const rows = [&at](std::vector<std::string> const& columns, std::string const& from) {
        std::string joined;
        for (std::string const& each : columns) {
            joined += (joined.empty() ? "" : " || '|' || ") + ("ifnull(" + each + ", '-')");
        }
        return at.texts("SELECT " + joined + " FROM " + from);
    };
    EXPECT_THAT(rows({"vehicle", "module", "key", "pid", "name", "unit", "time" + since, "value"},
                     "reading JOIN sensor ON sensor.id = sensor ORDER BY time"),
                ElementsAre("van|2024|RPM|010C|Name of RPM|rpm|0|1", "bus|2025|SPEED|010D|Name of SPEED|km/h|1|2",
                            "bus|2024|RPM|010C|Name of RPM|rpm|2|3"));
    EXPECT_THAT(rows({"time" + since, "vehicle", "module", "kind", "text"}, "event ORDER BY id"),
                ElementsAre("3|van|1|lamp_on|On", "4|bus|-|parked|It stands"));
    EXPECT_THAT(rows({"vehicle", "id", "name", "description", "vin", "seen" + since}, "module ORDER BY seen"),
                ElementsAre("van|1|ECM|Engine|V1|5", "bus|2|TCM|Gearbox|-|6"));
    EXPECT_THAT(
        rows({"vehicle", "module", "code", "kind", "text", "since" + since, "gone" + since}, "code ORDER BY since"),
        ElementsAre("van|1|P1|pending|A|7|20", "van|1|P1|confirmed|B|8|-", "van|1|P2|pending|C|9|-",
                    "van|2|P1|pending|D|10|-", "bus|1|P1|pending|E|11|-"));
}

TEST(SqliteFile, AStatementIsReadyAgainBehindItsLastRow)
{
    DatabaseFile const at;
    auto const output = at.output();
    velmora::Statement statement(output->database(), "SELECT ? UNION ALL SELECT 9");
    for (std::int64_t const number : {1, 2}) {
        statement.bind(1, number);
        std::vector<std::int64_t> numbers;
        while (statement.next()) {
            numbers.push_back(statement.number(0));
        }
        EXPECT_THAT(numbers, ElementsAre(number, 9));
    }
}

TEST(SqliteFile, KnowsASensorByItsUnitTooAndAModuleByItsLastWords)
{
    DatabaseFile const at;
    auto const output = at.output();
    velmora::Reading miles = reading("SPEED", 1.0, march + 1);
    miles.unit = "mph";
    output->write(
        records(velmora::SensorList{{}, "van", {{1, "A", "0101", "First", "V"}, {1, "A", "0101", "First", "V"}}},
                reading("SPEED", 2.0), miles, reading("SPEED", 3.0, march + 2),
                velmora::ModuleInfo{velmora::fromMillis(march), "van", 1, "ECM", "Engine", ""}, velmora::LampState{}));
    EXPECT_THAT(at.texts("SELECT key || ' ' || unit || ' ' || count(sensor) FROM sensor LEFT JOIN reading ON "
                         "sensor.id = sensor GROUP BY id ORDER BY id"),
                ElementsAre("A V 0", "SPEED rpm 2", "SPEED mph 1"));
    EXPECT_THAT(at.texts("SELECT vin FROM module"), ElementsAre("-"));
    EXPECT_THAT(at.texts("SELECT name FROM module"), ElementsAre("ECM"));
    EXPECT_THAT(at.texts("SELECT seen FROM module"), ElementsAre(std::to_string(march)));
}

} // namespace
