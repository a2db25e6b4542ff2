// Records as the text forms of outputs give them, whole; and trips as a database gives them back.
#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/output/influxoutput.h"
#include "libvelmora/output/linefile.h"
#include "libvelmora/output/mqtt/spooltext.h"
#include "libvelmora/output/recordjson.h"
#include "tests/support/records.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/trips.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <limits>
#include <sys/stat.h>

namespace {

using testsupport::march;
using testsupport::reading;
using testsupport::records;
using testsupport::TemporaryFolder;
using velmora::fromMillis;
using velmora::spoolText;
using velmora::Trip;

Trip wholeTrip()
{
    Trip trip;
    trip.vehicle = "van";
    trip.begin = fromMillis(march);
    trip.end = fromMillis(march + 60000);
    trip.distanceKm = 1.5;
    trip.durationS = 2.25;
    trip.idleS = 3;
    trip.gapS = 4;
    trip.fuelL = 5;
    trip.odometerKm = 6;
    trip.meanKmh = 7;
    trip.maxKmh = 8;
    trip.maxRpm = 9;
    trip.maxCoolantC = 10;
    return trip;
}

std::string fileProblem(velmora::LineFile& file, std::string const& lines, long long millis = march)
{
    try {
        file.add(lines, fromMillis(millis));
    } catch (velmora::Error const& error) {
        return error.what();
    }
    return "";
}

TEST(RecordForms, AreJsonWhole)
{
    EXPECT_EQ(velmora::toLine(toJsonValue(wholeTrip())),
              R"({"begin":"2026-03-01T08:15:00.250Z","end":"2026-03-01T08:16:00.250Z","vehicle":"van","kind":"trip",)"
              R"("distance_km":1.5,"odometer_km":6,"duration_s":2.25,"idle_s":3,"gap_s":4,"fuel_l":5,"mean_kmh":7,)"
              R"("max_kmh":8,"max_rpm":9,"max_coolant_c":10})");
    Trip run;
    run.engineRun = true;
    EXPECT_EQ(toJsonValue(run)["kind"], "engine run");
    EXPECT_TRUE(toJsonValue(run)["fuel_l"].is_null());
    EXPECT_EQ(
        velmora::toLine(toJsonValue(velmora::Event{fromMillis(march), "van", "parked", {}, "It stands"})),
        R"({"time":"2026-03-01T08:15:00.250Z","vehicle":"van","event":"parked","module":null,"text":"It stands"})");
    velmora::Reading bare = reading("RPM", std::numeric_limits<double>::infinity());
    bare.raw.clear();
    EXPECT_TRUE(toJsonValue(bare)["raw"].is_null());
    EXPECT_TRUE(toJsonValue(bare)["value"].is_null());
    bare.unit = "°C";
    EXPECT_NE(velmora::toLine(toJsonValue(bare)).find(R"("unit":"°C")"), std::string::npos) << "as people read it";
}

TEST(RecordForms, GoThroughASpoolWithTimesInMilliseconds)
{
    EXPECT_EQ(spoolText(reading("RPM", 800.5)), R"([1772352900250,"7E8","RPM",800.5,"rpm"])");
    EXPECT_EQ(spoolText(velmora::Event{fromMillis(march), "van", "lamp_on", 0x7E8, "Lamp on"}),
              R"({"time":1772352900250,"vehicle":"van","event":"lamp_on","module":"7E8","text":"Lamp on"})");
    velmora::CodeChange code{fromMillis(march), "van", 0x7E8, "P0301", "pending", "x", true};
    EXPECT_EQ(spoolText(code),
              R"({"time":1772352900250,"event":"code","module":"7E8","code":"P0301","kind":"pending","text":"x"})");
    code.present = false;
    EXPECT_NE(spoolText(code).find(R"("event":"code_cleared")"), std::string::npos);
    std::string const trip = spoolText(wholeTrip());
    EXPECT_TRUE(trip.starts_with(R"({"event":"trip_record","begin":1772352900250,"end":1772352960250,)")) << trip;
    EXPECT_EQ(spoolText(velmora::LampState{}), "");
    EXPECT_EQ(velmora::shiftedText(R"([5,"7E8"])", 10), R"([15,"7E8"])");
    EXPECT_EQ(velmora::shiftedText(R"({"time":1,"begin":2,"end":3,"text":4})", 10),
              R"({"time":11,"begin":12,"end":13,"text":4})");
    EXPECT_EQ(velmora::shiftedText(R"({"time":"x"})", 10), R"({"time":"x"})");
    for (char const* const odd : {"[]", "[\"x\"]", "5", "{"}) {
        EXPECT_EQ(velmora::shiftedText(odd, 10), odd);
    }
    using Time = velmora::Spool::Time;
    EXPECT_EQ(velmora::batchText({"van", "id", 3, 2}, {{4, Time::Sure, "[7,1]"},
                                                       {6, Time::Sure, "{\"a\":1}"},
                                                       {8, Time::Sure, "[9]"},
                                                       {9, Time::Sure, "{\"b\":2}"}}),
              R"({"vehicle":"van","spool":"id","after":3,"last":9,"stored":2,"clock":true,"readings":[[4,7,1],[8,9]],)"
              R"("events":[{"seq":6,"a":1},{"seq":9,"b":2}]})");
    EXPECT_NE(velmora::batchText({}, {{1, Time::Unsure, "[7]"}}).find(R"("clock":false)"), std::string::npos);
}

TEST(TripList, GivesBackWhatWasWritten)
{
    TemporaryFolder const folder;
    std::string const file = folder.file("a.db");
    Trip later;
    later.begin = fromMillis(march + 1000);
    later.end = fromMillis(march + 2000);
    later.engineRun = true;
    {
        velmora::SqliteOutput output(velmora::parseOutputAddress("sqlite:" + file));
        output.open();
        output.write(records(later, wholeTrip()));
    }
    std::vector<Trip> const trips = velmora::readTrips(file);
    ASSERT_EQ(trips.size(), 2U);
    EXPECT_EQ(velmora::toLine(toJsonValue(trips[0])), velmora::toLine(toJsonValue(wholeTrip()))) << "by their begin";
    EXPECT_EQ(trips[0].vehicle, "van");
    EXPECT_EQ(velmora::toLine(toJsonValue(trips[1])), velmora::toLine(toJsonValue(later)));

    auto const problem = [](std::string const& path) {
        try {
            velmora::readTrips(path);
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse);
            return std::string(error.what());
        }
        return std::string();
    };
    EXPECT_EQ(problem(folder.file("none")), "There is no file " + folder.file("none"));
    std::string const other = folder.file("other.db") + " is no database of watch, or one of another version";
    for (char const* const sql : {"PRAGMA user_version = 1", "PRAGMA user_version = 99", "PRAGMA user_version = 0",
                                  "PRAGMA application_id = 7"}) {
        std::filesystem::copy_file(file, folder.file("other.db"), std::filesystem::copy_options::overwrite_existing);
        velmora::Database(folder.file("other.db"), velmora::Database::Access::Write).execute(sql);
        EXPECT_EQ(problem(folder.file("other.db")), std::string(sql).ends_with("= 1") ? "" : other) << sql;
    }
}

