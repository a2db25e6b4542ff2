#include "libvelmora/output/mqttoutput.h"

#include "libvelmora/output/backoff.h"
#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/valuetext.h"

#include <velmora/error.h>

#include <algorithm>
#include <mosquitto.h>
#include <mqtt_protocol.h>
#include <random>

namespace velmora {

namespace {

constexpr std::size_t readingsInBatch = 1000;
constexpr std::size_t batchesUnderWay = 20;
constexpr int keepAliveSeconds = 30;
constexpr int oldProtocol = 0x84; // what a broker without MQTT 5 answers
constexpr std::chrono::seconds stuckAfter{30};
constexpr std::chrono::seconds answerLimit{15}; // a cluster that has lost a node takes 4 s and more
constexpr std::chrono::milliseconds lastWords{500};
constexpr int loopMillis = 100;

struct Mosquitto
{
    Mosquitto() { ::mosquitto_lib_init(); }
};

// What of a record goes through the spool: an array for a reading, an object for all else.
struct SpoolText
{
    std::string operator()(Reading const& reading) const
    {
        nlohmann::ordered_json const whole = toJsonValue(reading);
        return toLine({toMillis(reading.time), whole["module"], reading.sensor, whole["value"], reading.unit});
    }
    std::string operator()(Event const& event) const { return toLine(toJsonValue(event)); }
    std::string operator()(Trip const& trip) const
    {
        nlohmann::ordered_json value = {{"event", "trip_record"}};
        value.update(toJsonValue(trip));
        return toLine(value);
    }
    std::string operator()(CodeChange const& code) const
    {
        return toLine({{"time", utcTime(code.time)},
                       {"event", code.present ? "code" : "code_cleared"},
                       {"module", moduleText(code.module)},
                       {"code", code.code},
                       {"kind", code.kind},
                       {"text", code.text}});
    }
    std::string operator()(auto const& /*record*/) const { return {}; }
};

} // namespace

struct MqttOutput::Callbacks
{
    static MqttOutput& of(void* object) { return *static_cast<MqttOutput*>(object); }
    static void connect(mosquitto* /*client*/, void* object, int reason, int /*flags*/, mosquitto_property const* /*p*/)
    {
        of(object).onConnect(reason);
    }
    static void disconnect(mosquitto* /*client*/, void* object, int reason, mosquitto_property const* /*p*/)
    {
        of(object).onDisconnect(reason);
    }
    static void publish(mosquitto* /*client*/, void* object, int message, int reason, mosquitto_property const* /*p*/)
    {
        of(object).onPublish(message, reason);
    }
    static void message(mosquitto* /*client*/, void* object, mosquitto_message const* message,
                        mosquitto_property const* /*p*/)
    {
        of(object).onMessage(message->topic, std::string(static_cast<char const*>(message->payload),
                                                         static_cast<std::size_t>(message->payloadlen)));
    }
};

MqttOutput::MqttOutput(OutputAddress const& address, OutputContext const& context)
    : m_settings(mqttSettings(address, context)), m_tell(context.tell)
{
    static Mosquitto const library;
}

MqttOutput::~MqttOutput()
{
    close();
}

void MqttOutput::open()
{
    {
        std::lock_guard const lock(m_mutex);
        m_spool = std::make_unique<Spool>(m_settings.spool, m_settings.spoolMax);
    }
    std::string const id = "velmora-" + m_settings.place.vehicle + "-" + m_spool->id().substr(0, 8);
    m_client = ::mosquitto_new(id.c_str(), true, this);
    ::mosquitto_int_option(m_client, MOSQ_OPT_PROTOCOL_VERSION, MQTT_PROTOCOL_V5);
    ::mosquitto_connect_v5_callback_set(m_client, Callbacks::connect);
    ::mosquitto_disconnect_v5_callback_set(m_client, Callbacks::disconnect);
    ::mosquitto_publish_v5_callback_set(m_client, Callbacks::publish);
    ::mosquitto_message_v5_callback_set(m_client, Callbacks::message);
    ::mosquitto_will_set(m_client, m_settings.place.statusTopic.c_str(), 7, "offline", 1, true);
    if (!m_settings.user.empty()) {
        ::mosquitto_username_pw_set(m_client, m_settings.user.c_str(), m_settings.password.c_str());
    }
    connectTls();
    ::mosquitto_threaded_set(m_client, true);
    ::mosquitto_connect_async(m_client, m_settings.host.c_str(), m_settings.port, keepAliveSeconds);
    m_thread = std::thread([this] { run(); });
}

// libmosquitto's own thread gives up for good after some refusals, and knows no jitter.
void MqttOutput::run()
{
    Backoff backoff(std::random_device{}());
    auto attempt = std::chrono::steady_clock::now();
    std::unique_lock lock(m_mutex);
    while (!m_stop) {
        lock.unlock();
        int const result = ::mosquitto_loop(m_client, loopMillis, 1);
        lock.lock();
        auto const now = std::chrono::steady_clock::now();
        if (m_connected) {
            backoff.reset();
            attempt = now;
        }
        if (result != MOSQ_ERR_SUCCESS || now - attempt > answerLimit) {
            m_connected = false;
            m_wake.wait_for(lock, backoff.next(), [this] { return m_stop; });
            attempt = std::chrono::steady_clock::now();
            lock.unlock();
            ::mosquitto_reconnect_async(m_client);
            lock.lock();
        }
    }
}

void MqttOutput::connectTls()
{
    if (!m_settings.tls) {
        return;
    }
    char const* const ca = m_settings.ca.empty() ? nullptr : m_settings.ca.c_str();
    char const* const folder = m_settings.ca.empty() ? "/etc/ssl/certs" : nullptr;
    if (::mosquitto_tls_set(m_client, ca, folder, nullptr, nullptr, nullptr) != MOSQ_ERR_SUCCESS ||
        ::mosquitto_tls_opts_set(m_client, 1, "tlsv1.2", nullptr) != MOSQ_ERR_SUCCESS) {
        throw Error(ErrorKind::WrongUse, "Could not use the certificates of " + m_settings.ca,
                    {"is it a file of PEM certificates?"});
    }
}

void MqttOutput::tellOnce(std::string const& text)
{
    if (text != m_lastTold) {
        m_lastTold = text;
        m_tell("mqtt " + m_settings.host + ": " + text);
    }
}

void MqttOutput::onConnect(int reason)
{
    std::lock_guard const lock(m_mutex);
    if (reason == oldProtocol) {
        ::mosquitto_int_option(m_client, MOSQ_OPT_PROTOCOL_VERSION, MQTT_PROTOCOL_V311); // for the next attempt
        return;
    }
    if (reason != 0) {
        tellOnce(std::string("the broker refuses: ") + ::mosquitto_reason_string(reason));
        return;
    }
    tellOnce("connected");
    m_connected = true;
    m_progress = std::chrono::steady_clock::now();
    if (!m_settings.ackTopic.empty()) {
        sendAgain(m_stored);
        ::mosquitto_subscribe(m_client, nullptr, m_settings.ackTopic.c_str(), 1);
    }
    if (m_settings.discovery != Discovery::Off) {
        ::mosquitto_subscribe(m_client, nullptr, "homeassistant/status", 0);
    }
    publishRetained(m_settings.place.statusTopic, "online");
    publishDiscovery();
    pump();
}

void MqttOutput::onDisconnect(int reason)
{
    std::lock_guard const lock(m_mutex);
    m_connected = false;
    if (reason != 0 && m_lastTold == "connected") {
        tellOnce("the connection broke; readings wait in " + m_settings.spool);
    }
}

// A broker may refuse what its rights forbid: that is no delivery.
void MqttOutput::onPublish(int message, int reason)
{
    std::lock_guard const lock(m_mutex);
    auto const flight = m_flights.find(message);
    if (flight == m_flights.end()) {
        return;
    }
    std::int64_t const last = flight->second;
    m_flights.erase(flight);
    if (reason >= 0x80) {
        tellOnce(std::string("the broker refuses readings: ") + ::mosquitto_reason_string(reason));
        sendAgain(0); // with what comes next
        return;
    }
    m_ended[last] = true;
    std::int64_t whole = 0;
    while (!m_ended.empty() && m_ended.begin()->second) {
        whole = m_ended.begin()->first;
        m_ended.erase(m_ended.begin());
    }
    if (m_settings.ackTopic.empty() && whole > 0) {
        forgetUpTo(whole);
    }
    pump();
}

void MqttOutput::onMessage(std::string const& topic, std::string const& payload)
{
    std::lock_guard const lock(m_mutex);
    if (topic == "homeassistant/status") {
        if (payload == "online") {
            publishDiscovery();
        }
        return;
    }
    std::optional<std::int64_t> const mark = storedMark(payload, m_spool->id());
    if (mark && *mark > m_stored) {
        m_stored = *mark;
        m_progress = std::chrono::steady_clock::now();
        m_sent = std::max(m_sent, m_stored);
        forgetUpTo(m_stored);
        pump();
    }
}

// On libmosquitto's thread nobody catches; what could not be forgotten is sent again.
void MqttOutput::forgetUpTo(std::int64_t seq)
{
    try {
        m_spool->forget(seq);
    } catch (Error const& error) {
        tellOnce(error.what());
    }
}

void MqttOutput::write(Records records)
{
    std::lock_guard const lock(m_mutex);
    spoolRecords(records);
    Spool::Gap const gap = m_spool->makeRoom();
    if (gap.last > 0) {
        m_spool->add({toLine({{"time", utcTime(std::chrono::system_clock::now())},
                              {"event", "gap"},
                              {"from", gap.first},
                              {"to", gap.last}})});
        tellOnce("the spool is full: its oldest readings were dropped");
    }
    publishState();
    resendIfStuck();
    pump();
}

void MqttOutput::spoolRecords(Records records)
{
    std::vector<std::string> texts;
    for (SharedRecord const& record : records) {
        if (auto const* const reading = std::get_if<Reading>(record.get())) {
            takeState(*reading);
        } else if (auto const* const list = std::get_if<SensorList>(record.get())) {
            m_sensors = list->sensors;
            publishDiscovery();
        }
        std::string text = std::visit(SpoolText(), *record);
        if (!text.empty()) {
            texts.push_back(std::move(text));
        }
    }
    if (!texts.empty()) {
        m_spool->add(texts);
    }
}

void MqttOutput::takeState(Reading const& reading)
{
    nlohmann::ordered_json const value = toJsonValue(reading)["value"];
    m_state[stateKey(reading.module, reading.sensor)] = value.is_null() ? nlohmann::ordered_json("None") : value;
    m_stateChanged = true;
}

void MqttOutput::publishState()
{
    if (m_connected && m_stateChanged) {
        m_stateChanged = false;
        publishRetained(m_settings.place.stateTopic, toLine(m_state));
    }
}

void MqttOutput::publishDiscovery()
{
    if (!m_connected) {
        return;
    }
    for (auto const& [topic, payload] : discoveryMessages(m_settings.discovery, m_settings.place, m_sensors)) {
        publishRetained(topic, payload);
    }
}

void MqttOutput::publishRetained(std::string const& topic, std::string const& payload)
{
    ::mosquitto_publish(m_client, nullptr, topic.c_str(), static_cast<int>(payload.size()), payload.data(), 1, true);
}

// A consumer that reports nothing for long has lost what was sent, or the broker has.
void MqttOutput::resendIfStuck()
{
    auto const now = std::chrono::steady_clock::now();
    if (m_settings.ackTopic.empty() || m_sent == m_stored) {
        m_progress = now;
    } else if (m_connected && m_flights.empty() && now - m_progress >= stuckAfter) {
        m_progress = now;
        sendAgain(m_stored);
    }
}

// What is under way counts no longer: an acknowledgement of a later batch must not stand for an earlier one.
void MqttOutput::sendAgain(std::int64_t after)
{
    m_sent = after;
    m_flights.clear();
    m_ended.clear();
}

void MqttOutput::pump()
{
    try {
        while (m_connected && m_flights.size() < batchesUnderWay && sendBatch()) {
        }
    } catch (Error const& error) {
        tellOnce(error.what());
    }
}

bool MqttOutput::sendBatch()
{
    std::vector<Spool::Row> const rows = m_spool->after(m_sent, readingsInBatch);
    if (rows.empty()) {
        return false;
    }
    std::string readings;
    std::string events;
    for (Spool::Row const& row : rows) {
        bool const isReading = row.text.starts_with('[');
        std::string& list = isReading ? readings : events;
        list += (list.empty() ? "" : ",") + row.text.substr(0, 1) + (isReading ? "" : "\"seq\":") +
                std::to_string(row.seq) + "," + row.text.substr(1);
    }
    std::string const payload = R"({"vehicle":")" + m_settings.place.vehicle + R"(","spool":")" + m_spool->id() +
                                R"(","after":)" + std::to_string(m_sent) + R"(,"last":)" +
                                std::to_string(rows.back().seq) + R"(,"readings":[)" + readings + R"(],"events":[)" +
                                events + "]}";
    int message = 0;
    std::string const topic = m_settings.topic + "/readings";
    int const result = ::mosquitto_publish(m_client, &message, topic.c_str(), static_cast<int>(payload.size()),
                                           payload.data(), m_settings.qos, false);
    if (result != MOSQ_ERR_SUCCESS && result != MOSQ_ERR_NO_CONN) {
        return false;
    }
    m_sent = rows.back().seq;
    m_flights[message] = m_sent;
    m_ended[m_sent] = false;
    return result == MOSQ_ERR_SUCCESS;
}

void MqttOutput::close()
{
    if (m_client == nullptr) {
        return;
    }
    {
        std::lock_guard const lock(m_mutex);
        pump();
        if (m_connected) {
            publishRetained(m_settings.place.statusTopic, "offline");
        }
    }
    auto const limit = std::chrono::steady_clock::now() + lastWords;
    while (m_client != nullptr && ::mosquitto_want_write(m_client) && std::chrono::steady_clock::now() < limit) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
        m_wake.notify_all();
    }
    m_thread.join();
    ::mosquitto_disconnect(m_client);
    ::mosquitto_loop(m_client, 0, 1);
    ::mosquitto_destroy(m_client);
    m_client = nullptr;
    std::lock_guard const lock(m_mutex);
    m_spool.reset();
}

} // namespace velmora
