#include "libobd/connection/velmorasettings.h"
#include "libvelmora/dash/dashoutput.h"
#include "libvelmora/dash/playdesk.h"
#include "libvelmora/replay/recordingfile.h"
#include "tests/libvelmora/dash/servedpage.h"
#include "tests/support/fakeecu.h"
#include "tests/support/memorysettings.h"
#include "tests/support/process/httpclient.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/recording.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <future>
#include <sstream>
#include <thread>

namespace {

using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;
using testsupport::httpBody;
using testsupport::HttpClient;
using velmora::DashDesk;
using velmora::DashOutput;
using velmora::Json;
using velmora::Reading;
using velmora::test::dashReading;
using velmora::test::nextEvent;
using velmora::test::Page;

TEST(DashOutput, ServesThePageWithoutAnythingFromElsewhere)
{
    Page const page;
    std::string const shell = page.get("/");
    EXPECT_THAT(shell, HasSubstr("<title>Velmora</title>"));
    EXPECT_THAT(shell, HasSubstr("Content-Security-Policy: default-src 'none'; script-src 'self'"));
    std::string const body = httpBody(shell);
    for (char const* const inlined : {"<style", " style=", "onclick=", "http://", "https://"}) {
        EXPECT_THAT(body, Not(HasSubstr(inlined)));
    }
    std::string const packed = page.get("/page/chart.min.js", "Accept-Encoding: gzip\r\n");
    EXPECT_THAT(packed, HasSubstr("Content-Encoding: gzip"));
    EXPECT_THAT(httpBody(packed), StartsWith("\x1F\x8B"));
    EXPECT_LT(packed.size(), 80000U);
    std::string const tag = packed.substr(packed.find("ETag: ") + 6, 18);
    EXPECT_THAT(page.get("/page/chart.min.js", "If-None-Match: " + tag + "\r\n"), StartsWith("HTTP/1.1 304"));
    EXPECT_THAT(page.get("/notices.txt"), HasSubstr("Permission is hereby granted"));
    EXPECT_THAT(shell, HasSubstr("Content-Type: text/html; charset=utf-8\r\n"));
    EXPECT_THAT(packed, HasSubstr("Content-Type: text/javascript; charset=utf-8\r\n"));
    EXPECT_THAT(page.get("/page/../dash.js"), StartsWith("HTTP/1.1 404"));
    EXPECT_THAT(page.link, StartsWith("http://127.0.0.1:"));
    EXPECT_EQ(page.token(), "");
}

TEST(DashOutput, TellsABrowserAllAtFirstAndThenWhatChanges)
{
    Page const page;
    page.desk->tell(dashReading("RPM", 800.0));
    HttpClient stream(page.output->port());
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    Json const hello = nextEvent(stream, "hello");
    EXPECT_EQ(hello["vehicle"]["offered"][0]["id"], "7E8/RPM");
    EXPECT_EQ(hello["values"]["v"], Json::parse(R"([["7E8/RPM", 1000, 800]])"));
    EXPECT_EQ(hello["values"]["sensors"][0]["name"], "Engine RPM");
    EXPECT_EQ(hello["layout"], nullptr);
    EXPECT_EQ(hello["allow"]["clear"], false);
    page.get("/"); // by now the server knows that the stream has taken all

    page.desk->tell(dashReading("RPM", 900.0, 2000));
    auto const code = std::make_shared<velmora::Record const>(
        velmora::CodeChange{{}, "van", 0x7E8, "P0133", "confirmed", "O2 <b>slow</b>", true});
    std::vector<velmora::SharedRecord> const records = {code};
    page.output->write(records);
    EXPECT_EQ(nextEvent(stream, "values")["v"], Json::parse(R"([["7E8/RPM", 2000, 900]])"));
    EXPECT_EQ(nextEvent(stream, "news")["codes"][0]["code"], "P0133");
    EXPECT_TRUE(nextEvent(stream, "beat").contains("state"));
    page.desk->tell(velmora::DashAnswer{"info", true, Json::array({1})});
    EXPECT_EQ(nextEvent(stream, "answer")["data"], Json::array({1}));
    EXPECT_THAT(page.get("/history?7E8/RPM"), HasSubstr(R"({"id":"7E8/RPM","t":[1000,2000],"v":[800,900]})"));
    EXPECT_THAT(page.get("/history?none"), HasSubstr("Content-Type: application/json\r\n"));
}

TEST(DashOutput, KeepsALayoutForItsVehicle)
{
    Page page;
    EXPECT_THAT(page.post("/layout", R"({"gauges":["7E8/RPM"],"units":"imperial"})"), StartsWith("HTTP/1.1 204"));
    auto const wish = page.desk->next();
    ASSERT_TRUE(wish.has_value());
    EXPECT_EQ(wish->topic, "sensors");
    EXPECT_EQ(wish->text, "7E8/RPM\n");
    for (char const* const wrong : {"", "[]", "{", R"({"gauges":"x"})", R"({"gauges":[1]})", R"({"evil":1})",
                                    R"({"units":"stones"})", R"({"minutes":99})", R"({"minutes":"5"})"}) {
        EXPECT_THAT(page.post("/layout", wrong), StartsWith("HTTP/1.1 400")) << wrong;
    }
    page.desk->tell(velmora::DashVehicle{"other", {}});
    HttpClient other(page.output->port());
    other.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    EXPECT_EQ(nextEvent(other, "hello")["layout"], nullptr);
    page.desk->tell(velmora::DashVehicle{"van", {}});
    EXPECT_EQ(nextEvent(other, "hello")["layout"]["units"], "imperial");
    page.post("/layout", R"({"units":"metric"})");
    EXPECT_EQ(nextEvent(other, "layout")["units"], "metric") << "other browsers follow";
}

TEST(DashOutput, AsksTheCarForWhatIsAllowedOnly)
{
    Page const page;
    EXPECT_THAT(page.post("/ask", R"({"topic":"codes"})"), StartsWith("HTTP/1.1 202"));
    EXPECT_THAT(page.post("/ask", R"({"topic":"codes"})"), StartsWith("HTTP/1.1 202")); // the same once more
    EXPECT_EQ(page.desk->next()->topic, "codes");
    EXPECT_FALSE(page.desk->next().has_value());
    EXPECT_THAT(page.post("/ask", R"({"topic":"clear","sure":true})"), StartsWith("HTTP/1.1 403"));
    EXPECT_THAT(page.post("/ask", R"({"topic":"console","text":"ATI"})"), StartsWith("HTTP/1.1 403"));
    EXPECT_THAT(page.post("/ask", R"({"topic":"sensors","text":"x"})"), StartsWith("HTTP/1.1 400"));
    EXPECT_THAT(page.post("/ask", "nonsense"), StartsWith("HTTP/1.1 400"));
    EXPECT_THAT(page.get("/ask"), StartsWith("HTTP/1.1 405"));
    EXPECT_FALSE(page.desk->next().has_value());

    Page const open("?allow_clear=yes&allow_console=yes");
    EXPECT_THAT(open.post("/ask", R"({"topic":"clear"})", open.cookie()), StartsWith("HTTP/1.1 400"));
    EXPECT_THAT(open.post("/ask", R"({"topic":"clear","sure":true})", open.cookie()), StartsWith("HTTP/1.1 202"));
    EXPECT_THAT(open.post("/ask", "{\"topic\":\"console\",\"text\":\"ATI\\rATZ\"}", open.cookie()),
                StartsWith("HTTP/1.1 400"));
    EXPECT_THAT(open.post("/ask", R"({"topic":"console","text":"ATI"})", open.cookie()), StartsWith("HTTP/1.1 202"));
    EXPECT_EQ(open.desk->next()->topic, "clear");
    EXPECT_EQ(open.desk->next()->text, "ATI");
}

TEST(DashOutput, LetsInWhoHasTheTokenOnly)
{
    Page const page("?allow_clear=yes");
    ASSERT_EQ(page.token().size(), 22U);
    EXPECT_THAT(page.get("/"), StartsWith("HTTP/1.1 200")); // the shell tells nothing
    for (char const* const path : {"/events", "/traffic", "/history?7E8/RPM", "/nothing"}) {
        EXPECT_THAT(page.get(path), StartsWith("HTTP/1.1 401")) << path;
    }
    EXPECT_THAT(page.post("/ask", R"({"topic":"codes"})"), StartsWith("HTTP/1.1 401"));
    EXPECT_THAT(page.post("/layout", "{}"), StartsWith("HTTP/1.1 401"));
    EXPECT_THAT(page.post("/login", "wrong"), StartsWith("HTTP/1.1 401"));
    std::string const in = page.post("/login", page.token());
    EXPECT_THAT(in, HasSubstr("Set-Cookie: velmora_" + std::to_string(page.output->port()) + "=" + page.token() +
                              "; Path=/; HttpOnly; SameSite=Strict"));
    EXPECT_THAT(page.get("/history?7E8/RPM", page.cookie()), StartsWith("HTTP/1.1 200"));
}

TEST(DashOutput, SlowsThoseDownWhoTryTokens)
{
    Page const page("?allow_console=yes");
    auto const begin = std::chrono::steady_clock::now();
    for (int i = 0; i < 10; ++i) {
        page.post("/login", "wrong");
    }
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(900));
    HttpClient slow(page.output->port());
    slow.send("POST /login HTTP/1.1\r\nHost: " + page.host() + "\r\nOrigin: http://" + page.host() +
              "\r\nContent-Length: 1\r\nConnection: close\r\n\r\nx");
    EXPECT_THAT(page.get("/"), StartsWith("HTTP/1.1 200")); // nobody else waits
    EXPECT_THAT(slow.readAll(), StartsWith("HTTP/1.1 401"));
    EXPECT_GT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(900));
}

