#include "libvelmora/http/httpserver.h"
#include "libvelmora/output/database/database.h"
#include "tests/libvelmora/watch/servicemanager.h"
#include "tests/support/openfiles.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/longwatch.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstdlib>
#include <fstream>
#include <map>
#include <mutex>
#include <thread>
#include <unistd.h>

namespace {

using testsupport::TemporaryFolder;
using velmora::LongWatch;
using velmora::LongWatchOptions;

// What a watch tells, waited for; ten seconds are no measure but an end.
class ToldLines
{
public:
    void add(std::string const& line)
    {
        std::lock_guard const lock(m_mutex);
        m_lines.push_back(line);
        m_wake.notify_all();
    }
    bool hold(std::string const& text, int times = 1)
    {
        std::unique_lock lock(m_mutex);
        return m_wake.wait_for(lock, std::chrono::seconds(10), [&] {
            return std::ranges::count_if(m_lines, [&](auto const& each) { return each.starts_with(text); }) >= times;
        });
    }
    bool has(std::string const& text)
    {
        std::lock_guard const lock(m_mutex);
        return std::ranges::find(m_lines, text) != m_lines.end();
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::vector<std::string> m_lines;
};

class LongWatchTest : public testing::Test
{
protected:
    LongWatchTest()
    {
        ::setenv("STATE_DIRECTORY", m_folder.path().c_str(), 1);
        std::ofstream(m_folder.file("car.toml")) << R"(name = "a car that tells little, and at once"
protocol = 6
[[module]]
id = "7E8"
[module.raw]
"0100" = "41 00 80 10 00 00"
"0101" = "41 01 80 07 21 00"
"010C" = "41 0C 0F A0"
"03" = "43 00"
"07" = "47 00"
"0A" = "4A 00"
"0900" = "49 00 40 00 00 00"
"0902" = "49 02 01 56 45 4C 4D 52 41 53 31 4D 4D 30 30 30 30 30 30 31"
)";
        m_options.car.port = "sim:" + m_folder.file("car.toml") + "?instant";
        m_options.car.settingsFile = m_folder.file("settings.toml");
        m_options.outputs = {"ndjson:" + m_folder.file("watch.ndjson")};
        m_options.vehicle = "van";
        m_options.onEvent = [this](std::string const& line) { m_told.add(line); };
        m_options.onReload = m_options.onEvent;
    }
    ~LongWatchTest() override { ::unsetenv("STATE_DIRECTORY"); }

