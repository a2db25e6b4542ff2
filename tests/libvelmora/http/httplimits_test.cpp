// What a client of the server may cost, up to the last byte, and what becomes of those who go or stand still.
#include "libvelmora/http/httpserver.h"
#include "tests/support/process/httpclient.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <unistd.h>

namespace {

using namespace std::chrono_literals;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;
using testsupport::httpBody;
using testsupport::HttpClient;
using testsupport::httpGet;
using velmora::HttpLimits;
using velmora::HttpRequest;
using velmora::HttpResponse;
using velmora::HttpServer;

HttpResponse answerOf(std::string const& text, std::chrono::milliseconds delay = 0ms)
{
    HttpResponse response;
    response.body = text;
    response.delay = delay;
    return response;
}

struct LimitRig
{
    HttpServer server;

    explicit LimitRig(HttpLimits const& limits = {}) : server(limits)
    {
        server.addRoute("GET", "/a", [](HttpRequest const& request) { return answerOf(request.header("x-az")); });
        server.addRoute("GET", "/late", [](HttpRequest const&) { return answerOf("late", 400ms); });
        server.addRoute("GET", "/never", [](HttpRequest const&) { return answerOf("never", 60s); });
        server.addRoute("GET", "/big",
                        [](HttpRequest const&) { return answerOf(std::string(std::size_t{32} << 20, 'x'), 1ms); });
        server.addStream("/events", [](HttpRequest const&) { return HttpServer::event("", "first"); });
        server.start({"127.0.0.1", 0});
    }

    // Whether so many read streams, after a while.
    bool waitForReaders(std::size_t count) const
    {
        for (int i = 0; i < 5000 && server.readers() != count; ++i) {
            ::usleep(1000);
        }
        return server.readers() == count;
    }
};

std::unique_ptr<HttpClient> readerOf(HttpServer const& server)
{
    auto reader = std::make_unique<HttpClient>(server.port());
    reader->send("GET /events HTTP/1.1\r\n\r\n");
    return reader;
}

TEST(HttpLimits, OfHeadersAreExact)
{
    LimitRig const rig;
    auto const status = [&rig](std::size_t bytes) {
        std::string const request = "GET /a HTTP/1.1\r\nConnection: close\r\nX: ";
        return HttpClient(rig.server.port()).ask(request + std::string(bytes - request.size() - 4, 'x') + "\r\n\r\n");
    };
    EXPECT_THAT(status(8 * 1024), StartsWith("HTTP/1.1 200"));
    EXPECT_THAT(status(8 * 1024 + 40), StartsWith("HTTP/1.1 431")) << "the first line and whole fields are not counted";
    std::string const refused = status(20000);
    EXPECT_THAT(refused, HasSubstr("Connection: close\r\n"));
    EXPECT_EQ(httpBody(refused), "The header is too long\n");
}

TEST(HttpLimits, OfConnectionsCountThoseThatAreThere)
{
    LimitRig const rig;
    for (int i = 0; i < 20; ++i) {
        ASSERT_THAT(httpGet(rig.server.port(), "/a"), StartsWith("HTTP/1.1 200")) << "those before have gone: " << i;
    }
    std::vector<std::unique_ptr<HttpClient>> readers;
    for (int i = 0; i < 16; ++i) {
        readers.push_back(readerOf(rig.server));
        ASSERT_THAT(readers.back()->readUntil("first\n\n"), HasSubstr("200")) << i;
    }
    EXPECT_EQ(readerOf(rig.server)->readAll(), "") << "the seventeenth";
    EXPECT_EQ(httpGet(rig.server.port(), "/a"), "");
    readers.pop_back();
    EXPECT_TRUE(rig.waitForReaders(15)) << "who goes is noticed, though nothing is sent";
    EXPECT_THAT(httpGet(rig.server.port(), "/a"), StartsWith("HTTP/1.1 200"));
    readers.back()->send("who reads has nothing to say");
    readers.pop_back();
    EXPECT_TRUE(rig.waitForReaders(14));
}

TEST(HttpLimits, CarryWhatBrowsersAreToKnowInEachReply)
{
    LimitRig const rig;
    std::string const reply =
        HttpClient(rig.server.port()).ask("GET /a HTTP/1.1\r\nX-AZ: both ends\r\nConnection: close\r\n\r\n");
    EXPECT_EQ(httpBody(reply), "both ends") << "a name in capitals";
    EXPECT_THAT(reply, HasSubstr("Content-Type: text/plain; charset=utf-8\r\n"));
    EXPECT_THAT(reply, HasSubstr("Cache-Control: no-store\r\n"));
    EXPECT_THAT(reply, HasSubstr("X-Content-Type-Options: nosniff\r\n"));
    EXPECT_THAT(reply, HasSubstr("Connection: close\r\n"));
    HttpClient staying(rig.server.port());
    staying.send("GET /a HTTP/1.1\r\n\r\n");
    EXPECT_THAT(staying.readUntil("\r\n\r\n"), Not(HasSubstr("Connection: close")));
    HttpClient poster(rig.server.port());
    EXPECT_THAT(poster.ask("POST /events HTTP/1.1\r\nConnection: close\r\n\r\n"), HasSubstr("Allow: GET\r\n"));
}

TEST(HttpLimits, AnswerNothingToWhoLeavesBeforeTheEnd)
{
    LimitRig const rig;
    auto const begin = std::chrono::steady_clock::now();
    HttpClient half(rig.server.port());
    half.send("GET /a HTT");
    half.endSending();
    EXPECT_EQ(half.readAll(), "");
    HttpClient silent(rig.server.port());
    silent.endSending();
    EXPECT_EQ(silent.readAll(), "");
    HttpClient once(rig.server.port());
    once.send("GET /a HTTP/1.1\r\n\r\n");
    once.endSending();
    std::string const all = once.readAll();
    EXPECT_THAT(all, StartsWith("HTTP/1.1 200"));
    EXPECT_EQ(all.find("HTTP/1.1", 1), std::string::npos) << all;
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 5s) << "and keeps nothing open";
}

