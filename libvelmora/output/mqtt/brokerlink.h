#pragma once

#include "libvelmora/output/mqtt/mqttsettings.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

struct mosquitto;

namespace velmora {

// Whether a reason of MQTT 5 says that something was not taken.
constexpr bool isRefusal(int reason)
{
    return reason >= 0x80;
}

// Keeps a connection to a broker, on a thread of its own: tries again at growing pauses, with the next node
// of a cluster, and with the older protocol where the broker has no MQTT 5. Each connection begins with nothing under
// way.
class BrokerLink
{
public:
    // Called on the link's thread; may publish.
    class Listener
    {
    public:
        virtual void onUp() = 0;
        // Once after each onUp, and for attempts that failed; why is for people.
        virtual void onDown(std::string const& why) = 0;
        virtual void onDelivered(int message) = 0;
        virtual void onRefused(int message, std::string const& why) = 0;
        virtual void onMessage(std::string const& topic, std::string const& payload) = 0;

    protected:
        ~Listener() = default;
    };

    // The will is published, retained, when the connection ends without stop.
    struct Will
    {
        std::string topic;
        std::string payload;
    };

    // The listener must outlive it. Throws Error if the certificates can't be used.
    BrokerLink(MqttSettings settings, std::string clientId, Will will, Listener& listener);
    ~BrokerLink() { stop(); }
    BrokerLink(BrokerLink const&) = delete;
    BrokerLink& operator=(BrokerLink const&) = delete;

    void start();
    // The number by which the delivery will be told; nothing without a connection. Any thread.
    std::optional<int> publish(std::string const& topic, std::string const& payload, int qos, bool retain);
    void subscribe(std::string const& topic, int qos);
    // Gives the connection up for a new one. Any thread.
    void reconnect() { m_again = true; }
    // Whether libmosquitto still has bytes to write.
    bool isBusy();
    // Ends the thread, which may be waiting for a name to be resolved.
    void stop();

private:
    struct Callbacks;
    using Client = std::unique_ptr<mosquitto, void (*)(mosquitto*)>;

    Client makeClient();
    void run();
    void attempt();
    void follow(mosquitto* client);
    void onConnect(int reason);
    void fail(std::string const& why);

    MqttSettings const m_settings;
    std::string const m_clientId;
    Will const m_will;
    Listener& m_listener;
    std::thread m_thread;
    std::atomic<bool> m_stop{false};
    std::atomic<bool> m_again{false};
    bool m_oldProtocol = false; // the link's thread alone, as are the next three
    bool m_atOnce = false;      // no pause before the next attempt
    std::size_t m_turn = 0;     // which of the brokers
    std::string m_why;
    std::mutex m_mutex;
    std::condition_variable m_wake;
    Client m_client; // protected by m_mutex, as is the next; replaced by the link's thread alone
    bool m_up = false;
};

} // namespace velmora