TEST(DashOutput, HostileClientsStopNobodyAndCostNothing)
{
    Page const page;
    std::string const host = "Host: " + page.host() + "\r\n";
    std::vector<std::unique_ptr<HttpClient>> halves;
    for (int i = 0; i < 40; ++i) {
        halves.push_back(std::make_unique<HttpClient>(page.output->port()));
        halves.back()->send("GET /events HTTP/1.1\r\nHo");
    }
    auto const begin = std::chrono::steady_clock::now();
    EXPECT_THAT(page.get("/"), StartsWith("HTTP/1.1 200"));
    std::string fields = "GET / HTTP/1.1\r\n" + host;
    for (int i = 0; i < 300000; ++i) {
        fields += "X: y\r\n";
    }
    EXPECT_THAT(HttpClient(page.output->port()).ask(fields + "\r\n"), Not(HasSubstr("200 OK")));
    HttpClient line(page.output->port());
    std::string const megabyte(1 << 20, 'x');
    line.send("GET / HTTP/1.1\r\n" + host + "X: ");
    for (int i = 0; i < 100 && line.send(megabyte); ++i) {
        // a line of 100 MB, until nobody takes it any more
    }
    EXPECT_THAT(line.readAll(), Not(HasSubstr("200 OK")));
    for (char const* const smuggled : {"POST /ask HTTP/1.1\r\nContent-Length: 5\r\nTransfer-Encoding: chunked\r\n",
                                       "GET / HTTP/1.1\r\nHost: a\r\n", "GET / HTTP/9.9\r\n", "GET /\r\n"}) {
        EXPECT_THAT(HttpClient(page.output->port()).ask(smuggled + host + "Connection: close\r\n\r\n"),
                    StartsWith("HTTP/1.1 400"))
            << smuggled;
    }
    EXPECT_THAT(page.get("/"), StartsWith("HTTP/1.1 200"));
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(3));
}

