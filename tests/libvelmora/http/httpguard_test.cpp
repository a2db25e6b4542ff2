#include "libvelmora/http/httpguard.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using velmora::cookieIn;
using velmora::hostNameIn;
using velmora::HttpRequest;

HttpRequest requestWith(std::string const& method, std::vector<std::pair<std::string, std::string>> headers)
{
    HttpRequest request;
    request.method = method;
    request.headers = std::move(headers);
    return request;
}

unsigned int statusOf(HttpRequest const& request)
{
    auto const refused = velmora::refuseForeign(request, {"car.local"});
    return refused ? refused->status : 200;
}

TEST(HttpGuard, ReadsTheHostsName)
{
    EXPECT_EQ(hostNameIn("localhost:8722"), "localhost");
    EXPECT_EQ(hostNameIn("LocalHost"), "localhost");
    EXPECT_EQ(hostNameIn("[::1]:80"), "::1");
    EXPECT_EQ(hostNameIn("192.168.0.5"), "192.168.0.5");
    for (char const* const wrong :
         {"", ":80", "a b", "[::1", "[::1]x", "a:", "a:8x", "a:123456", "a/b", "a@b", "[]", "a:80:90"}) {
        EXPECT_EQ(hostNameIn(wrong), std::nullopt) << wrong;
    }
}

TEST(HttpGuard, LetsInAddressesLocalhostAndGivenNamesOnly)
{
    for (char const* const good : {"127.0.0.1:1", "[::1]:1", "[fe80::1]:1", "localhost", "car.local:1", "10.0.0.1"}) {
        EXPECT_EQ(statusOf(requestWith("GET", {{"host", good}})), 200U) << good;
    }
    for (char const* const bad : {"evil.test", "127.0.0.1.evil.test", "localhost.evil.test", "2130706433", "::1"}) {
        EXPECT_NE(statusOf(requestWith("GET", {{"host", bad}})), 200U) << bad;
    }
    EXPECT_EQ(statusOf(requestWith("GET", {{"host", "evil.test"}})), 421U);
    EXPECT_EQ(statusOf(requestWith("GET", {})), 400U);
    EXPECT_EQ(statusOf(requestWith("GET", {{"host", "localhost"}, {"host", "localhost"}})), 400U);
}

TEST(HttpGuard, APostNamesItsOwnOrigin)
{
    EXPECT_EQ(statusOf(requestWith("POST", {{"host", "localhost:1"}, {"origin", "http://localhost:1"}})), 200U);
    EXPECT_EQ(statusOf(requestWith("POST", {{"host", "localhost:1"}})), 403U);
    for (char const* const foreign : {"http://localhost:2", "https://localhost:1", "null", "http://evil.test", ""}) {
        EXPECT_EQ(statusOf(requestWith("POST", {{"host", "localhost:1"}, {"origin", foreign}})), 403U) << foreign;
        EXPECT_EQ(statusOf(requestWith("GET", {{"host", "localhost:1"}, {"origin", foreign}})), 403U) << foreign;
    }
    EXPECT_EQ(statusOf(requestWith("GET", {{"host", "localhost:1"}})), 200U);
    EXPECT_EQ(statusOf(requestWith("HEAD", {{"host", "localhost:1"}})), 200U);
    EXPECT_EQ(statusOf(requestWith("PUT", {{"host", "localhost:1"}})), 403U);
    EXPECT_EQ(statusOf(requestWith(
                  "POST", {{"host", "localhost:1"}, {"origin", "http://localhost:1"}, {"origin", "http://evil.test"}})),
              403U);
}

TEST(HttpGuard, FindsACookieAmongOthers)
{
    HttpRequest const request = requestWith("GET", {{"cookie", "a=1; velmora_80=xyz;b=2"}, {"cookie", "c=3"}});
    EXPECT_EQ(cookieIn(request, "velmora_80"), "xyz");
    EXPECT_EQ(cookieIn(request, "b"), "2");
    EXPECT_EQ(cookieIn(request, "c"), "3");
    EXPECT_EQ(cookieIn(request, "velmora_8"), std::nullopt);
    EXPECT_EQ(cookieIn(request, "elmora_80"), std::nullopt);
}

TEST(HttpGuard, KnowsItsOwnMachineAndTheBoundsOfNames)
{
    for (char const* const own : {"localhost", "::1", "127.0.0.1", "127.9.9.9"}) {
        EXPECT_TRUE(velmora::isLoopback(own)) << own;
    }
    for (char const* const other : {"127.evil.test", "10.0.0.1", "::2", "", "Localhost"}) {
        EXPECT_FALSE(velmora::isLoopback(other)) << other;
    }
    EXPECT_EQ(hostNameIn(std::string(253, 'a')), std::string(253, 'a'));
    EXPECT_EQ(hostNameIn(std::string(254, 'a')), std::nullopt);
    EXPECT_EQ(hostNameIn("a:12345"), "a");
    EXPECT_EQ(hostNameIn("[::1]x80"), std::nullopt);
    EXPECT_EQ(hostNameIn("[::1]"), "::1");
    EXPECT_EQ(hostNameIn("a_b-c.d:1"), "a_b-c.d");
    HttpRequest const request = requestWith("GET", {{"cookie", "ab;a=;  b=x=y ;"}, {"other", "c=1"}});
    EXPECT_EQ(cookieIn(request, "a"), "");
    EXPECT_EQ(cookieIn(request, "b"), "x=y ");
    EXPECT_EQ(cookieIn(request, "ab"), std::nullopt);
    EXPECT_EQ(cookieIn(request, "c"), std::nullopt) << "in another header";
    for (char const* const given : {"secreT", "Secret", "secre", "secrets", ""}) {
        EXPECT_FALSE(velmora::sameSecret(given, "secret")) << given;
    }
    EXPECT_TRUE(velmora::sameSecret("secret", std::string_view("secrets", 6))) << "what stands behind is no part of it";
}

// Each of the 22 digits takes every one of its 64 forms now and then.
TEST(HttpGuard, TokensUseAllTheirDigits)
{
    std::vector<std::set<char>> seen(22);
    for (int i = 0; i < 1500; ++i) {
        std::string const token = velmora::makeToken();
        for (std::size_t place = 0; place < seen.size(); ++place) {
            seen[place].insert(token.at(place));
        }
    }
    for (std::size_t place = 0; place < seen.size(); ++place) {
        EXPECT_EQ(seen[place].size(), 64U) << place;
    }
}

TEST(HttpGuard, TokensAreLongAndNeverTheSame)
{
    std::string const token = velmora::makeToken();
    EXPECT_EQ(token.size(), 22U);
    EXPECT_EQ(token.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_"),
              std::string::npos);
    EXPECT_NE(token, velmora::makeToken());
    EXPECT_TRUE(velmora::sameSecret(token, token));
    EXPECT_FALSE(velmora::sameSecret(token + "a", token));
    EXPECT_FALSE(velmora::sameSecret(token.substr(1), token));
    EXPECT_FALSE(velmora::sameSecret("", ""));
}

} // namespace
