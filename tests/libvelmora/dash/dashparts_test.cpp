#include "libvelmora/dash/dashaccess.h"
#include "libvelmora/dash/dashdesk.h"
#include "libvelmora/dash/dashlayouts.h"
#include "libvelmora/dash/eventlog.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using velmora::DashEventLog;
using velmora::DashLayouts;
using velmora::Error;
using velmora::Json;

std::string whyNoLayout(std::string const& text)
{
    try {
        DashLayouts::parse(text);
        return {};
    } catch (Error const& error) {
        return error.what();
    }
}

std::string layoutOfIds(std::size_t count, std::size_t length)
{
    return Json({{"chart", Json(count, std::string(length, 'x'))}}).dump();
}

TEST(DashLayouts, HoldNothingButWhatBelongsThere)
{
    std::string const whole = R"({"gauges":["a"],"chart":["b","a"],"numbers":["c"],"units":"metric",)"
                              R"("theme":"dark","size":"large","minutes":15})";
    EXPECT_EQ(DashLayouts::parse(whole), Json::parse(whole));
    EXPECT_THAT(DashLayouts::sensorsOf(DashLayouts::parse(whole)), ElementsAre("a", "b", "c")) << "each of them once";
    EXPECT_TRUE(DashLayouts::sensorsOf(Json()).empty());
    for (char const* const good :
         {"{}", R"({"minutes":1})", R"({"units":"imperial"})", R"({"units":"imperial-uk"})", R"({"theme":"auto"})",
          R"({"theme":"light"})", R"({"size":"small"})", R"({"size":"normal"})"}) {
        EXPECT_EQ(whyNoLayout(good), "") << good;
    }
    for (char const* const odd : {R"({"minutes":0})", R"({"minutes":16})", R"({"minutes":1.5})", R"({"minute":1})"}) {
        EXPECT_THAT(whyNoLayout(odd), HasSubstr("does not belong there")) << odd;
    }
    for (char const* const odd : {R"({"units":1})", R"({"theme":"metric"})", R"({"size":"huge"})"}) {
        EXPECT_THAT(whyNoLayout(odd), HasSubstr("a word in it is not known")) << odd;
    }
    EXPECT_THAT(whyNoLayout(R"({"gauges":{"a":"b"}})"), HasSubstr("sensors are a short list"));
    EXPECT_THAT(whyNoLayout(R"({"gauges":[["a"]]})"), HasSubstr("sensors are short texts"));
    for (char const* const odd : {"", "[]", "{", "null"}) {
        EXPECT_THAT(whyNoLayout(odd), HasSubstr("no object")) << odd;
    }
}

TEST(DashLayouts, AreShort)
{
    EXPECT_EQ(whyNoLayout(layoutOfIds(64, 64)), "");
    EXPECT_THAT(whyNoLayout(layoutOfIds(65, 64)), HasSubstr("sensors are a short list"));
    EXPECT_THAT(whyNoLayout(layoutOfIds(64, 65)), HasSubstr("sensors are short texts"));
    EXPECT_EQ(whyNoLayout("{}" + std::string(16 * 1024 - 2, ' ')), "");
    EXPECT_THAT(whyNoLayout("{}" + std::string(16 * 1024 - 1, ' ')), HasSubstr("too long"));
}

TEST(DashLayouts, AreKeptForEachVehicleInAFileBesideTheSettings)
{
    EXPECT_EQ(DashLayouts::besides("/some/where/settings.toml"), "/some/where/layouts.toml");
    testsupport::TemporaryFolder const folder;
    DashLayouts const layouts(folder.file("layouts.toml"));
    Json const first = {{"units", "metric"}};
    Json const second = {{"minutes", 7}};
    layouts.save("my/van.1", first);
    layouts.save("my-van", second);
    EXPECT_EQ(layouts.load("my/van.1"), first);
    EXPECT_EQ(layouts.load("my-van"), second);
    EXPECT_EQ(layouts.load("van"), Json());
    EXPECT_THAT(folder.read("layouts.toml"), HasSubstr("my_van_1"));
    std::ofstream(folder.file("layouts.toml")) << "[layout]\nvan = 'x'\n";
    EXPECT_EQ(layouts.load("van"), Json()) << "spoilt by hand";
    std::ofstream(folder.file("layouts.toml")) << "[layout\n";
    EXPECT_EQ(layouts.load("van"), Json());
}