TEST(DashOutput, AReaderWhoIsTooSlowGetsTheLatestValuesInTheEnd)
{
    Page const page;
    HttpClient stream(page.output->port());
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    stream.readUntil("event: hello");
    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
    ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
    obd::VelmoraSettings const settings(std::make_shared<support::MemorySettings>());
    page.desk->runs().begin(ecu, settings);
    constexpr int sensors = 100;
    constexpr int rounds = 1500; // far more than the buffers of both ends hold
    std::size_t told = 0;
    for (int round = 0; round < rounds; ++round) {
        for (int i = 0; i < sensors; ++i) {
            page.desk->tell(dashReading("S" + std::to_string(i), round, 1000 + round));
        }
        page.output->write({});
        ++told;
    }
    std::string const last = "\"7E8/S99\"," + std::to_string(1000 + rounds - 1) + ",";
    std::string const all = stream.readUntil(last);
    EXPECT_THAT(all, testing::EndsWith(last));
    Json const runs = nextEvent(stream, "performance");
    EXPECT_TRUE(runs.contains("goals"));
    EXPECT_FALSE(runs.contains("speed"));
    std::size_t events = 0;
    for (std::size_t at = all.find("event: values"); at != std::string::npos; at = all.find("event: values", at + 1)) {
        ++events;
    }
    EXPECT_LT(events, told); // the ones between were left out, not kept
}

