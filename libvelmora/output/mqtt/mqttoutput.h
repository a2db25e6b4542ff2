#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/mqtt/brokerlink.h"
#include "libvelmora/output/mqtt/homestate.h"
#include "libvelmora/output/mqtt/spoolsender.h"
#include "libvelmora/output/outputcontext.h"
#include "libvelmora/output/outputrunner.h"

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
    void onUp() override;
    void onDown(std::string const& why) override;
    void onDelivered(int message) override;
    void onRefused(int message, std::string const& why) override;
    void onMessage(std::string const& topic, std::string const& payload) override;

    void spoolRecords(Records records);
    void makeRoom(std::vector<std::string>& texts);
    void tellOnce(std::string const& text);
    bool underway();

    MqttSettings const m_settings;
    OutputRunner::Tell const m_tell;
    std::mutex m_mutex; // all below
    std::unique_ptr<Spool> m_spool;
    std::unique_ptr<SpoolSender> m_sender;
    ClockKeeper m_keeper;
    HomeState m_home;
    Spool::Gap m_gap; // dropped, and not told yet
    std::string m_lastTold;
    std::unique_ptr<BrokerLink> m_link; // ends before all above; set by open and close
};

} // namespace velmora
