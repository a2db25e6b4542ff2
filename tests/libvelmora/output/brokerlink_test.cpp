// The connection to a real broker: what it delivers, refuses and passes on, and how it ends.
#include "libvelmora/output/mqtt/brokerlink.h"
#include "tests/support/openfiles.h"
#include "tests/support/process/broker.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <condition_variable>
#include <mutex>

namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testsupport::brokerContext;
using testsupport::freePort;
using testsupport::mosquittoCommand;
using testsupport::ServerProcess;
using testsupport::Subscriber;
using testsupport::TemporaryFolder;
using velmora::BrokerLink;

// Notes what a link tells.
class Noted final : public BrokerLink::Listener
{
public:
    void onUp() override { note("up"); }
    void onDown(std::string const& why) override { note("down " + why); }
    void onDelivered(int message) override { note("delivered " + std::to_string(message)); }
    void onRefused(int message, std::string const& why) override
    {
        note("refused " + std::to_string(message) + " " + why);
    }
    void onMessage(std::string const& topic, std::string const& payload) override
    {
        note("message " + topic + " " + payload);
    }
    // All until one begins with that.
    std::vector<std::string> until(std::string const& end)
    {
        std::unique_lock lock(m_mutex);
        std::vector<std::string> all;
        m_come.wait_for(lock, std::chrono::seconds(30), [&] {
            while (!m_notes.empty() && (all.empty() || !all.back().starts_with(end))) {
                all.push_back(m_notes.front());
                m_notes.erase(m_notes.begin());
            }
            return !all.empty() && all.back().starts_with(end);
        });
        return all;
    }
    std::vector<std::string> rest()
    {
        std::lock_guard const lock(m_mutex);
        return m_notes;
    }

private:
    void note(std::string const& text)
    {
        std::lock_guard const lock(m_mutex);
        m_notes.push_back(text);
        m_come.notify_all();
    }

    std::mutex m_mutex;
    std::condition_variable m_come;
    std::vector<std::string> m_notes; // protected by m_mutex
};

velmora::MqttSettings settingsOf(TemporaryFolder const& folder, std::string const& address)
{
    return velmora::mqttSettings(velmora::parseOutputAddress(address), brokerContext(folder));
}

void publishFrom(unsigned short port, std::string const& rest)
{
    std::string const command = "mosquitto_pub -h 127.0.0.1 -p " + std::to_string(port) + " " + rest;
    EXPECT_EQ(std::system(command.c_str()), 0);
}

TEST(BrokerLink, DeliversPassesOnAndComesBack)
{
    TemporaryFolder const folder;
    unsigned short const port = freePort();
    ServerProcess const broker(mosquittoCommand(folder, port), port);
    Noted noted;
    BrokerLink link(settingsOf(folder, testsupport::brokerText(port)), "velmora-test", {"t/status", "offline"}, noted);
    EXPECT_FALSE(link.publish("t/early", "x", 1, false)) << "there is no connection yet";
    EXPECT_FALSE(link.isBusy());
    link.start();
    EXPECT_THAT(noted.until("up"), ElementsAre("up"));
    link.subscribe("t/back", 0);
    link.publish("t/plain", "not kept", 0, false);
    std::optional<int> const kept = link.publish("t/kept", "stays", 1, true);
    ASSERT_TRUE(kept);
    EXPECT_THAT(noted.until("delivered " + std::to_string(*kept)),
                testing::Contains("delivered " + std::to_string(*kept)));
    EXPECT_TRUE(testsupport::comesTrue([&link] { return !link.isBusy(); })) << "all is written";
    publishFrom(port, "-t t/back -m 'hello you'");
    EXPECT_THAT(noted.until("message"), testing::Contains("message t/back hello you"));

    link.publish("t/status", "online", 1, true);
    noted.until("delivered");
    link.reconnect();
    EXPECT_THAT(noted.until("up"), ElementsAre("down nothing that was sent is confirmed", "up"));
    EXPECT_THAT(Subscriber(port, "-t t/kept -t t/plain -t t/status", 2).lines(),
                testing::UnorderedElementsAre("t/kept stays", "t/status offline"))
        << "the will, for the broker heard no farewell";
    link.publish("t/status", "gone by itself", 1, true);
    noted.until("delivered");
    link.stop();
    EXPECT_FALSE(link.publish("t/late", "x", 1, false));
    EXPECT_FALSE(link.isBusy());
    link.subscribe("t/late", 0);
    link.stop();
    EXPECT_THAT(noted.rest(), testing::IsEmpty()) << "who stops it knows that";
    EXPECT_THAT(Subscriber(port, "-t t/status", 1).lines(), ElementsAre("t/status gone by itself"))
        << "a farewell, and no will";
}

TEST(BrokerLink, TellsWhatTheBrokersRightsForbid)
{
    TemporaryFolder const folder;
    unsigned short const port = freePort();
    std::ofstream(folder.file("rights")) << "topic read #\ntopic write t/open\n";
    ServerProcess const broker(
        mosquittoCommand(folder, port, "allow_anonymous true\nacl_file " + folder.file("rights") + "\n"), port);
    Noted noted;
    BrokerLink link(settingsOf(folder, testsupport::brokerText(port)), "velmora-test", {"t/status", "offline"}, noted);
    link.start();
    noted.until("up");
    std::optional<int> const closed = link.publish("t/closed", "x", 1, false);
    ASSERT_TRUE(closed);
    EXPECT_THAT(noted.until("refused"), ElementsAre("refused " + std::to_string(*closed) + " Not authorized"));
    link.publish("t/open", "x", 1, false);
    EXPECT_THAT(noted.until("delivered"), testing::SizeIs(1));
    EXPECT_FALSE(velmora::isRefusal(0x7F));
    EXPECT_TRUE(velmora::isRefusal(0x80));
}

TEST(BrokerLink, TellsThatNobodyIsThere)
{
    TemporaryFolder const folder;
    Noted noted;
    std::string const gone = "127.0.0.1:" + std::to_string(freePort());
    BrokerLink link(settingsOf(folder, "mqtt://" + gone + "," + gone + "/cars"), "velmora-test", {"s", "offline"},
                    noted);
    auto const begin = std::chrono::steady_clock::now();
    link.start();
    std::vector<std::string> const first = noted.until("down");
    ASSERT_EQ(first.size(), 1U);
    EXPECT_THAT(first[0], HasSubstr("refused"));
    link.stop();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(900)) << "no pause is waited for";
}

} // namespace