TEST(DashOutput, AReaderOfTheTrafficWhoIsTooSlowGetsTheLastLinesInTheEnd)
{
    Page const page;
    HttpClient stream(page.output->port());
    stream.send("GET /traffic HTTP/1.1\r\nHost: localhost\r\n\r\n");
    stream.readUntil("event: lines");
    constexpr int bursts = 60;
    constexpr int lines = 300; // as many as are kept, and with these texts far more than the buffers of both ends hold
    for (int burst = 0; burst < bursts; ++burst) {
        for (int i = 0; i < lines; ++i) {
            page.desk->tell(velmora::DashLine{{}, true, std::string(700, 'x')});
        }
        page.output->write({});
    }
    std::string const all = stream.readUntil("," + std::to_string(bursts * lines) + "]]\n");
    EXPECT_THAT(all, HasSubstr("," + std::to_string((bursts - 1) * lines + 1) + "]"));
    EXPECT_LT(std::count(all.begin(), all.end(), 'v'), bursts) << "those between were left out, not kept";
}

TEST(DashOutput, EndsAtOnceWithBrowsersConnected)
{
    Page page;
    HttpClient stream(page.output->port());
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    stream.readUntil("event: hello");
    HttpClient const idle(page.output->port());
    auto const begin = std::chrono::steady_clock::now();
    page.output->close();
    page.output.reset();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(500));
    page.desk->tell(dashReading("RPM", 1.0)); // nobody listens any more
}

TEST(DashState, ThinsAHistoryAndKeepsItsPeaks)
{
    velmora::DashState state;
    for (int i = 0; i < 3000; ++i) {
        state.take(dashReading("RPM", i == 1234 ? 9999.0 : 800.0, 100 * i));
    }
    Json const history = state.history("7E8/RPM", 200);
    EXPECT_LE(history["t"].size(), 220U);
    EXPECT_EQ(history["t"].size(), history["v"].size());
    EXPECT_THAT(history["v"], testing::Contains(9999.0));
    EXPECT_EQ(history["t"].back(), 299900);
    EXPECT_EQ(state.history("none", 200)["t"], Json::array());
}

