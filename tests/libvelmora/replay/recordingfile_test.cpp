#include "libvelmora/output/database/sqliteoutput.h"
#include "libvelmora/replay/recordingfile.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace velmora;

constexpr std::int64_t nine = 1709802300000; // 2024-03-07T09:05:00Z

Recording csvOf(std::string const& text)
{
    std::istringstream in(text);
    return readCsv(in);
}

Recording ndjsonOf(std::string const& text)
{
    std::istringstream in(text);
    return readNdjson(in);
}

double numberAt(Recording const& recording, std::size_t sensor, std::size_t value)
{
    return std::get<double>(recording.sensors.at(sensor).values.at(value).value);
}

TEST(Recordings, TimesAreReadToTheMillisecond)
{
    EXPECT_EQ(timeIn("2024-03-07T09:05:00.000Z"), nine);
    EXPECT_EQ(timeIn("1970-01-01T00:00:00.007Z"), 7);
    EXPECT_EQ(timeIn("2024-03-07T09:04:60.000Z"), nine) << "a second may be put in";
    for (char const* const text : {"", "2024-03-07 09:05:00.000Z", "2024-02-30T09:05:00.000Z",
                                   "2024-03-07T24:05:00.000Z", "2024-03-07T09:60:00.000Z", "2024-03-07T09:05:61.000Z",
                                   "2024-03-07T09:05:00.000", "2024-03-07T09:05:0x.000Z"}) {
        EXPECT_FALSE(timeIn(text)) << text;
    }
}

TEST(Recordings, OfLiveHaveAColumnASensor)
{
    Recording const recording = csvOf("time,Engine RPM (rpm),\"Bank 1, \"\"A\"\" (V)\",Fuel system\n"
                                      "2024-03-07T09:05:00.000Z,1726,0.45,Open loop\n"
                                      "2024-03-07T09:05:01.000Z,-,0.5,\"Closed, loop\"\n"
                                      "2024-03-07T09:05:02.0");
    ASSERT_EQ(recording.sensors.size(), 3U);
    EXPECT_EQ(recording.sensors[0].about.name, "Engine RPM");
    EXPECT_EQ(recording.sensors[0].about.unit, "rpm");
    EXPECT_EQ(recording.sensors[1].about.name, "Bank 1, \"A\"");
    EXPECT_EQ(recording.sensors[1].decimals, 2);
    EXPECT_EQ(numberAt(recording, 0, 0), 1726.0);
    EXPECT_TRUE(std::holds_alternative<std::monostate>(recording.sensors[0].values[1].value)) << "a dash is no number";
    EXPECT_TRUE(recording.sensors[0].numeric);
    EXPECT_FALSE(recording.sensors[2].numeric);
    EXPECT_EQ(std::get<std::string>(recording.sensors[2].values[1].value), "Closed, loop");
    EXPECT_EQ(recording.begin, nine);
    EXPECT_EQ(recording.end, nine + 1000) << "the torn line is left out";
}

TEST(Recordings, OfTheWatchNameModulesAndLeaveOutWhatDidNotCome)
{
    Recording const wide = csvOf("time,7E8 RPM (rpm),7E9 PID_C2\n2024-03-07T09:05:00.000Z,800,\n"
                                 "2024-03-07T09:05:01.000Z,,7\n");
    EXPECT_EQ(wide.sensors[0].about.module, 0x7E8U);
    EXPECT_EQ(wide.sensors[0].about.sensor, "RPM");
    EXPECT_EQ(wide.sensors[0].values.size(), 1U);
    EXPECT_EQ(wide.sensors[1].about.sensor, "PID_C2");
    Recording const rows = csvOf("time,vehicle,module,pid,sensor,name,value,unit\n"
                                 "2024-03-07T09:05:00.000Z,car,7E8,010C,RPM,Engine RPM,800,rpm\n"
                                 "2024-03-07T09:05:00.500Z,car,7E9,010C,RPM,Engine RPM,801,rpm\n");
    Recording const nobody = csvOf("time,vehicle,module,pid,sensor,name,value,unit\n"
                                   "2024-03-07T09:05:00.000Z,car,,,VOLTS,Battery,12,V\n");
    EXPECT_EQ(nobody.sensors.at(0).about.module, 0U);
    EXPECT_EQ(nobody.sensors.at(0).about.pid, "");
    ASSERT_EQ(rows.sensors.size(), 2U);
    EXPECT_EQ(rows.sensors[1].about.module, 0x7E9U);
    EXPECT_EQ(rows.sensors[1].about.pid, "010C");
    EXPECT_EQ(numberAt(rows, 1, 0), 801.0);
}

TEST(Recordings, NdjsonTellsReadingsAmongOtherThings)
{
    Recording const recording = ndjsonOf(
        R"({"time":"2024-03-07T09:05:00.000Z","vehicle":"car","event":"engine_start","module":null,"text":"x"})"
        "\n"
        R"({"time":"2024-03-07T09:05:01.000Z","module":"7E8","pid":"010C","sensor":"RPM","name":"Engine RPM","value":800.25,"unit":"rpm"})"
        "\n"
        R"({"time":"2024-03-07T09:05:02.000Z","module":"7E8","pid":"0C","uid":120,"name":"Engine RPM","value":null,"unit":null})"
        "\n{\"time\":");
    ASSERT_EQ(recording.sensors.size(), 2U);
    EXPECT_EQ(recording.sensors[0].decimals, 2);
    EXPECT_EQ(recording.sensors[1].about.sensor, "Engine RPM") << "a line of live, which has no key";
    EXPECT_THROW(ndjsonOf("{\n{}\n"), Error);
    EXPECT_TRUE(csvOf("time,A\n9999-01-01T00:00:00.000Z,1\n1969-12-31T23:59:59.999Z,1\n").sensors.empty());
    EXPECT_TRUE(ndjsonOf("[]\n7\n{\"value\":1,\"name\":2,\"time\":3}\n").sensors.empty());
}

