#include "libvelmora/output/mqtt/mqttoutput.h"

#include "libvelmora/output/mqtt/spooltext.h"
#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/valuetext.h"

#include <velmora/error.h>

#include <cstdlib>
#include <thread>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds lastWords{500};
constexpr std::chrono::milliseconds statePause{1000};
constexpr char const* homeAssistantStatus = "homeassistant/status";

SpoolSender::Time steadyNow()
{
    return std::chrono::steady_clock::now();
}

Spool::Time timeOf(ClockJudge::Trust trust)
{
    return trust == ClockJudge::Trust::Sure   ? Spool::Time::Sure
           : trust == ClockJudge::Trust::Wait ? Spool::Time::Held
                                              : Spool::Time::Unsure;
}

Spool::Stamp stampOf(ClockLook const& look)
{
    return {look.bootId, look.wall - look.boot};
}

// Whether a record was stamped before the clock was set by that step: then it lies nearer to where the clock would be
// without.
bool isFromBefore(Record const& record, std::int64_t step, ClockLook const& look)
{
    std::int64_t time = look.wall;
    if (auto const* const reading = std::get_if<Reading>(&record)) {
        time = toMillis(reading->time);
    } else if (auto const* const event = std::get_if<Event>(&record)) {
        time = toMillis(event->time);
    }
    return std::llabs(time - (look.wall - step)) < std::llabs(time - look.wall);
}

} // namespace

MqttOutput::MqttOutput(OutputAddress const& address, OutputContext const& context)
    : m_settings(mqttSettings(address, context)), m_tell(context.tell), m_clocks(context.clocks)
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
    resumeHeld(m_clocks());
    m_link = std::make_unique<BrokerLink>(
        m_settings, "velmora-" + m_settings.place.vehicle + "-" + m_spool->id().substr(0, 8),
        BrokerLink::Will{m_settings.place.statusTopic, "offline"}, static_cast<BrokerLink::Listener&>(*this));
    m_link->start();
}

// What was held when the watch ended still is, if the machine has not been started anew. Else nobody knows any more
// how wrong its clock was.
void MqttOutput::resumeHeld(ClockLook const& look)
{
    m_judge = ClockJudge();
    m_judge.look(look);
    std::optional<Spool::Stamp> const stamp = m_spool->heldStamp();
    if (stamp && stamp->bootId != look.bootId) {
        m_spool->release(Spool::Time::Unsure);
        return;
    }
    if (stamp) {
        ClockLook before = look;
        before.wall = look.boot + stamp->offset;
        ClockJudge judge;
        judge.look(before);
        if (std::int64_t const step = judge.look(look); step != 0) {
            m_spool->shiftHeld(step, stampOf(look));
        }
    }
    if (m_judge.trust() != ClockJudge::Trust::Wait) {
        m_spool->release(timeOf(m_judge.trust()));
    }
}

void MqttOutput::tellOnce(std::string const& text)
{
    if (text != m_lastTold) {
        m_lastTold = text;
        m_tell("mqtt " + m_settings.host + ": " + text);
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
    publishRetained(m_settings.place.statusTopic, "online");
    publishDiscovery();
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
            publishDiscovery();
        }
    } else if (std::optional<std::int64_t> const mark = storedMark(payload, m_spool->id())) {
        m_sender->onMark(*mark, steadyNow());
    }
}

void MqttOutput::write(Records records)
{
    std::lock_guard const lock(m_mutex);
    watchClock(records);
    for (SharedRecord const& record : records) {
        takeForHome(*record);
    }
    publishState();
    if (m_sender->isStuck(steadyNow())) {
        m_link->reconnect();
    }
    m_sender->pump();
}

// Times are repaired before they are sent and never after: a consumer may know a reading by its time, too.
void MqttOutput::watchClock(Records records)
{
    ClockLook const look = m_clocks();
    bool const held = m_judge.trust() == ClockJudge::Trust::Wait;
    std::int64_t const step = m_judge.look(look);
    Spool::Time const time = timeOf(m_judge.trust());
    if (held && step != 0) {
        m_spool->shiftHeld(step, stampOf(look));
    } else if (time == Spool::Time::Held && !m_spool->heldStamp()) {
        m_spool->keepStamp(stampOf(look));
    }
    spoolRecords(records, held ? step : 0, look);
    if (held && time != Spool::Time::Held) {
        m_spool->release(time);
    }
    makeRoom(look);
}

void MqttOutput::spoolRecords(Records records, std::int64_t step, ClockLook const& look)
{
    std::vector<std::string> texts;
    for (SharedRecord const& record : records) {
        std::string text = spoolText(*record);
        if (text.empty()) {
            continue;
        }
        bool const shifts = step != 0 && isFromBefore(*record, step, look);
        texts.push_back(shifts ? shiftedText(text, step) : std::move(text));
    }
    if (!texts.empty()) {
        m_spool->add(texts, timeOf(m_judge.trust()));
    }
}

void MqttOutput::makeRoom(ClockLook const& look)
{
    Spool::Gap const gap = m_spool->makeRoom();
    if (gap.last > 0) {
        nlohmann::ordered_json const event = {
            {"time", look.wall}, {"event", "gap"}, {"from", gap.first}, {"to", gap.last}};
        m_spool->add({toLine(event)}, timeOf(m_judge.trust()));
        tellOnce("the spool is full: its oldest readings were dropped");
    }
}

void MqttOutput::takeForHome(Record const& record)
{
    if (auto const* const reading = std::get_if<Reading>(&record)) {
        nlohmann::ordered_json const value = valueJson(*reading);
        m_state[stateKey(reading->module, reading->sensor)] = value.is_null() ? nlohmann::ordered_json("None") : value;
        m_stateChanged = true;
    } else if (auto const* const list = std::get_if<SensorList>(&record)) {
        m_sensors = list->sensors;
        publishDiscovery();
    }
}

void MqttOutput::publishState()
{
    auto const now = steadyNow();
    // A little less than a second: writes come once a second, give or take.
    if (m_sender->isUp() && m_stateChanged && now - m_stateTime >= statePause - statePause / 10) {
        m_stateChanged = false;
        m_stateTime = now;
        publishRetained(m_settings.place.stateTopic, toLine(m_state));
    }
}

void MqttOutput::publishDiscovery()
{
    if (!m_sender->isUp()) {
        return;
    }
    for (auto const& [topic, payload] : discoveryMessages(m_settings.discovery, m_settings.place, m_sensors)) {
        publishRetained(topic, payload);
    }
}

void MqttOutput::publishRetained(std::string const& topic, std::string const& payload)
{
    m_link->publish(topic, payload, 1, true);
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
    m_link->stop();
    m_link.reset();
    std::lock_guard const lock(m_mutex);
    m_sender.reset();
    m_spool.reset();
}

} // namespace velmora