TEST(DashOutput, TellsOfTimedRunsAndGivesThemAway)
{
    Page const page;
    EXPECT_THAT(page.post("/ask", R"({"topic":"performance","text":"begin"})"), StartsWith("HTTP/1.1 202"));
    EXPECT_THAT(page.post("/ask", R"({"topic":"performance","text":"sideways"})"), StartsWith("HTTP/1.1 400"));
    EXPECT_EQ(page.desk->next()->text, "begin");
    EXPECT_EQ(httpBody(page.get("/performance.json")), "null") << "nothing was timed";

    auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
    ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
    obd::VelmoraSettings const settings(std::make_shared<support::MemorySettings>());
    page.desk->runs().begin(ecu, settings);
    HttpClient stream(page.output->port());
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    Json const hello = nextEvent(stream, "hello");
    EXPECT_EQ(hello["performance"]["active"], true);
    EXPECT_FALSE(hello["performance"].contains("speed"));
    page.get("/");
    for (unsigned char kmh = 0; kmh <= 130; ++kmh) {
        Reading reading = dashReading("SPEED", kmh, 1000 + kmh * 100);
        reading.raw = {0x41, 0x0D, kmh};
        page.desk->tell(reading);
        reading.module = 0x7E9; // another one's is not timed
        page.desk->tell(reading);
    }
    page.output->write({});
    Json const event = nextEvent(stream, "performance");
    EXPECT_EQ(event["kmh"], 130);
    EXPECT_EQ(event["goals"][0]["seconds"], 10.0);
    EXPECT_EQ(event["goals"][1]["name"], "0 to 60 mph");
    EXPECT_FALSE(event.contains("speed")) << "what nobody looks at is not sent each time";
    std::string const file = page.get("/performance.json");
    EXPECT_THAT(file, HasSubstr("Content-Disposition: attachment"));
    EXPECT_EQ(Json::parse(httpBody(file))["speed"].size(), 131U);
    page.desk->runs().end();
    EXPECT_EQ(page.desk->runs().state(false)["active"], false);
    EXPECT_EQ(page.desk->runs().state(false)["goals"][0]["seconds"], 10.0) << "it stays to be looked at";
}

TEST(DashPlay, TellsARecordingAsIfItCameNow)
{
    std::istringstream in("time,7E8 RPM (rpm),7E8 MAP (kPa)\n2024-03-07T09:05:00.000Z,800,30.5\n"
                          "2024-03-07T09:05:01.000Z,900,31\n2024-03-07T09:05:09.000Z,1700,\n");
    velmora::Recording recording = velmora::readCsv(in);
    recording.sensors.at(0).about.name = "Engine speed";
    recording.sensors.at(0).about.pid = "010C";
    velmora::PlayDesk play(recording, 2.0);
    std::vector<std::string> told;
    Reading first;
    DashDesk::Listener listener;
    listener.reading = [&](Reading const& each) {
        told.push_back(each.sensor + " " + valueText(each));
        first = each.sensor == "RPM" ? each : first;
    };
    listener.line = [](velmora::DashLine const&) {};
    listener.answer = [&told](velmora::DashAnswer const& each) {
        told.push_back(each.topic + (each.done ? "" : " not"));
    };
    listener.vehicle = [&](velmora::DashVehicle const& each) {
        told.push_back(each.offered.at(1).sensor + " " + play.state()["speed"].dump());
    };
    auto const listening = play.desk()->listen(listener);
    auto const step = [&](double seconds) {
        told.clear();
        play.step(seconds);
        return told;
    };
    play.introduce();
    EXPECT_EQ(told, std::vector<std::string>{"MAP 2.0"});
    EXPECT_EQ(step(0.1), (std::vector<std::string>{"RPM 800", "MAP 30.5"}));
    EXPECT_EQ(first.module, 0x7E8U);
    EXPECT_LT(std::chrono::system_clock::now() - first.time, std::chrono::minutes(1)) << "whenever it was recorded";
    EXPECT_EQ(first.name + " " + first.pid + " " + first.unit, "Engine speed 010C rpm");
    EXPECT_EQ(step(0.5), (std::vector<std::string>{"RPM 900", "MAP 31.0"}));
    play.desk()->ask({"play", velmora::PlayDesk::parse({{"paused", true}, {"other", 1}}).dump()});
    EXPECT_TRUE(step(100.0).empty());
    EXPECT_EQ(play.state()["paused"], true);
    play.desk()->ask({"play", velmora::PlayDesk::parse({{"position", 1e300}}).dump()});
    EXPECT_EQ(step(0.0), (std::vector<std::string>{"RPM 1700", "MAP 31.0"})) << "what stands there";
    EXPECT_EQ(play.state()["position"], recording.end);
    play.desk()->ask({"codes", ""});
    EXPECT_EQ(step(0.0), std::vector<std::string>{"codes not"}) << "there is no vehicle to ask";
    play.desk()->ask({"sensors", "x"});
    EXPECT_TRUE(step(0.0).empty()) << "all are told anyway";
    play.desk()->ask({"play", velmora::PlayDesk::parse({{"speed", 5}, {"paused", false}}).dump()});
    step(0.0);
    EXPECT_EQ(play.state()["speed"], 5.0);
    EXPECT_EQ(play.state()["paused"], false);
    EXPECT_TRUE(velmora::PlayDesk::parse({{"speed", "fast"}}).is_null());
    EXPECT_THAT(Page().post("/ask", R"({"topic":"play","paused":true})"), StartsWith("HTTP/1.1 400"));
}