TEST(Recordings, TellTheLineThatCannotBePlayed)
{
    for (char const* const text :
         {"", "time", "x,y\n", "time,\"a\n", "time,A\nx,1\n", "time,A\n2024-03-07T09:05:00.000Z\n"}) {
        EXPECT_THROW(csvOf(text), Error) << text;
    }
    try {
        csvOf("time,A\n2024-03-07T09:05:00.000Z,1\n2024-03-07T09:05:00.000Z,1,2\n");
        FAIL() << "a line with too much was taken";
    } catch (Error const& error) {
        EXPECT_NE(std::string(error.what()).find("Line 3"), std::string::npos) << error.what();
    }
}

TEST(Recordings, AreKnownByTheirBeginning)
{
    testsupport::TemporaryFolder const own;
    std::filesystem::path const& folder = own.path();
    std::ofstream(folder / "a") << "time,A\n2024-03-07T09:05:00.000Z,1\n";
    std::ofstream(folder / "b") << "{}\n";
    std::ofstream(folder / "c") << "# a dialogue\n";
    EXPECT_EQ(formOf(folder / "a"), RecordingForm::Csv);
    EXPECT_EQ(formOf(folder / "b"), RecordingForm::Ndjson);
    EXPECT_EQ(formOf(folder / "c"), RecordingForm::Dialogue);
    EXPECT_EQ(readRecording(folder / "a").sensors.size(), 1U);
    EXPECT_THROW(readRecording(folder / "b"), Error) << "holds no readings";
    EXPECT_THROW(formOf(folder), Error);
    EXPECT_THROW(formOf(folder / "none"), Error);

    SqliteOutput output({"sqlite", (folder / "d").string(), {}});
    output.open();
    std::vector<SharedRecord> records;
    for (int i = 0; i < 3; ++i) {
        Reading reading;
        reading.time = WallTime(std::chrono::milliseconds(nine + i * 500));
        reading.module = 0x7E8;
        reading.sensor = "RPM";
        reading.name = "Engine RPM";
        reading.unit = "rpm";
        reading.value = i == 1 ? Reading::Value() : Reading::Value(800.0 + i * 0.25);
        records.push_back(std::make_shared<Record const>(reading));
    }
    output.write(records);
    output.close();
    EXPECT_EQ(formOf(folder / "d"), RecordingForm::Database);
    Recording const recording = readRecording(folder / "d");
    ASSERT_EQ(recording.sensors.size(), 1U);
    EXPECT_EQ(numberAt(recording, 0, 2), 800.5);
    EXPECT_TRUE(std::holds_alternative<std::monostate>(recording.sensors[0].values[1].value));
    EXPECT_EQ(recording.end - recording.begin, 1000);
}

TEST(RecordingPlayer, GoesOnAtItsSpeedAndJumps)
{
    Recording const recording = csvOf("time,A,B\n2024-03-07T09:05:00.000Z,1,10\n2024-03-07T09:05:01.000Z,2,\n"
                                      "2024-03-07T09:05:04.000Z,3,30\n");
    RecordingPlayer player(recording);
    std::string told;
    auto const sink = [&told](std::size_t sensor, RecordedValue const& value) {
        told += std::to_string(sensor) + ":" + std::to_string(static_cast<int>(std::get<double>(value.value))) + " ";
    };
    auto const next = [&](double seconds) {
        told.clear();
        player.advance(seconds, sink);
        return told;
    };
    EXPECT_EQ(next(0.0), "0:1 1:10 ");
    EXPECT_EQ(next(0.9), "");
    EXPECT_EQ(next(0.2), "0:2 ");
    player.setPaused(true);
    EXPECT_EQ(next(100.0), "");
    player.setPaused(false);
    player.setSpeed(2.0);
    EXPECT_EQ(next(1.0), "");
    EXPECT_FALSE(player.atEnd());
    EXPECT_EQ(next(1.0), "0:3 1:30 ");
    EXPECT_TRUE(player.atEnd());
    told.clear();
    player.seek(nine + 1500, sink);
    EXPECT_EQ(told, "0:1 1:10 0:2 ");
    EXPECT_EQ(player.position(), nine + 1500);
    player.seek(0, sink);
    EXPECT_EQ(player.position(), nine);
    player.setSpeed(1e9);
    EXPECT_EQ(player.speed(), RecordingPlayer::fastest);
}

TEST(Recordings, AreReadNoFurtherThanTheyFit)
{
    std::string const row = "2024-03-07T09:05:00.000Z,1,2\n";
    std::istringstream csv("time,A,B\n" + row + row + "no time\n");
    std::istringstream whole("time,A,B\n" + row + "no time\n");
    Recording const columns = readCsv(csv, 3);
    EXPECT_TRUE(columns.cut);
    EXPECT_EQ(columns.sensors.at(0).values.size() + columns.sensors.at(1).values.size(), 3U);
    EXPECT_THROW(readCsv(whole, 3), Error) << "where there is room for more";

    std::string const line = R"({"time":"2024-03-07T09:05:00.000Z","name":"A","value":1})"
                             "\n";
    std::istringstream ndjson(line + line + "no JSON\n\n");
    std::istringstream fitting(line + "no JSON\n\n");
    Recording const lines = readNdjson(ndjson, 1);
    EXPECT_TRUE(lines.cut);
    EXPECT_EQ(lines.sensors.at(0).values.size(), 1U);
    EXPECT_THROW(readNdjson(fitting, 1), Error);
}

} // namespace
