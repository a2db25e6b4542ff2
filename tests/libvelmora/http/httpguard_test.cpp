#include "libvelmora/http/httpguard.h"

#include <gtest/gtest.h>

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
