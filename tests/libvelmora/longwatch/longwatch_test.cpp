#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/longwatch.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <condition_variable>
#include <cstdlib>
#include <mutex>
#include <thread>

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
        m_options.car.port = "sim:petrol-can11?instant";
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
    EXPECT_TRUE(m_told.hold("The settings stay as they were: "));
    EXPECT_TRUE(m_told.hold("running", 3));
    EXPECT_TRUE(watch.health().linkUp);
    watch.end();
    runner.join();
    velmora::Health const health = watch.health();
    ASSERT_EQ(health.outputs.size(), 1U);
    EXPECT_GT(health.outputs[0].second.accepted, 0U);
    EXPECT_NE(m_folder.read("watch.ndjson").find("\"vehicle\":\"van\""), std::string::npos);
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
