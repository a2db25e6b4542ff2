#include "libvelmora/output/mqtt/brokerlink.h"

#include "libvelmora/output/backoff.h"

#include <velmora/error.h>

#include <mosquitto.h>
#include <mqtt_protocol.h>
#include <random>

namespace velmora {

namespace {

constexpr int withoutMqtt5 = 0x84;               // what a broker answers that has no MQTT 5
constexpr std::chrono::seconds connackLimit{15}; // a cluster that has lost a node takes 4 s and more
constexpr int loopMillis = 100;
constexpr std::chrono::milliseconds betweenNodes{1000}; // of a cluster; the pauses grow once all have failed

struct Mosquitto
{
    Mosquitto() { ::mosquitto_lib_init(); }
};

} // namespace

struct BrokerLink::Callbacks
{
    static BrokerLink& of(void* object) { return *static_cast<BrokerLink*>(object); }
    static void connect(mosquitto* /*client*/, void* object, int reason, int /*flags*/, mosquitto_property const* /*p*/)
    {
        of(object).onConnect(reason);
    }
    // A publication that the rights forbid comes as delivered, with a reason.
    static void publish(mosquitto* /*client*/, void* object, int message, int reason, mosquitto_property const* /*p*/)
    {
        Listener& listener = of(object).m_listener;
        if (isRefusal(reason)) {
            listener.onRefused(message, ::mosquitto_reason_string(reason));
        } else {
            listener.onDelivered(message);
        }
    }
    static void message(mosquitto* /*client*/, void* object, mosquitto_message const* message,
                        mosquitto_property const* /*p*/)
    {
        of(object).m_listener.onMessage(message->topic, std::string(static_cast<char const*>(message->payload),
                                                                    static_cast<std::size_t>(message->payloadlen)));
    }
};

BrokerLink::BrokerLink(MqttSettings settings, std::string clientId, Will will, Listener& listener)
    : m_settings(std::move(settings)), m_clientId(std::move(clientId)), m_will(std::move(will)), m_listener(listener),
      m_client(nullptr, ::mosquitto_destroy)
{
    static Mosquitto const library;
    m_client = makeClient();
}

BrokerLink::Client BrokerLink::makeClient()
{
    Client client(::mosquitto_new(m_clientId.c_str(), true, this), ::mosquitto_destroy);
    mosquitto* const one = client.get();
    ::mosquitto_int_option(one, MOSQ_OPT_PROTOCOL_VERSION, m_oldProtocol ? MQTT_PROTOCOL_V311 : MQTT_PROTOCOL_V5);
    ::mosquitto_connect_v5_callback_set(one, Callbacks::connect);
    ::mosquitto_publish_v5_callback_set(one, Callbacks::publish);
    ::mosquitto_message_v5_callback_set(one, Callbacks::message);
    ::mosquitto_will_set(one, m_will.topic.c_str(), static_cast<int>(m_will.payload.size()), m_will.payload.data(), 1,
                         true);
    ::mosquitto_threaded_set(one, true);
    if (!m_settings.user.empty()) {
        ::mosquitto_username_pw_set(one, m_settings.user.c_str(), m_settings.password.c_str());
    }
    if (m_settings.tls) {
        char const* const ca = m_settings.ca.empty() ? nullptr : m_settings.ca.c_str();
        char const* const folder = m_settings.ca.empty() ? "/etc/ssl/certs" : nullptr;
        if (::mosquitto_tls_set(one, ca, folder, nullptr, nullptr, nullptr) != MOSQ_ERR_SUCCESS ||
            ::mosquitto_tls_opts_set(one, 1, "tlsv1.2", nullptr) != MOSQ_ERR_SUCCESS) {
            throw Error(ErrorKind::WrongUse, "Could not use the certificates of " + m_settings.ca,
                        {"is it a file of PEM certificates, and may you read it?"});
        }
    }
    return client;
}

void BrokerLink::start()
{
    m_thread = std::thread([this] { run(); });
}

// libmosquitto's own thread gives up for good after some refusals, and knows no jitter.
void BrokerLink::run()
{
    Backoff backoff(std::random_device{}());
    while (!m_stop) {
        m_why.clear();
        m_atOnce = false;
        auto const begin = std::chrono::steady_clock::now();
        attempt();
        bool stood = false;
        {
            std::lock_guard const lock(m_mutex);
            stood = std::exchange(m_up, false);
        }
        if (m_stop) {
            return;
        }
        if (stood && std::chrono::steady_clock::now() - begin > connackLimit) {
            backoff.reset();
        }
        if (!m_atOnce) {
            m_listener.onDown(m_why);
            m_turn = (m_turn + 1) % m_settings.brokers.size();
            auto const pause = m_turn == 0 ? backoff.next() : betweenNodes;
            std::unique_lock lock(m_mutex);
            m_wake.wait_for(lock, pause, [this] { return m_stop.load(); });
        }
    }
}

// What libmosquitto has under way goes with its client: the spool is the only memory.
void BrokerLink::attempt()
{
    mosquitto* client = nullptr;
    try {
        Client fresh = makeClient();
        client = fresh.get();
        std::lock_guard const lock(m_mutex);
        m_client = std::move(fresh);
    } catch (Error const& error) {
        fail(error.what());
        return;
    }
    // Waits for the name to be resolved, without a limit.
    BrokerPlace const& place = m_settings.brokers[m_turn];
    int const result = ::mosquitto_connect_async(client, place.host.c_str(), place.port,
                                                 static_cast<int>(m_settings.keepAlive.count()));
    if (result != MOSQ_ERR_SUCCESS) {
        fail(::mosquitto_strerror(result));
        return;
    }
    follow(client);
}

void BrokerLink::follow(mosquitto* client)
{
    auto const limit = std::chrono::steady_clock::now() + connackLimit;
    m_again = false;
    while (!m_stop) {
        int const result = ::mosquitto_loop(client, loopMillis, 1);
        if (result != MOSQ_ERR_SUCCESS) {
            fail(::mosquitto_strerror(result));
            return;
        }
        if (m_again) {
            fail("nothing that was sent is confirmed");
            return;
        }
        std::lock_guard const lock(m_mutex);
        if (!m_up && std::chrono::steady_clock::now() > limit) {
            fail("the broker does not answer");
            return;
        }
    }
}

// The first reason is the nearest to the cause.
void BrokerLink::fail(std::string const& why)
{
    if (m_why.empty()) {
        m_why = why;
    }
}

void BrokerLink::onConnect(int reason)
{
    if (reason == withoutMqtt5 && !m_oldProtocol) {
        m_oldProtocol = true;
        m_atOnce = true;
        return;
    }
    if (reason != 0) {
        fail(std::string("the broker refuses: ") +
             (m_oldProtocol ? ::mosquitto_connack_string(reason) : ::mosquitto_reason_string(reason)));
        return;
    }
    {
        std::lock_guard const lock(m_mutex);
        m_up = true;
    }
    m_listener.onUp();
}

std::optional<int> BrokerLink::publish(std::string const& topic, std::string const& payload, int qos, bool retain)
{
    std::lock_guard const lock(m_mutex);
    int message = 0;
    bool const taken =
        m_up && ::mosquitto_publish(m_client.get(), &message, topic.c_str(), static_cast<int>(payload.size()),
                                    payload.data(), qos, retain) == MOSQ_ERR_SUCCESS;
    return taken ? std::optional(message) : std::nullopt;
}

void BrokerLink::subscribe(std::string const& topic, int qos)
{
    std::lock_guard const lock(m_mutex);
    if (m_up) {
        ::mosquitto_subscribe(m_client.get(), nullptr, topic.c_str(), qos);
    }
}

bool BrokerLink::isBusy()
{
    std::lock_guard const lock(m_mutex);
    return m_up && ::mosquitto_want_write(m_client.get());
}

void BrokerLink::stop()
{
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
        m_wake.notify_all();
    }
    if (!m_thread.joinable()) {
        return;
    }
    m_thread.join();
    ::mosquitto_disconnect(m_client.get());
    ::mosquitto_loop(m_client.get(), 0, 1);
    m_client.reset();
}

} // namespace velmora
