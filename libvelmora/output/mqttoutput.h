#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/mqttsettings.h"
#include "libvelmora/output/spool.h"

#include <chrono>
#include <condition_variable>
#include <map>
#include <memory>
#include <mutex>
#include <thread>

struct mosquitto;

namespace velmora {

// Sends readings in batches to a broker, by way of a spool on the disk that forgets them when the broker, or the
// consumer behind it, has said that they are kept. A thread of its own keeps the connection.
class MqttOutput : public IOutput
{
public:
    MqttOutput(OutputAddress const& address, OutputContext const& context);
    ~MqttOutput() override;

    // Doesn't wait for the broker.
    void open() override;
    void write(Records records) override;
    void close() override;

private:
    struct Callbacks;
    using Time = std::chrono::steady_clock::time_point;

    void run();
    void connectTls();
    void onConnect(int reason);
    void onDisconnect(int reason);
    void onPublish(int message, int reason);
    void onMessage(std::string const& topic, std::string const& payload);

    void spoolRecords(Records records);
    void takeState(Reading const& reading);
    void publishState();
    void publishDiscovery();
    void publishRetained(std::string const& topic, std::string const& payload);
    void pump();
    bool sendBatch();
    void forgetUpTo(std::int64_t seq);
    void resendIfStuck();
    void sendAgain(std::int64_t after);
    void tellOnce(std::string const& text);

    MqttSettings const m_settings;
    OutputRunner::Tell const m_tell;
    mosquitto* m_client = nullptr;
    std::thread m_thread;
    std::mutex m_mutex; // all below
    std::condition_variable m_wake;
    bool m_stop = false;
    std::unique_ptr<Spool> m_spool;
    bool m_connected = false;
    std::int64_t m_sent = 0;               // the last number handed to libmosquitto
    std::int64_t m_stored = 0;             // up to here the consumer has it
    std::map<int, std::int64_t> m_flights; // message id, last number in it
    std::map<std::int64_t, bool> m_ended;  // last number of each batch under way, and whether it was acknowledged
    Time m_progress;
    std::vector<SensorEntry> m_sensors;
    nlohmann::ordered_json m_state;
    bool m_stateChanged = false;
    std::string m_lastTold;
};

} // namespace velmora
