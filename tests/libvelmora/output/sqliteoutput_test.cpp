#include "libvelmora/output/database/sqliteoutput.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <sys/stat.h>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::Database;
using velmora::fromMillis;
using velmora::SqliteOutput;
using velmora::Statement;

std::vector<std::string> rowsOf(Database& database, std::string const& columns, std::string const& rest)
{
    std::vector<std::string> rows;
    Statement statement(database, "SELECT " + columns + " FROM " + rest);
    while (statement.next()) {
        rows.push_back(statement.text(0));
    }
    return rows;
}

struct Fixture
{
    TemporaryFolder folder;
    SqliteOutput output{velmora::parseOutputAddress("sqlite:" + folder.file("a.db"))};

    Fixture() { output.open(); }
    std::vector<std::string> rows(std::string const& columns, std::string const& rest)
    {
        return rowsOf(output.database(), columns, rest);
    }
};

TEST(SqliteOutput, KeepsReadingsWithTheirSensors)
{
    Fixture fixture;
    fixture.output.write(records(reading("RPM", 800.0), reading("SPEED", 12.5), reading("STATE", std::string("idle")),
                                 reading("LOAD", {}), reading("RPM", 801.0, march + 30)));
    EXPECT_THAT(fixture.rows("key || ' ' || (time - 1772352900250) || ' ' || typeof(value) || ' ' || ifnull(value, '')",
                             "reading JOIN sensor ON sensor.id = sensor ORDER BY time, sensor"),
                ElementsAre("RPM 0 integer 800", "SPEED 0 real 12.5", "STATE 0 text idle", "LOAD 0 null ",
                            "RPM 30 integer 801"));
    EXPECT_THAT(fixture.rows("vehicle || module || key || pid || name || unit", "sensor WHERE key = 'RPM'"),
                ElementsAre("van2024RPM010CName of RPMrpm"));
}

TEST(SqliteOutput, AReadingOfATimeThatIsTakenMovesAMillisecond)
{
    Fixture fixture;
    fixture.output.write(records(reading("RPM", 1.0), reading("RPM", 2.0), reading("RPM", 3.0)));
    fixture.output.write(records(reading("RPM", 4.0), reading("SPEED", 5.0)));
    EXPECT_THAT(fixture.rows("(time - 1772352900250) || '=' || value", "reading ORDER BY time, sensor"),
                ElementsAre("0=1", "0=5", "1=2", "2=3", "3=4"));
}

TEST(SqliteOutput, KeepsEventsModulesCodesAndTrips)
{
    Fixture fixture;
    velmora::Trip trip;
    trip.vehicle = "van";
    trip.begin = fromMillis(march);
    trip.end = fromMillis(march + 60000);
    trip.durationS = 60.0;
    trip.distanceKm = 0.5;
    fixture.output.write(
        records(velmora::Event{fromMillis(march), "van", "engine_start", {}, "Engine started"},
                velmora::Event{fromMillis(march), "van", "lamp_on", 0x7E8, "Lamp on"},
                velmora::ModuleInfo{fromMillis(march), "van", 0x7E8, "ECM", "Engine", ""},
                velmora::ModuleInfo{fromMillis(march + 1), "van", 0x7E8, "ECM", "Engine control", "VIN0"},
                velmora::CodeChange{fromMillis(march), "van", 0x7E8, "P0301", "confirmed", "Misfire", true},
                velmora::CodeChange{fromMillis(march), "van", 0x7E8, "P0301", "pending", "Misfire", true},
                velmora::CodeChange{fromMillis(march + 9), "van", 0x7E8, "P0301", "pending", "Misfire", false}, trip));
    EXPECT_THAT(fixture.rows("kind || ifnull(module, '-')", "event ORDER BY id"),
                ElementsAre("engine_start-", "lamp_on2024"));
    EXPECT_THAT(fixture.rows("id || description || vin", "module"), ElementsAre("2024Engine controlVIN0"));
    EXPECT_THAT(fixture.rows("code || kind || ifnull(gone - since, '-')", "code ORDER BY id"),
                ElementsAre("P0301confirmed-", "P0301pending9"));
    EXPECT_THAT(fixture.rows("kind || ' ' || distance_km || ' ' || duration_s || ifnull(fuel_l, '-')", "trip"),
                ElementsAre("trip 0.5 60.0-"));
}

TEST(SqliteOutput, EachCommitReachesTheDiskAndOthersCannotRead)
{
    Fixture fixture;
    EXPECT_EQ(fixture.output.database().number("PRAGMA synchronous"), 2); // FULL
    EXPECT_THAT(fixture.rows("journal_mode", "pragma_journal_mode"), ElementsAre("wal"));
    EXPECT_EQ(fixture.output.database().number("PRAGMA user_version"), 2);
    fixture.output.write(records(reading("RPM", 1.0)));
    for (char const* const name : {"a.db", "a.db-wal", "a.db-shm", "a.db-ballast"}) {
        struct stat facts = {};
        ASSERT_EQ(::stat(fixture.folder.file(name).c_str(), &facts), 0) << name;
        EXPECT_EQ(facts.st_mode & 0777U, 0600U) << name;
    }
    fixture.output.close();
    EXPECT_FALSE(std::filesystem::exists(fixture.folder.file("a.db-wal")));
}

TEST(SqliteOutput, AFailedBatchLeavesNothingAndCanComeAgain)
{
    Fixture fixture;
    fixture.output.database().execute("CREATE TRIGGER no BEFORE INSERT ON event BEGIN SELECT RAISE(FAIL, 'no'); END");
    auto const batch = records(reading("RPM", 1.0), velmora::Event{fromMillis(march), "van", "x", {}, ""});
    EXPECT_THROW(fixture.output.write(batch), velmora::Error);
    EXPECT_EQ(fixture.output.database().number("SELECT count(*) FROM reading"), 0);
    EXPECT_EQ(fixture.output.database().number("SELECT count(*) FROM sensor"), 0);
    fixture.output.database().execute("DROP TRIGGER no");
    fixture.output.write(batch);
    EXPECT_THAT(fixture.rows("key || value", "reading JOIN sensor ON sensor.id = sensor"), ElementsAre("RPM1"));
}

TEST(SqliteOutput, GoesOnInItsOwnFileAndRefusesOthers)
{
    TemporaryFolder const folder;
    auto const address = velmora::parseOutputAddress("sqlite:" + folder.file("a.db"));
    for (int i = 0; i < 2; ++i) {
        SqliteOutput output(address);
        output.open();
        output.write(records(reading("RPM", 1.0, march + i)));
        if (i == 1) {
            EXPECT_EQ(output.database().number("SELECT count(*) FROM reading"), 2);
            EXPECT_EQ(output.database().number("SELECT count(*) FROM sensor"), 1);
            output.database().execute("PRAGMA user_version=7");
        }
        output.close();
    }
    auto const complaint = [&address] {
        try {
            SqliteOutput(address).open();
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
            return std::string(error.what());
        }
        return std::string();
    };
    EXPECT_THAT(complaint(), HasSubstr("tables of version 7"));
    Database(folder.file("a.db")).execute("PRAGMA application_id=5");
    EXPECT_THAT(complaint(), HasSubstr("another program"));
    std::ofstream(folder.file("a.db")) << std::string(5000, 'x');
    EXPECT_THAT(complaint(), HasSubstr("is no database"));
}

} // namespace
