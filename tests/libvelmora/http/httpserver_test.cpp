#include "libvelmora/http/httpserver.h"
#include "tests/support/process/httpclient.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <tuple>
#include <unistd.h>

namespace {

using testing::HasSubstr;
using testing::StartsWith;
using testsupport::httpBody;
using testsupport::HttpClient;
using testsupport::httpGet;
using velmora::HttpLimits;
using velmora::HttpRequest;
using velmora::HttpResponse;
using velmora::HttpServer;

HttpResponse echo(HttpRequest const& request)
{
    HttpResponse response;
    response.body =
        request.method + " " + request.path + " " + request.query + " " + request.body + " " + request.header("x-who");
    return response;
}

std::string get(std::string const& path)
{
    return "GET " + path + " HTTP/1.1\r\nHost: x\r\nConnection: close\r\n\r\n";
}

struct Rig
{
    HttpServer server;

    explicit Rig(HttpLimits const& limits = {}) : server(limits)
    {
        server.addRoute("GET", "/a", echo);
        server.addRoute("POST", "/a", echo);
        server.addRoute("GET", "/files/*", echo);
        server.addRoute("GET", "/files/bad",
                        [](HttpRequest const&) -> HttpResponse { throw std::runtime_error("oh"); });
        server.addStream("/events", [](HttpRequest const&) { return HttpServer::event("hello", "first"); });
        server.start({"127.0.0.1", 0});
    }
    std::string ask(std::string const& request) const { return HttpClient(server.port()).ask(request); }
};

TEST(HttpServer, ServesRoutes)
{
    Rig const rig;
    EXPECT_THAT(rig.ask(get("/a?x=1")), HasSubstr("\r\n\r\nGET /a x=1"));
    EXPECT_THAT(rig.ask("POST /a HTTP/1.1\r\nX-Who: me\r\nContent-Length: 2\r\nConnection: close\r\n\r\nhi"),
                HasSubstr("\r\n\r\nPOST /a  hi me"));
    EXPECT_THAT(rig.ask(get("/files/x/y")), HasSubstr("GET /files/x/y"));
    EXPECT_THAT(rig.ask(get("/files/bad")), StartsWith("HTTP/1.1 500"));
    for (char const* const elsewhere : {"/b", "/files", "/filesX", "/ab", "/"}) {
        EXPECT_THAT(rig.ask(get(elsewhere)), StartsWith("HTTP/1.1 404")) << elsewhere;
    }
    std::string const refused = rig.ask("PUT /a HTTP/1.1\r\nConnection: close\r\n\r\n");
    EXPECT_THAT(refused, StartsWith("HTTP/1.1 405"));
    EXPECT_THAT(refused, HasSubstr("Allow: GET, POST"));
    std::string const head = rig.ask("HEAD /a HTTP/1.1\r\nConnection: close\r\n\r\n");
    EXPECT_THAT(head, StartsWith("HTTP/1.1 200"));
    EXPECT_EQ(httpBody(head), "");
}

TEST(HttpServer, AConnectionTakesSeveralRequests)
{
    Rig const rig;
    HttpClient client(rig.server.port());
    ASSERT_TRUE(client.send("GET /a?1 HTTP/1.1\r\n\r\nGET /a?2 HTTP/1.1\r\n\r\n" + get("/a?3")));
    std::string const all = client.readAll();
    EXPECT_THAT(all, HasSubstr("GET /a 1"));
    EXPECT_THAT(all, HasSubstr("GET /a 2"));
    EXPECT_THAT(all, HasSubstr("GET /a 3"));
}

TEST(HttpServer, RefusesWhatIsTooLongOrNoHttp)
{
    HttpLimits limits;
    limits.header = 500;
    limits.body = 100;
    Rig const rig(limits);
    EXPECT_THAT(rig.ask("GET /a HTTP/1.1\r\nX: " + std::string(600, 'x') + "\r\n\r\n"), StartsWith("HTTP/1.1 431"));
    EXPECT_THAT(rig.ask("POST /a HTTP/1.1\r\nContent-Length: 101\r\n\r\n"), StartsWith("HTTP/1.1 413"));
    EXPECT_THAT(rig.ask("nonsense\r\n\r\n"), StartsWith("HTTP/1.1 400"));
    EXPECT_THAT(rig.ask(get("/a")), StartsWith("HTTP/1.1 200")); // and goes on

    Rig const usual;
    auto const posted = [&usual](std::size_t size) {
        return usual.ask("POST /a HTTP/1.1\r\nContent-Length: " + std::to_string(size) +
                         "\r\nConnection: close\r\n\r\n" + std::string(size, 'x'));
    };
    EXPECT_THAT(posted(65536), StartsWith("HTTP/1.1 200"));
    EXPECT_THAT(posted(65537), StartsWith("HTTP/1.1 413"));
    EXPECT_THAT(usual.ask("GET /a HTTP/1.1\r\nX: " + std::string(8192, 'x') + "\r\n\r\n"), StartsWith("HTTP/1.1 431"));
}

TEST(HttpServer, ASlowClientIsCutOffAndTooManyAreNotServed)
{
    HttpLimits limits;
    limits.time = std::chrono::milliseconds(50);
    limits.connections = 2;
    Rig const rig(limits);
    HttpClient slow(rig.server.port());
    slow.send("GET /a HTT");
    EXPECT_EQ(slow.readAll(), "");

    limits.time = std::chrono::seconds(60);
    Rig const crowded(limits);
    HttpClient first(crowded.server.port());
    HttpClient second(crowded.server.port());
    first.send("GET /a HTTP/1.1\r\n\r\n");
    second.send("GET /a HTTP/1.1\r\n\r\n");
    EXPECT_THAT(first.readUntil("GET /a"), HasSubstr("200"));
    EXPECT_THAT(second.readUntil("GET /a"), HasSubstr("200"));
    EXPECT_EQ(HttpClient(crowded.server.port()).ask(get("/a")), "");
}

TEST(HttpServer, StreamsEventsToAllReadersUntilTheyGo)
{
    Rig rig;
    HttpClient first(rig.server.port());
    first.send("GET /events HTTP/1.1\r\n\r\n");
    EXPECT_THAT(first.readUntil("data: first\n\n"), HasSubstr("Content-Type: text/event-stream"));
    {
        HttpClient second(rig.server.port());
        second.send("GET /events HTTP/1.1\r\n\r\n");
        EXPECT_THAT(second.readUntil("data: first\n\n"), HasSubstr("event: hello"));
        rig.server.publish("/events", HttpServer::event("", "two\nlines"));
        rig.server.publish("/other", HttpServer::event("", "not here"));
        EXPECT_EQ(second.readUntil("\n\n"), "data: two\ndata: lines\n\n");
    }
    rig.server.publish("/events", HttpServer::event("", "last"));
    EXPECT_THAT(first.readUntil("last\n\n"), HasSubstr("data: lines"));
    rig.server.stop();
    EXPECT_EQ(first.readAll(), "");
}

TEST(HttpServer, AReaderThatStandsStillIsCutOff)
{
    HttpLimits limits;
    limits.streamBacklog = 1000;
    Rig rig(limits);
    HttpClient reader(rig.server.port());
    reader.send("GET /events HTTP/1.1\r\n\r\n");
    reader.readUntil("first\n\n");
    std::string const event = HttpServer::event("", std::string(900, 'x'));
    for (int i = 0; i < 16000; ++i) { // more than any socket buffer holds
        rig.server.publish("/events", event);
    }
    std::string const got = reader.readAll(); // ends, since the server has closed
    EXPECT_LT(got.size(), event.size() * 16000);
}

TEST(HttpServer, ASilentStreamIsKeptAliveAndAStuckReaderIsNot)
{
    HttpLimits limits;
    limits.streamPing = std::chrono::milliseconds(5);
    limits.streamStall = std::chrono::milliseconds(20);
    limits.streamBacklog = std::size_t{64} << 20;
    Rig rig(limits);
    HttpClient reader(rig.server.port());
    reader.send("GET /events HTTP/1.1\r\n\r\n");
    reader.readUntil("first\n\n");
    EXPECT_EQ(reader.readUntil(": \n\n"), ": \n\n");
    EXPECT_EQ(reader.readUntil(": \n\n"), ": \n\n") << "and again";
    EXPECT_EQ(rig.server.readers(), 1U);
    rig.server.publish("/events", HttpServer::event("", std::string(std::size_t{32} << 20, 'x')));
    for (int i = 0; i < 2000 && rig.server.readers() > 0; ++i) {
        ::usleep(1000);
    }
    EXPECT_EQ(rig.server.readers(), 0U) << "who takes nothing";
}

TEST(HttpServer, WritesEventsAsBrowsersReadThem)
{
    EXPECT_EQ(HttpServer::event("n", "a\n\nb", "7"), "event: n\ndata: a\ndata: \ndata: b\nid: 7\n\n");
    EXPECT_EQ(HttpServer::event("", ""), "data: \n\n");
    EXPECT_EQ(HttpServer::event("", "a\n"), "data: a\ndata: \n\n");
    for (auto const& [text, host, port] : std::vector<std::tuple<char const*, char const*, int>>{
             {"[::]:1", "::", 1}, {"a:65535", "a", 65535}, {"a:0", "a", 0}, {"[x]:5", "x", 5}}) {
        velmora::HttpPlace const place = velmora::parseHttpPlace(text);
        EXPECT_EQ(place.host, host);
        EXPECT_EQ(place.port, port);
    }
    for (char const* const wrong : {"[]:1", "a:65536", "[a:1", "a]:1", "a/b:1", "a:-1", "a:"}) {
        EXPECT_THROW(velmora::parseHttpPlace(wrong), velmora::Error) << wrong;
    }
}

TEST(HttpServer, APlaceThatCannotBeHadIsTold)
{
    Rig const rig;
    HttpServer other;
    EXPECT_THROW(other.start({"127.0.0.1", rig.server.port()}), velmora::Error);
    EXPECT_THROW(other.start({"203.0.113.1", 0}), velmora::Error);
    EXPECT_EQ(velmora::parseHttpPlace("[::1]:80").host, "::1");
    EXPECT_EQ(velmora::parseHttpPlace("localhost:9100").port, 9100);
    for (char const* const wrong : {"", "9100", ":9100", "a:", "a:b", "a:70000", "::1:80", "a b:80", "a:80x"}) {
        EXPECT_THROW(velmora::parseHttpPlace(wrong), velmora::Error) << wrong;
    }
}

} // namespace
