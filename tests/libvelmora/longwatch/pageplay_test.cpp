// A recording on the page: what its state says, and a place that somebody else has.
#include "tests/support/process/httpclient.h"
#include "tests/support/process/serverprocess.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/recording.h>

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <atomic>
#include <thread>

namespace {

using testsupport::HttpClient;
using velmora::PagePlay;
using velmora::Recording;

Recording shortDrive()
{
    velmora::RecordedSensor speed;
    speed.about = {0x7E8, "SPEED", "010D", "Speed", "km/h"};
    for (int i = 0; i < 10; ++i) {
        speed.values.push_back({1772352900000 + 1000 * i, 10.0 * i});
    }
    return {{speed}, 1772352900000, 1772352909000};
}

TEST(PagePlay, TellsThatARecordingIsPlayed)
{
    testsupport::TemporaryFolder const folder;
    unsigned short const port = testsupport::freePort();
    std::string const place = "127.0.0.1:" + std::to_string(port);
    std::string link;
    std::atomic<bool> served = false;
    PagePlay play(shortDrive(), "dash:" + place, 1.0, folder.file("settings.toml"),
                  [&](std::string const& where, std::string const&) {
                      link = where;
                      served = true;
                  });
    std::thread runner([&play] { play.run(); });
    while (!served) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    {
        HttpClient stream(port);
        stream.send("GET /events HTTP/1.1\r\nHost: " + place + "\r\n\r\n");
        stream.readUntil("event: beat\ndata: ");
        auto const beat = nlohmann::json::parse(stream.readUntil("\n"), nullptr, false);
        EXPECT_EQ(beat["state"], "playing") << beat;
        EXPECT_EQ(beat["link"], true);
        EXPECT_TRUE(beat["play"].is_object()) << beat;
        EXPECT_EQ(link, "http://" + place + "/");
    }
    testsupport::TemporaryFolder const other;
    PagePlay late(shortDrive(), "dash:" + place, 1.0, other.file("settings.toml"), {});
    try {
        late.run();
        ADD_FAILURE() << "the place is taken";
    } catch (velmora::Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::WrongUse) << "which does not change by itself";
    }
    play.end();
    runner.join();
    EXPECT_FALSE(HttpClient(port).connected());
}

} // namespace
