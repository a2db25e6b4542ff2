// How often the page's server tells things by itself, by a clock that the test sets, and what it tells of itself.
#include "libobd/connection/velmorasettings.h"
#include "libvelmora/dash/dashplace.h"
#include "tests/libvelmora/dash/servedpage.h"
#include "tests/support/fakeecu.h"
#include "tests/support/memorysettings.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>

namespace {

using namespace std::chrono_literals;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;
using testsupport::httpBody;
using testsupport::HttpClient;
using velmora::DashContext;
using velmora::DashOutput;
using velmora::Json;
using velmora::test::dashReading;
using velmora::test::nextEvent;
using velmora::test::Page;

DashContext pacedContext(testsupport::TemporaryFolder const& folder)
{
    DashContext context;
    context.desk = std::make_shared<velmora::DashDesk>();
    context.layouts = folder.file("layouts.toml");
    return context;
}

// A page whose time goes on as the test says.
struct PacedPage
{
    testsupport::TemporaryFolder folder;
    std::atomic<std::chrono::steady_clock::time_point> now{std::chrono::steady_clock::time_point(1h)};
    std::shared_ptr<velmora::DashDesk> desk;
    std::unique_ptr<DashOutput> output;
    obd::VelmoraSettings settings{std::make_shared<support::MemorySettings>()};
    std::unique_ptr<HttpClient> stream;

    PacedPage()
    {
        DashContext context = pacedContext(folder);
        context.now = [this] { return now.load(); };
        context.playState = [] { return Json({{"speed", 2}}); };
        desk = context.desk;
        output = std::make_unique<DashOutput>(velmora::parseOutputAddress("dash:127.0.0.1:0"), context);
        output->open();
    }