TEST(LineFile, EndsWhatACrashLeftAndKeepsOthersLines)
{
    TemporaryFolder const folder;
    auto const address = velmora::parseOutputAddress("ndjson:" + folder.file("a.json"));
    {
        velmora::LineFile file(address);
        file.setHeader("head\n");
        file.setHeader("head\n");
        EXPECT_EQ(fileProblem(file, ""), "");
        EXPECT_EQ(fileProblem(file, "one\n"), "");
        file.close();
        EXPECT_EQ(fileProblem(file, "two\n"), "") << "opens again by itself";
        EXPECT_EQ(file.file(), folder.file("a.json"));
        file.setHeader("other\n");
        EXPECT_EQ(fileProblem(file, "three\n"), "");
        EXPECT_EQ(file.file(), folder.file("a-2.json"));
        file.setHeader("head\n");
        EXPECT_EQ(fileProblem(file, "four\n"), "");
    }
    EXPECT_EQ(folder.read("a.json"), "head\none\ntwo\nfour\n");
    EXPECT_EQ(folder.read("a-2.json"), "other\nthree\n");
    std::ofstream(folder.file("a.json")) << "hea";
    velmora::LineFile cut(address);
    cut.setHeader("head\n");
    EXPECT_EQ(cut.file(), folder.file("a-3.json")) << "what is shorter than its header is another's";
    velmora::LineFile missing(velmora::parseOutputAddress("ndjson:" + folder.file("no/such/file")));
    EXPECT_EQ(fileProblem(missing, "x\n"),
              "Could not open " + folder.file("no/such/file") + ": No such file or directory");
    velmora::LineFile full(velmora::parseOutputAddress("ndjson:/dev/full"));
    EXPECT_EQ(fileProblem(full, "x\n"), "Could not write to /dev/full: No space left on device");
}

TEST(LineFile, BeginsAnotherFileAtItsSizeAndDay)
{
    TemporaryFolder const folder;
    velmora::LineFile sized(velmora::parseOutputAddress("ndjson:" + folder.file("s") + "?rotate=10"));
    sized.setHeader("h\n");
    EXPECT_EQ(fileProblem(sized, "1234567\n"), "");
    EXPECT_EQ(folder.read("s"), "h\n1234567\n") << "ten bytes are not more than ten";
    EXPECT_EQ(fileProblem(sized, "x\n"), "");
    EXPECT_EQ(folder.read("s-20260301T081500Z"), "h\n1234567\n");
    EXPECT_EQ(folder.read("s"), "h\nx\n");
    EXPECT_EQ(fileProblem(sized, "123456789012\n"), "");
    EXPECT_EQ(folder.read("s-20260301T081500Z-2"), "h\nx\n");
    EXPECT_EQ(folder.read("s"), "h\n123456789012\n") << "a line that is longer than a file has one of its own";

    long long const day = 86400000;
    long long const midnight = march / day * day;
    velmora::LineFile daily(velmora::parseOutputAddress("ndjson:" + folder.file("d") + "?rotate=day"));
    EXPECT_EQ(fileProblem(daily, "1\n", midnight), "");
    EXPECT_EQ(fileProblem(daily, "2\n", midnight + day - 1), "");
    EXPECT_EQ(fileProblem(daily, "3\n", midnight + day), "");
    EXPECT_EQ(folder.read("d"), "3\n");
    EXPECT_EQ(folder.read("d-20260302T000000Z"), "1\n2\n");
    daily.close();
    EXPECT_EQ(fileProblem(daily, "4\n", midnight + day), "")
        << "the day of a file that is there is that of its last write";
    EXPECT_EQ(folder.read("d"), "4\n");
}

TEST(InfluxFile, HasALineAReading)
{
    TemporaryFolder const folder;
    auto const output = velmora::makeInfluxOutput(velmora::parseOutputAddress("influx:" + folder.file("a")));
    output->open();
    output->write(records(reading("RPM", 1.0), velmora::LampState{}, reading("SPEED", 2.0)));
    output->close();
    EXPECT_EQ(folder.read("a"), "velmora,vehicle=van,module=7E8,sensor=RPM value=1 1772352900250000000\n"
                                "velmora,vehicle=van,module=7E8,sensor=SPEED value=2 1772352900250000000\n");
}

} // namespace