TEST(DashEventLog, GivesWhatABrowserMissed)
{
    DashEventLog log;
    std::string const none = log.last();
    EXPECT_EQ(log.since(none), "");
    std::string const first = log.add("one");
    std::string const second = log.add("two");
    EXPECT_EQ(log.last(), second);
    EXPECT_NE(first, second);
    EXPECT_EQ(log.since(second), "");
    std::string const missed = log.since(first).value_or("");
    EXPECT_THAT(missed, HasSubstr("event: values"));
    EXPECT_THAT(missed, HasSubstr("data: two"));
    EXPECT_THAT(missed, HasSubstr("id: " + second));
    EXPECT_THAT(missed, Not(HasSubstr("data: one")));
    EXPECT_THAT(log.since(none).value_or(""), HasSubstr("data: one"));
    std::string const run = first.substr(0, first.find('-'));
    for (std::string const& odd : {std::string(), run, run + "-", run + "-x", first + "x", run + "-3", "7" + first}) {
        EXPECT_EQ(log.since(odd), std::nullopt) << odd;
    }
}

TEST(DashEventLog, ForgetsTheOldest)
{
    DashEventLog log;
    std::string const none = log.last();
    std::string const first = log.add(std::string(512 * 1024 - 1, 'x'));
    std::string const second = log.add("y");
    EXPECT_TRUE(log.since(none)) << "half a megabyte is kept";
    std::string const third = log.add("z");
    EXPECT_EQ(log.since(none), std::nullopt);
    EXPECT_THAT(log.since(first).value_or(""), HasSubstr("id: " + second + "\n"));
    EXPECT_THAT(log.since(second).value_or(""), HasSubstr("id: " + third + "\n"));
}

TEST(DashAccess, OpensTheShellToAllAndTheRestToWhoHasTheCookie)
{
    velmora::DashAccess access("secret", {});
    access.setPort(80);
    velmora::HttpRequest request;
    request.method = "GET";
    request.headers = {{"host", "localhost"}};
    for (char const* const path : {"/", "/login", "/notices.txt", "/page/dash.js"}) {
        request.path = path;
        EXPECT_FALSE(access.gate(request)) << path;
    }
    for (char const* const path : {"/events", "/pages", "/login/"}) {
        request.path = path;
        ASSERT_TRUE(access.gate(request)) << path;
        EXPECT_EQ(access.gate(request)->status, 401U);
        EXPECT_THAT(access.gate(request)->body, HasSubstr("by the link with the token"));
    }
    request.headers.emplace_back("cookie", "velmora_80=secret");
    EXPECT_FALSE(access.gate(request));
    request.headers[0].second = "evil.test";
    EXPECT_EQ(access.gate(request)->status, 421U);
}

TEST(DashAccess, WhoTriesTokensWaitsFromTheEleventhOn)
{
    velmora::DashAccess access("secret", {});
    velmora::HttpRequest login;
    login.body = "guess";
    for (int i = 0; i < 10; ++i) {
        EXPECT_EQ(access.login(login).delay.count(), 0);
    }
    EXPECT_EQ(access.login(login).delay, std::chrono::seconds(1));
    EXPECT_EQ(access.login(login).status, 401U);
    login.body = "secret";
    EXPECT_EQ(access.login(login).status, 204U);
    EXPECT_EQ(access.login(login).delay.count(), 0) << "who has it does not wait";

    velmora::DashAccess open("", {});
    EXPECT_EQ(open.login(login).status, 204U);
    EXPECT_TRUE(open.login(login).headers.empty()) << "no cookie without a token";
}

TEST(DashDesk, KeepsSixteenWishesEachOnce)
{
    velmora::DashDesk desk;
    for (int i = 0; i < 16; ++i) {
        EXPECT_TRUE(desk.ask({"console", std::to_string(i)}));
    }
    EXPECT_TRUE(desk.ask({"console", "3"})) << "waits already";
    EXPECT_FALSE(desk.ask({"console", "16"}));
    EXPECT_FALSE(desk.ask({"info", "3"}));
    EXPECT_EQ(desk.next()->text, "0");
    EXPECT_EQ(desk.next()->text, "1");
    EXPECT_TRUE(desk.ask({"info", "3"}));
    desk.drop();
    EXPECT_FALSE(desk.next());
}

TEST(DashDesk, TellsWhoListensUntilHeLetsGo)
{
    velmora::DashDesk desk;
    std::vector<std::string> heard;
    auto const listening = [&heard](std::string const& who) {
        velmora::DashDesk::Listener listener;
        listener.vehicle = [&heard, who](velmora::DashVehicle const& vehicle) { heard.push_back(who + vehicle.key); };
        return listener;
    };
    auto first = desk.listen(listening("1 "));
    auto const second = desk.listen(listening("2 "));
    desk.tell(velmora::DashVehicle{"van", {}});
    first.reset();
    desk.tell(velmora::DashVehicle{"car", {}});
    desk.tell(velmora::DashAnswer{"info", true, {}}); // for which nobody has an ear
    EXPECT_THAT(heard, ElementsAre("1 van", "2 van", "2 car"));
}

} // namespace