    void beginRuns()
    {
        auto const ecu = std::make_shared<support::FakeEcu>(0x7E8);
        ecu->setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
        desk->runs().begin(ecu, settings);
    }
    void listen()
    {
        stream = std::make_unique<HttpClient>(output->port());
        stream->send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
        nextEvent(*stream, "hello");
        settle();
    }
    // By its answer the server has seen that the stream has taken all.
    void settle() const
    {
        HttpClient(output->port()).ask("GET /nothing HTTP/1.1\r\nHost: localhost\r\nConnection: close\r\n\r\n");
    }
    void writeAfter(std::chrono::milliseconds time)
    {
        now = now.load() + time;
        output->write({});
        settle();
    }
    // The names of all events that came since the last call.
    std::string events()
    {
        desk->tell(velmora::DashAnswer{"mark", true, {}});
        std::string const all = stream->readUntil("\"topic\":\"mark\"");
        settle();
        std::string names;
        for (std::size_t at = all.find("event: "); at != std::string::npos; at = all.find("event: ", at + 1)) {
            names += all.substr(at + 7, all.find('\n', at) - at - 7) + " ";
        }
        return names;
    }
};

TEST(DashPaces, BeatOnceASecond)
{
    PacedPage page;
    page.listen();
    page.writeAfter(0ms);
    page.writeAfter(0ms);
    page.writeAfter(999ms);
    EXPECT_EQ(page.events(), "beat answer ");
    page.writeAfter(1ms);
    EXPECT_EQ(page.events(), "beat answer ");
    page.writeAfter(1000ms);
    Json const beat = nextEvent(*page.stream, "beat");
    EXPECT_EQ(beat["play"], Json({{"speed", 2}}));
    EXPECT_EQ(beat["losses"], 0);
}

TEST(DashPaces, TellOfTimedRunsFourTimesASecond)
{
    PacedPage page;
    page.listen();
    page.writeAfter(0ms);
    page.beginRuns();
    page.writeAfter(0ms);
    page.desk->runs().end();
    page.writeAfter(249ms);
    EXPECT_EQ(page.events(), "beat performance answer ");
    page.writeAfter(1ms);
    page.writeAfter(250ms);
    EXPECT_EQ(page.events(), "performance answer ") << "nothing has changed since";
}

TEST(DashPaces, EndTimedRunsThatNobodyLooksAt)
{
    PacedPage page;
    page.beginRuns();
    page.writeAfter(0ms);
    while (page.desk->next()) {
        // what was asked so far
    }
    HttpClient asking(page.output->port());
    std::string const body = R"({"topic":"performance","text":"begin"})";
    asking.ask("POST /ask HTTP/1.1\r\nHost: localhost\r\nOrigin: http://localhost\r\nConnection: close\r\n"
               "Content-Length: " +
               std::to_string(body.size()) + "\r\n\r\n" + body);
    EXPECT_EQ(page.desk->next()->text, "begin");
    page.writeAfter(30000ms);
    EXPECT_FALSE(page.desk->next()) << "from the wish on";
    page.writeAfter(1ms);
    auto const asked = page.desk->next();
    ASSERT_TRUE(asked);
    EXPECT_EQ(asked->topic + " " + asked->text, "performance end");
    page.writeAfter(30000ms);
    EXPECT_FALSE(page.desk->next()) << "once in that time";
    page.listen();
    page.writeAfter(60000ms);
    EXPECT_FALSE(page.desk->next()) << "somebody looks";
    page.stream.reset();
    for (int i = 0; i < 30; ++i) {
        page.writeAfter(0ms); // while the server notices
        EXPECT_FALSE(page.desk->next()) << "he has just gone";
    }
    for (int i = 0; i < 1000 && !page.desk->next(); ++i) {
        page.writeAfter(40000ms); // until the server has noticed
    }
    page.desk->runs().end();
    page.writeAfter(60000ms);
    page.desk->drop();
    page.writeAfter(60000ms);
    EXPECT_FALSE(page.desk->next()) << "nothing is timed";
}

TEST(DashOutput, PlaysWhatIsAskedOfARecording)
{
    PacedPage page;
    auto const said = [&page](std::string const& body) {
        std::string const reply =
            HttpClient(page.output->port())
                .ask("POST /ask HTTP/1.1\r\nHost: localhost\r\nOrigin: http://localhost\r\nConnection: close\r\n"
                     "Content-Length: " +
                     std::to_string(body.size()) + "\r\n\r\n" + body);
        EXPECT_THAT(reply, HasSubstr("Content-Security-Policy: default-src 'none'")) << "all replies have it";
        return reply.substr(9, 3) + " " + httpBody(reply);
    };
    EXPECT_EQ(said(R"({"topic":"play","speed":3,"paused":1,"position":"x"})"), "202 Asked\n");
    EXPECT_EQ(page.desk->next()->text, R"({"speed":3})");
    EXPECT_EQ(said(R"({"topic":"play","paused":1})"), "400 This can't be asked of what is shown\n");
    for (int i = 0; i < 16; ++i) {
        said(R"({"topic":"play","speed":)" + std::to_string(i) + "}");
    }
    EXPECT_EQ(said(R"({"topic":"play","paused":false})"), "503 Too much is being asked; try again\n");
}

TEST(DashOutput, ServesSixtyFourAtOnce)
{
    Page const page;
    std::vector<std::unique_ptr<HttpClient>> clients;
    for (int i = 0; i < 64; ++i) {
        clients.push_back(std::make_unique<HttpClient>(page.output->port()));
        clients.back()->send("GET /notices.txt HTTP/1.1\r\nHost: localhost\r\n\r\n");
        ASSERT_THAT(clients.back()->readUntil("\r\n\r\n"), HasSubstr("200 OK")) << i;
    }
    EXPECT_EQ(page.get("/"), "");
}

TEST(DashOutput, TellsBrowsersWhatTheyMayKeep)
{
    Page const page;
    auto const tag = [](std::string const& reply) { return reply.substr(reply.find("ETag: ") + 6, 18); };
    std::string const shell = page.get("/");
    EXPECT_THAT(shell, HasSubstr("Cache-Control: no-cache\r\n"));
    EXPECT_THAT(shell, HasSubstr("Vary: Accept-Encoding\r\n"));
    EXPECT_THAT(tag(shell), testing::MatchesRegex("\"[0-9a-f]{16}\""));
    EXPECT_NE(tag(shell), tag(page.get("/page/chart.min.js"))) << "each file has its own";
    EXPECT_THAT(page.get("/page/chart.min.js"), Not(HasSubstr("Content-Encoding"))) << "not packed without being asked";
}

TEST(DashOutput, HasSixHundredPointsOfAHistory)
{
    Page const page;
    for (int i = 0; i < 3000; ++i) {
        page.desk->tell(dashReading("RPM", 800.0, 1000 + 100 * i));
    }
    Json const history = Json::parse(httpBody(page.get("/history?7E8/RPM")));
    EXPECT_EQ(history["t"].size(), 300U) << "both ends of 150 runs in which all is the same";
}

TEST(DashOutput, TakesItsLayoutAndAnswersAlongToTheNextBrowser)
{
    Page page;
    page.post("/layout", R"({"gauges":["7E8/RPM","7E8/SPEED"]})");
    page.desk->drop();
    page.desk->tell(velmora::DashVehicle{"other", {}});
    EXPECT_FALSE(page.desk->next()) << "which has no layout";
    page.desk->tell(velmora::DashVehicle{"van", {}});
    auto const wish = page.desk->next();
    ASSERT_TRUE(wish) << "a vehicle's layout is what is read of it";
    EXPECT_EQ(wish->topic + " " + wish->text, "sensors 7E8/RPM\n7E8/SPEED\n");
    page.desk->tell(velmora::DashAnswer{"info", true, 7});
    HttpClient stream(page.output->port());
    stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
    Json const hello = nextEvent(stream, "hello");
    EXPECT_EQ(hello["layout"]["gauges"], Json({"7E8/RPM", "7E8/SPEED"}));
    EXPECT_EQ(hello["answers"]["info"]["data"], 7);
    EXPECT_TRUE(hello["beat"].contains("play"));
}

TEST(DashOutput, SaysWhereItIsOrWhyItIsNot)
{
    testsupport::TemporaryFolder const folder;
    std::string where;
    std::string said;
    DashContext context = pacedContext(folder);
    context.token = "secret";
    context.onLink = [&](std::string const& link, std::string const& remark) {
        where = link;
        said = remark;
    };
    DashOutput open(velmora::parseOutputAddress("dash:0.0.0.0:0"), context);
    open.open();
    EXPECT_EQ(where, "http://" + velmora::ownAddress() + ":" + std::to_string(open.port()) + "/#t=secret");
    EXPECT_THAT(said, StartsWith("Whoever is in the same network can read along"));
    for (bool const must : {false, true}) {
        context.mustListen = must;
        DashOutput second(velmora::parseOutputAddress("dash:127.0.0.1:" + std::to_string(open.port())), context);
        try {
            second.open();
            ADD_FAILURE() << "the port is taken";
        } catch (velmora::Error const& error) {
            EXPECT_EQ(error.kind(), must ? velmora::ErrorKind::WrongUse : velmora::ErrorKind::Failed);
        }
    }
    DashOutput own(velmora::parseOutputAddress("dash:127.0.0.1:0"), context);
    own.open();
    EXPECT_EQ(where, "http://127.0.0.1:" + std::to_string(own.port()) + "/") << "no token for this machine alone";
    EXPECT_EQ(said, "");
}

TEST(DashPlace, LinksToThePageByAnAddressThatOthersReach)
{
    EXPECT_EQ(velmora::pageLink("10.0.0.1", 80, ""), "http://10.0.0.1:80/");
    EXPECT_EQ(velmora::pageLink("::1", 8722, "x"), "http://[::1]:8722/#t=x");
    std::string const own = "http://" + velmora::ownAddress() + ":1/";
    EXPECT_EQ(velmora::pageLink("0.0.0.0", 1, ""), own);
    EXPECT_EQ(velmora::pageLink("::", 1, ""), own);
}

TEST(DashPlace, TakesTheFirstUsableAddressOfTheSystem)
{
    sockaddr_in four[3] = {};
    char const* const texts[] = {"127.0.0.1", "10.0.0.7", "10.0.0.8"};
    for (int i = 0; i < 3; ++i) {
        four[i].sin_family = AF_INET;
        ::inet_pton(AF_INET, texts[i], &four[i].sin_addr);
    }
    sockaddr_in6 six = {};
    six.sin6_family = AF_INET6;
    ifaddrs list[6] = {};
    for (int i = 0; i < 5; ++i) {
        list[i].ifa_next = &list[i + 1];
    }
    list[0].ifa_flags = IFF_UP | IFF_RUNNING; // without an address
    list[1].ifa_addr = reinterpret_cast<sockaddr*>(&four[0]);
    list[1].ifa_flags = IFF_UP | IFF_LOOPBACK;
    list[2].ifa_addr = reinterpret_cast<sockaddr*>(&six);
    list[2].ifa_flags = IFF_UP;
    list[3].ifa_addr = reinterpret_cast<sockaddr*>(&four[1]);
    list[3].ifa_flags = IFF_BROADCAST; // which is down
    list[4].ifa_addr = reinterpret_cast<sockaddr*>(&four[2]);
    list[4].ifa_flags = IFF_UP | IFF_BROADCAST;
    list[5] = list[3];
    list[5].ifa_flags = IFF_UP;
    EXPECT_EQ(velmora::addressAmong(list), "10.0.0.8");
    EXPECT_EQ(velmora::addressAmong(nullptr), "127.0.0.1");
    ifaddrs* all = nullptr;
    ASSERT_EQ(::getifaddrs(&all), 0);
    EXPECT_EQ(velmora::ownAddress(), velmora::addressAmong(all));
    ::freeifaddrs(all);
}

} // namespace