    TemporaryFolder const m_folder;
    ToldLines m_told;
    LongWatchOptions m_options;
};

TEST_F(LongWatchTest, WritesUntilItsEndAndGoesOnOverAReload)
{
    m_options.configFile = m_folder.file("watch.toml");
    std::ofstream(m_options.configFile) << "fast = true\n";
    LongWatch watch(m_options);
    EXPECT_FALSE(watch.health().linkUp);
    std::thread runner([&watch] { watch.run(); });
    EXPECT_TRUE(m_told.hold("running"));
    watch.reload();
    EXPECT_TRUE(m_told.hold("The settings were read again"));
    EXPECT_TRUE(m_told.hold("running", 2));
    std::ofstream(m_options.configFile) << "nonsense = 1\n";
    watch.reload();
    EXPECT_TRUE(m_told.hold("The settings stay as they were: " + m_options.configFile + ":1: nonsense: "));
    EXPECT_TRUE(m_told.hold("running", 3));
    EXPECT_TRUE(watch.health().linkUp);
    watch.end();
    runner.join();
    velmora::Health const health = watch.health();
    ASSERT_EQ(health.outputs.size(), 1U);
    EXPECT_GT(health.outputs[0].second.accepted, 0U);
    EXPECT_NE(m_folder.read("watch.ndjson").find("\"vehicle\":\"van\""), std::string::npos);
}

TEST_F(LongWatchTest, TellsItsServiceManagerAndEndsTheTripUnderWay)
{
    velmora::test::Manager const manager("@velmora-longwatch-" + std::to_string(::getpid()));
    ::setenv("WATCHDOG_USEC", "2000", 1);
    m_options.outputs.push_back("csv-long:" + m_folder.file("watch.csv"));
    m_options.outputs.push_back("dash:127.0.0.1:0?allow_clear=yes");
    std::vector<velmora::PageLink> links;
    m_options.onPage = [this, &links](velmora::PageLink const& link) {
        links.push_back(link); // read when all outputs have ended
        m_told.add("page");
    };
    LongWatch watch(m_options);
    std::atomic<bool> done = false;
    std::map<std::string, int> heard;
    std::thread listener([&] { // for what nobody takes is lost
        for (bool last = false; !last;) {
            last = done;
            for (std::string text = manager.heard(); text != "-"; text = manager.heard()) {
                ++heard[text];
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
    });
    std::thread runner([&watch] { watch.run(); });
    EXPECT_TRUE(m_told.hold("engine_start: The engine runs"));
    EXPECT_TRUE(m_told.hold("lamp_on (7E8): The malfunction lamp is on"));
    EXPECT_TRUE(m_told.hold("running"));
    EXPECT_TRUE(m_told.hold("page"));
    watch.reload();
    EXPECT_TRUE(m_told.hold("running", 2));
    EXPECT_TRUE(m_told.hold("page", 2));
    watch.end();
    runner.join();
    done = true;
    listener.join();
    ASSERT_EQ(links.size(), 2U);
    EXPECT_TRUE(links[0].outputIsFree);
    EXPECT_TRUE(links[0].link.starts_with("http://127.0.0.1:")) << links[0].link;
    auto const tokenOf = [](velmora::PageLink const& page) {
        std::size_t const at = page.link.find("#t=");
        return at == std::string::npos ? std::string() : page.link.substr(at);
    };
    EXPECT_NE(tokenOf(links[0]), "");
    EXPECT_EQ(tokenOf(links[0]), tokenOf(links[1])) << "a reload leaves links good";
    EXPECT_EQ(heard["READY=1"], 2);
    EXPECT_EQ(heard["RELOADING=1"], 1);
    EXPECT_EQ(heard["STOPPING=1"], 1);
    EXPECT_EQ(heard["STATUS=running"], 2);
    EXPECT_GE(heard["WATCHDOG=1"], 2);
    EXPECT_NE(m_folder.read("watch.ndjson").find("\"event\":\"engine_run\""), std::string::npos)
        << "too short for a trip";
    EXPECT_TRUE(m_told.hold("engine_run: ", 2));
    EXPECT_NE(m_folder.read("watch.csv").find(",RPM,"), std::string::npos);
    EXPECT_TRUE(watch.abandon()) << "there is no run any more";
    EXPECT_EQ(manager.heard(), "STOPPING=1");
}

TEST_F(LongWatchTest, GivesAnotherVehicleANameOfItsOwn)
{
    m_options.vehicle.clear();
    std::ofstream(m_folder.file("vehicle-name")) << "bus\n";
    std::ofstream(m_folder.file("vehicles")) << "ANOTHERVIN bus\n";
    LongWatch watch(m_options);
    std::thread runner([&watch] { watch.run(); });
    EXPECT_TRUE(m_told.hold("another vehicle answers: its values get a name of their own"));
    EXPECT_TRUE(m_told.hold("running"));
    watch.end();
    runner.join();
    EXPECT_FALSE(m_told.has("The settings were read again")) << "nobody asked for that";
    std::string const name = m_folder.read("vehicle-name");
    EXPECT_TRUE(name.starts_with("car-")) << name;
    std::string const written = m_folder.read("watch.ndjson");
    EXPECT_NE(written.find("\"vehicle\":\"" + name.substr(0, name.size() - 1) + "\""), std::string::npos);
    EXPECT_EQ(written.find("\"vehicle\":\"bus\""), std::string::npos) << "none of it is the bus's";
}

// Another program holds the database: its output waits for that, and the end does not wait for the output.
TEST_F(LongWatchTest, LeavesAnOutputThatHangsBehind)
{
    std::string const file = m_folder.file("watch.db");
    m_options.outputs = {"sqlite:" + file};
    LongWatch watch(m_options);
    watch.reload(); // a wish that comes before the beginning counts, too
    std::thread runner([&watch] { watch.run(); });
    EXPECT_TRUE(m_told.hold("The settings were read again"));
    EXPECT_TRUE(m_told.hold("running"));
    {
        velmora::Database other(file);
        velmora::Transaction const hold(other);
        watch.end();
        runner.join();
        EXPECT_TRUE(m_told.hold("sqlite:" + file + ": hangs, and is not waited for"));
    }
    for (int i = 0; i < 10000 && testsupport::isHeldOpen(file); ++i) { // its thread tells this test of its end
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    EXPECT_FALSE(testsupport::isHeldOpen(file));
}

TEST_F(LongWatchTest, APageThatTheWatchIsForHasToBeServed)
{
    velmora::HttpServer taken;
    taken.start(velmora::parseHttpPlace("127.0.0.1:0"));
    m_options.outputs = {"dash:127.0.0.1:" + std::to_string(taken.port())};
    m_options.forPage = true;
    EXPECT_THROW(LongWatch(m_options).run(), velmora::Error);
    taken.stop();
}

TEST_F(LongWatchTest, RefusesWhatMakesNoSense)
{
    auto const refuses = [this](auto&& change) {
        LongWatchOptions options = m_options;
        change(options);
        try {
            LongWatch(options).run();
        } catch (velmora::Error const& error) {
            return error.kind() == velmora::ErrorKind::WrongUse;
        }
        return false;
    };
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.stopAfter = "soon"; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.wake = "never"; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.vehicle = "my van"; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.sensors = {"RPM@fast"}; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.outputs = {"pigeon:coop"}; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.car.signalFiles = {"/nowhere.toml"}; }));
    EXPECT_TRUE(refuses([](LongWatchOptions& each) { each.car.port.clear(); }));
    EXPECT_THROW(velmora::checkPagePlace("somewhere"), velmora::Error);
    velmora::checkPagePlace("127.0.0.1:8722");
}

} // namespace