TEST(HttpLimits, OfTimeDoNotHoldForAReplyThatIsToBeLate)
{
    HttpLimits limits;
    limits.time = 250ms;
    limits.connections = 1;
    LimitRig const rig(limits);
    EXPECT_EQ(httpBody(httpGet(rig.server.port(), "/late")), "late");
    HttpClient idle(rig.server.port());
    idle.send("GET /big HTTP/1.1\r\n\r\n");
    std::string reply;
    for (int i = 0; i < 500 && reply.empty(); ++i) {
        ::usleep(10000);
        reply = httpGet(rig.server.port(), "/a");
    }
    EXPECT_THAT(reply, StartsWith("HTTP/1.1 200")) << "who takes nothing is cut off, which leaves room for others";
}

TEST(HttpServer, EndsAtOnceThoughAReplyIsToComeLate)
{
    HttpClient* client = nullptr;
    auto const begin = std::chrono::steady_clock::now();
    std::unique_ptr<HttpClient> late;
    {
        LimitRig const rig;
        late = std::make_unique<HttpClient>(rig.server.port());
        client = late.get();
        client->send("GET /never HTTP/1.1\r\n\r\n");
        EXPECT_THAT(httpGet(rig.server.port(), "/a"), StartsWith("HTTP/1.1 200"));
    }
    EXPECT_EQ(client->readAll(), "");
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 2s);
}

TEST(HttpServer, TakesAPlaceAgainAtOnce)
{
    HttpServer second;
    unsigned short port = 0;
    {
        LimitRig const first;
        port = first.server.port();
        EXPECT_THAT(httpGet(port, "/a"), StartsWith("HTTP/1.1 200"));
        EXPECT_THROW(second.start({"127.0.0.1", port}), velmora::Error);
    }
    second.start({"127.0.0.1", port});
    EXPECT_THAT(httpGet(port, "/a"), StartsWith("HTTP/1.1 404")) << "the one that failed before";
}