TEST(PagePlay, ServesARecordingUntilItsEnd)
{
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("drive.csv")) << "time,7E8 RPM (rpm)\n2024-03-07T09:05:00.000Z,800\n";
    std::promise<std::string> served;
    velmora::PagePlay play(
        velmora::readRecording(folder.file("drive.csv")), "dash:127.0.0.1:0", 1.0, folder.file("settings.toml"),
        [&served](std::string const& link, std::string const& /*remark*/) { served.set_value(link); });
    std::thread runner([&play] { play.run(); });
    std::string const link = served.get_future().get();
    EXPECT_THAT(link, StartsWith("http://127.0.0.1:"));
    auto const port = static_cast<unsigned short>(std::stoi(link.substr(link.rfind(':') + 1)));
    HttpClient stream(port);
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    EXPECT_EQ(nextEvent(stream, "beat")["state"], "playing");
    play.end();
    runner.join();
    EXPECT_THROW(velmora::PagePlay({}, "dash:127.0.0.1:99999", 1.0, "", {}), velmora::Error);
}

TEST(DashOutput, AStreamThatBrokeBringsWhatWasMissed)
{
    Page const page;
    std::string id;
    {
        HttpClient stream(page.output->port());
        stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
        EXPECT_EQ(nextEvent(stream, "hello")["resumed"], false);
        page.get("/");
        page.desk->tell(dashReading("RPM", 800.0, 1000));
        page.output->write({});
        EXPECT_EQ(nextEvent(stream, "values")["v"][0][2], 800);
        stream.readUntil("id: ");
        id = stream.readUntil("\n");
        id = id.substr(0, id.find('\n'));
    }
    for (int i = 1; i <= 3; ++i) {
        page.desk->tell(dashReading("RPM", 800.0 + i, 1000 + i * 100));
        page.output->write({});
    }
    for (std::string const& way :
         {"GET /events HTTP/1.1\r\nLast-Event-ID: " + id, "GET /events?last=" + id + " HTTP/1.1"}) {
        HttpClient again(page.output->port());
        again.send(way + "\r\nHost: localhost\r\n\r\n");
        for (int i = 1; i <= 3; ++i) {
            EXPECT_EQ(nextEvent(again, "values")["v"][0][2], 800 + i) << way;
        }
        EXPECT_EQ(nextEvent(again, "hello")["resumed"], true);
    }
    for (std::string const& other : std::vector<std::string>{"1-1", "x", id + "0", id + "x", "-"}) {
        HttpClient again(page.output->port());
        again.send("GET /events HTTP/1.1\r\nHost: localhost\r\nLast-Event-ID: " + other + "\r\n\r\n");
        EXPECT_EQ(nextEvent(again, "hello")["resumed"], false) << other;
    }
}

TEST(DashEventLog, KeepsNoMoreThanItsBytes)
{
    velmora::DashEventLog log;
    std::string const first = log.add("a");
    EXPECT_EQ(log.since(log.last()), "");
    std::string const second = log.add(std::string(velmora::DashEventLog::mostBytes - 1, 'b'));
    EXPECT_TRUE(log.since(first));
    log.add("cc");
    EXPECT_EQ(log.since(first), std::nullopt) << "the event behind it was dropped";
    EXPECT_THAT(log.since(second).value_or(""), HasSubstr("data: cc\n"));
}

} // namespace
