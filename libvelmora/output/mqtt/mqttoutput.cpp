#include "libvelmora/output/mqtt/mqttoutput.h"

#include "libvelmora/output/mqtt/spooltext.h"
#include "libvelmora/output/recordjson.h"

#include <velmora/error.h>

#include <thread>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds lastWords{500};
constexpr char const* homeAssistantStatus = "homeassistant/status";

SpoolSender::Time steadyNow()
{
    return std::chrono::steady_clock::now();
}

} // namespace

MqttOutput::MqttOutput(OutputAddress const& address, OutputContext const& context)
    : m_settings(mqttSettings(address, context)), m_tell(context.tell), m_keeper(context.clocks),
      m_home(m_settings.discovery, m_settings.place,
             [this](std::string const& topic, std::string const& payload, bool retain) {
                 if (m_link != nullptr) {
                     m_link->publish(topic, payload, 1, retain);
                 }
             })
{}

MqttOutput::~MqttOutput()
{
    close();
}

void MqttOutput::open()
{
    std::lock_guard const lock(m_mutex);
    m_spool = std::make_unique<Spool>(m_settings.spool, m_settings.spoolMax);
    m_sender = std::make_unique<SpoolSender>(
        *m_spool, m_settings.place.vehicle, !m_settings.ackTopic.empty(),
        [this](std::string const& payload) {
            return m_link->publish(m_settings.topic + "/readings", payload, m_settings.qos, false);
        },
        [this](std::string const& text) { tellOnce(text); });
    m_keeper.resume(*m_spool);
    m_link = std::make_unique<BrokerLink>(
        m_settings, "velmora-" + m_settings.place.vehicle + "-" + m_spool->id().substr(0, 8),
        BrokerLink::Will{m_settings.place.statusTopic, "offline"}, static_cast<BrokerLink::Listener&>(*this));
    m_link->start();
}

void MqttOutput::tellOnce(std::string const& text)
{
    if (text != m_lastTold) {
        m_lastTold = text;
        m_tell("mqtt " + m_settings.brokers.front().host + ": " + text);
    }
}

void MqttOutput::onUp()
{
    std::lock_guard const lock(m_mutex);
    tellOnce("connected");
    m_sender->onUp(steadyNow());
    if (!m_settings.ackTopic.empty()) {
        // A mark that gets lost is followed by the next; QoS 1 would cost a cluster a queue for each car.
        m_link->subscribe(m_settings.ackTopic, 0);
    }
    if (m_settings.discovery != Discovery::Off) {
        m_link->subscribe(homeAssistantStatus, 0);
    }
    m_link->publish(m_settings.place.statusTopic, "online", 1, true);
    m_home.publishDiscovery();
    m_sender->pump();
}

void MqttOutput::onDown(std::string const& why)
{
    std::lock_guard const lock(m_mutex);
    m_sender->onDown();
    tellOnce("no connection (" + why + "); readings wait in " + m_settings.spool);
}

void MqttOutput::onDelivered(int message)
{
    std::lock_guard const lock(m_mutex);
    m_sender->onDelivered(message, steadyNow());
}

void MqttOutput::onRefused(int message, std::string const& why)
{
    std::lock_guard const lock(m_mutex);
    tellOnce("the broker refuses what is sent: " + why);
    m_sender->onRefused(message);
}

void MqttOutput::onMessage(std::string const& topic, std::string const& payload)
{
    std::lock_guard const lock(m_mutex);
    if (topic == homeAssistantStatus) {
        if (payload == "online") {
            m_home.publishDiscovery();
        }
    } else if (std::optional<std::int64_t> const mark = storedMark(payload, m_spool->id())) {
        m_sender->onMark(*mark, steadyNow());
    }
}

void MqttOutput::write(Records records)
{
    std::lock_guard const lock(m_mutex);
    spoolRecords(records);
    for (SharedRecord const& record : records) {
        m_home.take(*record, steadyNow());
    }
    if (m_sender->isUp()) {
        m_home.publishState(steadyNow());
    }
    if (m_sender->isStuck(steadyNow())) {
        m_link->reconnect();
    }
    m_sender->pump();
}

// Times are repaired before they are sent and never after: a consumer may know a reading by its time, too.
void MqttOutput::spoolRecords(Records records)
{
    m_keeper.begin(*m_spool);
    std::vector<std::string> texts;
    for (SharedRecord const& record : records) {
        std::string text = spoolText(*m_keeper.dated(record));
        if (!text.empty()) {
            texts.push_back(std::move(text));
        }
    }
    makeRoom(texts);
    if (!texts.empty()) {
        m_spool->add(texts, Spool::timeBy(m_keeper.trust()));
    }
    m_keeper.done();
    m_gap = {};
}

// What is lost is told in the stream itself.
void MqttOutput::makeRoom(std::vector<std::string>& texts)
{
    Spool::Gap const gap = m_spool->makeRoom();
    if (gap.last > 0) {
        m_gap = {m_gap.last > 0 ? m_gap.first : gap.first, gap.last};
    }
    if (m_gap.last > 0) {
        nlohmann::ordered_json const event = {
            {"time", m_keeper.look().wall}, {"event", "gap"}, {"from", m_gap.first}, {"to", m_gap.last}};
        texts.push_back(toLine(event));
        tellOnce("the spool is full: its oldest readings were dropped");
    }
}

OutputState MqttOutput::state()
{
    std::lock_guard const lock(m_mutex);
    return {m_sender->isUp(), static_cast<std::uint64_t>(m_spool->span())};
}

bool MqttOutput::underway()
{
    std::lock_guard const lock(m_mutex);
    return m_sender->isUp() && m_sender->isUnderway();
}

void MqttOutput::close()
{
    if (m_link == nullptr) {
        return;
    }
    auto const limit = steadyNow() + lastWords;
    while (underway() && steadyNow() < limit) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    m_link->publish(m_settings.place.statusTopic, "offline", 1, true);
    while (m_link->isBusy() && steadyNow() < limit + lastWords) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    m_link->stop(); // while what it calls may still use it
    m_link.reset();
    std::lock_guard const lock(m_mutex);
    m_sender.reset();
    m_spool.reset();
}

} // namespace velmora