TEST(HttpRoutes, GoByTheWholePathThenByTheLongestThatFits)
{
    velmora::HttpRoutes routes;
    for (char const* const path : {"/*", "/files/*", "/files/x", "/files/x/*", "/files*"}) {
        routes.add("POST", path, [path](HttpRequest const&) { return answerOf(path); });
    }
    auto const answer = [&routes](char const* method, char const* path) {
        HttpRequest request;
        request.method = method;
        request.path = path;
        HttpResponse const response = routes.answer(request);
        return response.status == 200 ? response.body : std::to_string(response.status);
    };
    EXPECT_EQ(answer("POST", "/files/x"), "/files/x");
    EXPECT_EQ(answer("POST", "/files/y"), "/files/*");
    EXPECT_EQ(answer("POST", "/files/x/y"), "/files/x/*");
    EXPECT_EQ(answer("POST", "/files"), "/files*");
    EXPECT_EQ(answer("POST", "/"), "/*");
    EXPECT_EQ(answer("POST", ""), "404");
    EXPECT_EQ(answer("HEAD", "/"), "405") << "there is no GET whose head could be told";
}

TEST(HttpStreams, HoldForASlowReaderUpToTheirLimit)
{
    HttpLimits limits;
    limits.streamBacklog = 1000;
    LimitRig rig(limits);
    auto const exact = readerOf(rig.server);
    exact->readUntil("first\n\n");
    std::string const event = HttpServer::event("", std::string(1000 - 8, 'x'));
    ASSERT_EQ(event.size(), 1000U);
    rig.server.publish("/events", event);
    EXPECT_EQ(exact->readUntil("x\n\n"), event);
    rig.server.publish("/events", HttpServer::event("", std::string(1000 - 7, 'x')));
    EXPECT_EQ(exact->readAll(), "") << "one byte more";
    EXPECT_TRUE(rig.waitForReaders(0));

    LimitRig usual;
    auto const reader = readerOf(usual.server);
    reader->readUntil("first\n\n");
    std::string const most = HttpServer::event("", std::string(256 * 1024 - 8, 'x'));
    usual.server.publish("/events", most);
    EXPECT_EQ(reader->readUntil("x\n\n").size(), 256U * 1024U);
    usual.server.publish("/events", HttpServer::event("", std::string(256 * 1024 - 7, 'x')));
    EXPECT_EQ(reader->readAll(), "");
}

TEST(HttpStreams, KeepLittleThatIsOldForASlowReader)
{
    HttpLimits limits;
    limits.streamBacklog = 1000;
    LimitRig rig(limits);
    auto const reader = readerOf(rig.server);
    reader->readUntil("first\n\n");
    std::string const event = HttpServer::event("", std::string(900, 'x'));
    for (int i = 0; i < 8000 && rig.server.readers() > 0; ++i) {
        rig.server.publish("/events", event);
        ::usleep(i % 50 == 0 ? 100 : 0);
    }
    EXPECT_LT(reader->readAll().size(), std::size_t{1} << 20) << "in the buffers of both ends";
}

TEST(HttpStreams, EndForWhoTakesNothingForLongAlone)
{
    HttpLimits limits;
    limits.streamPing = 2ms;
    limits.streamBacklog = std::size_t{64} << 20;
    LimitRig rig(limits);
    auto const slow = readerOf(rig.server);
    slow->readUntil("first\n\n");
    rig.server.publish("/events", HttpServer::event("", std::string(std::size_t{16} << 20, 'x')));
    ::usleep(50000);
    EXPECT_EQ(rig.server.readers(), 1U) << "far from stuck, after twenty pings";
    EXPECT_THAT(slow->readUntil("x\n\n: \n\n"), testing::EndsWith("x\n\n: \n\n"));

    limits.streamStall = 5ms;
    LimitRig brisk(limits);
    auto const idle = readerOf(brisk.server);
    idle->readUntil("first\n\n");
    for (int i = 0; i < 10; ++i) {
        EXPECT_EQ(idle->readUntil(": \n\n"), ": \n\n") << "a stream that has nothing to say is not stuck";
    }
}

} // namespace
