#include "tests/libvelmora/dash/servedpage.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::HasSubstr;
using testsupport::httpBody;
using testsupport::HttpClient;
using velmora::Json;
using velmora::test::dashReading;
using velmora::test::nextEvent;
using velmora::test::Page;

TEST(DashOutput, RefusesWhatCantBeAskedInWords)
{
    Page const page("?allow_clear=yes&allow_console=yes");
    auto const said = [&page](std::string const& body) {
        std::string const reply = page.post("/ask", body, page.cookie());
        return reply.substr(9, 3) + " " + httpBody(reply);
    };
    EXPECT_EQ(said(R"({"topic":"sensors"})"), "400 This can't be asked\n");
    EXPECT_EQ(said(R"({"topic":5})"), "400 This can't be asked\n");
    EXPECT_EQ(said("[]"), "400 This can't be asked\n");
    EXPECT_EQ(said(R"({"topic":"clear","sure":"yes"})"), "400 Clearing needs a yes\n");
    EXPECT_EQ(said(R"({"topic":"console"})"), "400 This is no command\n");
    EXPECT_EQ(said(R"({"topic":"console","text":5})"), "400 This is no command\n");
    EXPECT_EQ(said(R"({"topic":"console","text":")" + std::string(201, 'x') + "\"}"), "400 This is no command\n");
    EXPECT_EQ(said(R"({"topic":"console","text":"\u007F"})"), "400 This is no command\n");
    EXPECT_EQ(said(R"({"topic":"performance","text":"x"})"), "400 Runs begin or end\n");
    EXPECT_EQ(said(R"({"topic":"play","paused":true})"), "400 This can't be asked of what is shown\n");
    EXPECT_EQ(said(R"({"topic":"console","text":")" + std::string(200, 'x') + "\"}"), "202 Asked\n");
    EXPECT_EQ(page.desk->next()->text.size(), 200U);
    EXPECT_EQ(said(R"({"topic":"console","text":"AT SP ~"})"), "202 Asked\n");
    EXPECT_EQ(page.desk->next()->text, "AT SP ~") << "all that can be printed";
    EXPECT_EQ(said(R"({"topic":"console","text":""})"), "400 This is no command\n");
    for (int i = 0; i < 16; ++i) {
        EXPECT_EQ(said(R"({"topic":"console","text":"AT)" + std::to_string(i) + "\"}"), "202 Asked\n");
    }
    for (char const* const more : {R"({"topic":"codes"})", R"({"topic":"performance","text":"end"})"}) {
        EXPECT_EQ(said(more), "503 Too much is being asked; try again\n") << more;
    }
    page.desk->drop();
    for (char const* const topic : {"readiness", "monitors", "info", "codes"}) {
        EXPECT_EQ(said(std::string("{\"topic\":\"") + topic + "\",\"text\":\"x\"}"), "202 Asked\n");
        auto const asked = page.desk->next();
        ASSERT_TRUE(asked);
        EXPECT_EQ(asked->topic, topic);
        EXPECT_EQ(asked->text, "") << "only a console takes one";
    }
    Page const unknown;
    unknown.desk->tell(velmora::DashVehicle{"", {}});
    EXPECT_THAT(unknown.post("/layout", "{}"), HasSubstr("409"));
    EXPECT_THAT(unknown.post("/ask", R"({"topic":"clear","sure":true})"),
                HasSubstr("The program was started without leave for this"));
}

TEST(DashOutput, StreamsTheTrafficAndHistoriesOfTheChart)
{
    Page page;
    page.desk->tell(velmora::DashLine{{}, true, "ATI"});
    page.output->write({});
    page.desk->tell(velmora::DashLine{{}, false, "ELM327"});
    HttpClient traffic(page.output->port());
    traffic.send("GET /traffic HTTP/1.1\r\nHost: localhost\r\n\r\n");
    Json const lines = nextEvent(traffic, "lines");
    EXPECT_EQ(lines.at(0).at(2), "ATI") << "what was before";
    EXPECT_EQ(lines.back().at(2), "ELM327");
    for (int i = 0; i < 8; ++i) {
        page.desk->tell(dashReading("S" + std::to_string(i), i));
    }
    auto const histories = [&page](std::string const& layout) {
        page.post("/layout", layout);
        HttpClient stream(page.output->port());
        stream.send("GET /events HTTP/1.1\r\nHost: localhost\r\n\r\n");
        std::string ids;
        Json const hello = nextEvent(stream, "hello");
        for (Json const& each : hello["history"]) {
            ids += each["id"].get<std::string>().substr(4) + std::to_string(each["v"].size()) + " ";
        }
        return ids;
    };
    EXPECT_EQ(histories(R"({"numbers":["7E8/S0","7E8/S1","7E8/S2","7E8/S3","7E8/S4","7E8/S5","7E8/S6"]})"),
              "S01 S11 S21 S31 S41 S51 ")
        << "the first six, without being asked";
    EXPECT_EQ(histories(R"({"chart":["7E8/S7"],"numbers":["7E8/S0"]})"), "S71 ") << "else those of the chart";
}

} // namespace
