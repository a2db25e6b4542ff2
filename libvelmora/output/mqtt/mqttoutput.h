#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/mqtt/brokerlink.h"
#include "libvelmora/output/mqtt/spoolsender.h"

#include <nlohmann/json.hpp>

#include <chrono>
#include <memory>
#include <mutex>

namespace velmora {

// Sends readings in batches to a broker, by way of a spool on the disk that forgets them when the broker, or the
// consumer behind it, has said that they are kept. The latest values go to a topic of their own, without the spool.
class MqttOutput : public IOutput, private BrokerLink::Listener
{
public:
    MqttOutput(OutputAddress const& address, OutputContext const& context);
    ~MqttOutput() override;

    // Doesn't wait for the broker.
    void open() override;
    void write(Records records) override;
    void close() override;
    OutputState state() override;

private:
    using Time = std::chrono::steady_clock::time_point;

    void onUp() override;
    void onDown(std::string const& why) override;
    void onDelivered(int message) override;
    void onRefused(int message, std::string const& why) override;
    void onMessage(std::string const& topic, std::string const& payload) override;

    void watchClock(Records records);
    void resumeHeld(ClockLook const& look);
    void spoolRecords(Records records, std::int64_t step, ClockLook const& look);
    void makeRoom(ClockLook const& look);
    void takeForHome(Record const& record);
    void publishState();
    void publishDiscovery();
    void publishRetained(std::string const& topic, std::string const& payload);
    void tellOnce(std::string const& text);
    bool underway();

    MqttSettings const m_settings;
    OutputRunner::Tell const m_tell;
    ClockSource const m_clocks;
    std::mutex m_mutex; // all below
    std::unique_ptr<Spool> m_spool;
    std::unique_ptr<SpoolSender> m_sender;
    ClockJudge m_judge;
    std::vector<SensorEntry> m_sensors;
    nlohmann::ordered_json m_state;
    bool m_stateChanged = false;
    Time m_stateTime;
    std::string m_lastTold;
    std::unique_ptr<BrokerLink> m_link; // ends before all above; set by open and close
};

} // namespace velmora
