// Recordings line by line: what is a reading, what is left out, and where it is said that something can't be played.
#include "libvelmora/output/database/database.h"
#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/replay/recordingfile.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <sstream>

namespace {

using namespace velmora;

constexpr char const* firstSecond = "2024-03-07T09:05:00.000Z,";
constexpr std::int64_t firstMillis = 1709802300000;

Recording fromCsv(std::string const& text)
{
    std::istringstream in(text);
    return readCsv(in);
}

Recording fromNdjson(std::string const& text)
{
    std::istringstream in(text);
    return readNdjson(in);
}

// "7E8 RPM "Engine RPM" rpm", of one sensor.
std::string aboutOf(RecordedSensor const& sensor)
{
    std::ostringstream text;
    text << std::hex << std::uppercase << sensor.about.module << " " << sensor.about.pid << " " << sensor.about.sensor
         << " \"" << sensor.about.name << "\" " << sensor.about.unit;
    return text.str();
}

std::string aboutOfTitle(std::string const& title)
{
    return aboutOf(fromCsv("time," + title + "\n" + firstSecond + "1\n").sensors.at(0));
}

std::string whyNotPlayed(std::string const& text, Recording (*read)(std::string const&))
{
    try {
        read(text);
    } catch (Error const& error) {
        return error.what();
    }
    return {};
}

TEST(RecordingTimes, AreOfTheWholeDay)
{
    EXPECT_EQ(timeIn("2024-03-06T23:59:59.999Z"), 1709769599999);
    EXPECT_EQ(timeIn("2024-12-31T00:00:00.000Z"), 1735603200000);
    EXPECT_EQ(timeIn("1970-01-01T00:00:00.000Z"), 0);
    for (char const* const text : {"2024-03-07T09:05:0/.000Z", "2024-03-07T09:05:0:.000Z", "2024-03-07T09:05:00.000Zx",
                                   "2024-13-07T09:05:00.000Z", "2024-00-07T09:05:00.000Z", "2024-03-00T09:05:00.000Z",
                                   "x024-03-07T09:05:00.000Z"}) {
        EXPECT_FALSE(timeIn(text)) << text;
    }
}

TEST(RecordingTitles, NameAModuleOnlyWhereOneIsMeant)
{
    EXPECT_EQ(aboutOfTitle("7E8 RPM (rpm)"), "7E8  RPM \"7E8 RPM\" rpm");
    EXPECT_EQ(aboutOfTitle("18DAF110 O2_B1S1 (V)"), "18DAF110  O2_B1S1 \"18DAF110 O2_B1S1\" V");
    EXPECT_EQ(aboutOfTitle("DEF Level (%)"), "0  DEF Level \"DEF Level\" %") << "a fluid, no module DEF";
    EXPECT_EQ(aboutOfTitle("XYZ RPM (rpm)"), "0  XYZ RPM \"XYZ RPM\" rpm");
    EXPECT_EQ(aboutOfTitle("7E8 rPM (rpm)"), "0  7E8 rPM \"7E8 rPM\" rpm") << "no short name";
    EXPECT_EQ(aboutOfTitle("20000000 RPM"), "0  20000000 RPM \"20000000 RPM\" ") << "beyond any identifier";
    EXPECT_EQ(aboutOfTitle("RPM"), "0  RPM \"RPM\" ");
    EXPECT_EQ(aboutOfTitle("A)"), "0  A) \"A)\" ");
    EXPECT_EQ(aboutOfTitle("Load (calc"), "0  Load (calc \"Load (calc\" ");
    EXPECT_EQ(aboutOfTitle("Load (a) (b)"), "0  Load (a) \"Load (a)\" b");
}

TEST(RecordingLines, OfCsvSayWhatIsWrongWithThem)
{
    std::string const head = "time,A\n";
    EXPECT_EQ(whyNotPlayed("x,A\n", fromCsv), "Line 1 can't be played: it is no header that begins with time");
    EXPECT_EQ(whyNotPlayed("time\n", fromCsv), "Line 1 can't be played: it is no header that begins with time");
    EXPECT_EQ(whyNotPlayed(head + "x,1\n", fromCsv), "Line 2 can't be played: it begins with no time");
    EXPECT_EQ(whyNotPlayed(head + firstSecond + "1,2\n", fromCsv),
              "Line 2 can't be played: it has other columns than the header");
    EXPECT_EQ(whyNotPlayed(head + firstSecond + "\"1\n", fromCsv), "Line 2 can't be played: it begins with no time");
    EXPECT_EQ(fromCsv(head + "\n" + firstSecond + "1\n\n" + firstSecond + "2\n").sensors.at(0).values.size(), 2U)
        << "an empty line is none";
    EXPECT_EQ(fromCsv(head + firstSecond + "\"a\"\"\"\n").sensors.at(0).values.at(0).value, Reading::Value("a\""));
    Recording const rows = fromCsv("time,vehicle,module,pid,sensor,name,value,unit\n" + std::string(firstSecond) +
                                   "car,7E8,010C,RPM,Engine RPM,800,rpm\n");
    EXPECT_EQ(aboutOf(rows.sensors.at(0)), "7E8 010C RPM \"Engine RPM\" rpm");
}

TEST(RecordingLines, OfNdjsonAreReadingsWithNameTimeAndValue)
{
    std::string const time = R"({"time":"2024-03-07T09:05:01.000Z",)";
    for (char const* const rest :
         {R"("value":1})", R"("name":"A"})", R"("value":1,"label":"A"})", R"("event":"x","name":"A"})"}) {
        EXPECT_TRUE(fromNdjson(time + rest + "\n").sensors.empty()) << rest;
    }
    EXPECT_TRUE(fromNdjson("{\"value\":1,\"name\":\"A\"}\n").sensors.empty()) << "of no time";
    EXPECT_EQ(whyNotPlayed("{\n", fromNdjson), "Line 1 can't be played: it is no JSON");
    EXPECT_EQ(whyNotPlayed("\n{}\n{\n", fromNdjson), "Line 3 can't be played: it is no JSON");
    Recording const all = fromNdjson(
        "\n" + time + R"("name":"A","value":"Open","module":7})" + "\n" + time + R"("name":"A","value":true})" + "\n" +
        time + R"("module":"7E8","pid":"010C","sensor":"RPM","name":"Engine","value":1e3,"unit":"rpm"})");
    ASSERT_EQ(all.sensors.size(), 2U);
    EXPECT_EQ(aboutOf(all.sensors[0]), "0  A \"A\" ");
    EXPECT_EQ(all.sensors[0].values.at(0).value, Reading::Value("Open"));
    EXPECT_EQ(all.sensors[0].values.at(1).value, Reading::Value()) << "neither a text nor a number";
    EXPECT_EQ(aboutOf(all.sensors[1]), "7E8 010C RPM \"Engine\" rpm");
    EXPECT_EQ(all.sensors[1].values.at(0).value, Reading::Value(1000.0));
}

TEST(RecordingValues, KeepTheirDigits)
{
    auto const decimals = [](std::string const& values) {
        return fromCsv("time,A\n" + std::string(firstSecond) + values + "\n").sensors.at(0).decimals;
    };
    EXPECT_EQ(decimals("1726"), 0);
    EXPECT_EQ(decimals("0.5"), 1);
    EXPECT_EQ(decimals("0.1234567"), 6) << "no more than that";
    EXPECT_EQ(decimals("1.25e3"), 0);
    EXPECT_EQ(decimals("1.25E3"), 0);
    EXPECT_EQ(decimals("12abc"), 0);
    for (char const* const word : {"12abc", "inf", "nan", "1.2.3", "0x10"}) {
        Recording const recording = fromCsv("time,A\n" + std::string(firstSecond) + word + "\n");
        EXPECT_EQ(recording.sensors.at(0).values.at(0).value, Reading::Value(word)) << "is no number";
        EXPECT_FALSE(recording.sensors.at(0).numeric);
    }
    Recording const mixed = fromCsv("time,A\n" + std::string(firstSecond) + "x\n" + firstSecond + "1\n");
    EXPECT_FALSE(mixed.sensors.at(0).numeric) << "one word is enough";
}

TEST(RecordingMaker, PutsValuesInTheOrderOfTheirTimes)
{
    RecordingMaker maker;
    std::size_t const first = maker.sensor({1, "A", "", "A", ""});
    std::size_t const second = maker.sensor({1, "B", "", "B", ""});
    std::size_t const silent = maker.sensor({1, "C", "", "C", ""});
    EXPECT_EQ(maker.sensor({1, "A", "other", "other", ""}), first);
    EXPECT_NE(maker.sensor({1, "A", "", "A", "V"}), first) << "in another unit";
    for (std::int64_t const time : {5, 0, 3}) {
        EXPECT_TRUE(maker.add(first, time, std::to_string(time)));
    }
    maker.add(second, 1, std::string("-"));
    maker.add(second, 3, std::string("1"));
    maker.add(silent, -1, std::string("1"));
    maker.add(silent, 7258118400001, std::string("1"));
    Recording const recording = maker.finish();
    ASSERT_EQ(recording.sensors.size(), 2U) << "those without a value are left out";
    EXPECT_EQ(recording.begin, 0);
    EXPECT_EQ(recording.end, 5);
    EXPECT_EQ(recording.sensors[0].values.at(1).time, 3);
    EXPECT_FALSE(recording.cut);
    RecordingMaker late;
    late.add(late.sensor({1, "A", "", "A", ""}), 7258118400000, std::string("1"));
    EXPECT_EQ(late.finish().end, 7258118400000) << "the first moment of the year 2200";
}

TEST(RecordingMaker, IsFullOneDay)
{
    RecordingMaker maker(3);
    std::size_t const sensor = maker.sensor({1, "A", "", "A", ""});
    EXPECT_TRUE(maker.add(sensor, -1, std::string("0"))) << "takes no room";
    for (int i = 0; i < 3; ++i) {
        EXPECT_TRUE(maker.add(sensor, i, std::to_string(i)));
    }
    EXPECT_FALSE(maker.add(sensor, 3, std::string("3")));
    EXPECT_FALSE(maker.add(sensor, 4, std::string("4")));
    Recording const full = maker.finish();
    EXPECT_TRUE(full.cut);
    EXPECT_EQ(full.sensors.at(0).values.size(), 3U);

    RecordingMaker crowded;
    for (std::size_t i = 0; i < RecordingMaker::mostSensors; ++i) {
        EXPECT_TRUE(crowded.add(crowded.sensor({1, "S" + std::to_string(i), "", "", ""}), 1, std::string("1.5")));
    }
    EXPECT_EQ(crowded.sensor({1, "S0", "", "", ""}), 0U);
    EXPECT_EQ(crowded.sensor({1, "S1999", "", "", ""}), 1999U);
    RecordingMaker whole = crowded;
    EXPECT_FALSE(whole.finish().cut);
    std::size_t const none = crowded.sensor({1, "S2000", "", "", ""});
    EXPECT_TRUE(crowded.add(none, 1, std::string("1.5")));
    EXPECT_TRUE(crowded.add(none, 1, Reading::Value("x")));
    Recording const recording = crowded.finish();
    EXPECT_TRUE(recording.cut);
    EXPECT_EQ(recording.sensors.size(), 2000U);
}

TEST(RecordingDatabase, GivesWhatTheOutputHasWritten)
{
    testsupport::TemporaryFolder const folder;
    std::string const file = folder.file("a.db");
    SqliteOutput output({"sqlite", file, {}});
    output.open();
    Reading reading;
    reading.time = WallTime(std::chrono::milliseconds(firstMillis));
    reading.module = 0x7E8;
    reading.sensor = "FUEL";
    reading.pid = "0103";
    reading.name = "Fuel system";
    reading.unit = "word";
    reading.value = "Open loop";
    output.write(std::vector<SharedRecord>{std::make_shared<Record const>(reading)});
    output.close();
    Recording const recording = readRecording(file);
    EXPECT_EQ(aboutOf(recording.sensors.at(0)), "7E8 0103 FUEL \"Fuel system\" word");
    EXPECT_EQ(recording.sensors[0].values.at(0).value, Reading::Value("Open loop"));
    EXPECT_EQ(recording.begin, firstMillis);

    std::int64_t own = 0;
    std::int64_t version = 0;
    {
        Database database(file);
        own = database.number("PRAGMA application_id");
        version = database.number("PRAGMA user_version");
        database.execute("PRAGMA user_version=99");
    }
    EXPECT_THROW(readRecording(file), Error) << "of another version";
    {
        Database database(folder.file("b.db"));
        database.execute("CREATE TABLE x (y)");
        database.execute("PRAGMA application_id=" + std::to_string(own));
    }
    EXPECT_THROW(readRecording(folder.file("b.db")), Error);
    {
        Database database(file);
        database.execute("PRAGMA application_id=7");
        database.execute("PRAGMA user_version=" + std::to_string(version));
    }
    EXPECT_THROW(readRecording(file), Error) << "another program's";
}

TEST(RecordingPlayer, EndsWhenAllHasBeenTold)
{
    Recording const one = fromCsv("time,A\n" + std::string(firstSecond) + "1\n");
    RecordingPlayer player(one);
    EXPECT_FALSE(player.atEnd());
    EXPECT_FALSE(player.isPaused());
    EXPECT_EQ(player.speed(), 1.0);
    player.advance(0.0, [](std::size_t, RecordedValue const&) {});
    EXPECT_TRUE(player.atEnd());
    player.setSpeed(-1.0);
    EXPECT_EQ(player.speed(), RecordingPlayer::slowest);
    Recording longer = one;
    longer.end += 500;
    RecordingPlayer waiting(longer);
    waiting.advance(0.0, [](std::size_t, RecordedValue const&) {});
    EXPECT_FALSE(waiting.atEnd()) << "its last moments tell nothing";
    waiting.advance(0.5, [](std::size_t, RecordedValue const&) {});
    EXPECT_TRUE(waiting.atEnd());
    Recording const none;
    EXPECT_TRUE(RecordingPlayer(none).atEnd());
}

} // namespace
