#include "libvelmora/output/mqtt/mqttsettings.h"

#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>

#include <nlohmann/json.hpp>

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <fstream>
#include <string_view>

namespace velmora {

namespace {

constexpr int plainPort = 1883;
constexpr int tlsPort = 8883;

[[noreturn]] void rejectBroker(OutputAddress const& address, std::string const& why)
{
    throw Error(ErrorKind::WrongUse, toString(address) + ": " + why,
                {"such as mqtt://broker:1883/cars; topics are of letters, digits, _ and -"});
}

// Some brokers close the connection at a point or a blank, or count an empty level oddly.
bool isTopic(std::string_view topic)
{
    bool const known = std::ranges::all_of(topic, [](char each) {
        return (each >= 'a' && each <= 'z') || (each >= 'A' && each <= 'Z') || (each >= '0' && each <= '9') ||
               each == '-' || each == '_' || each == '/';
    });
    return known && !topic.empty() && topic.front() != '/' && topic.back() != '/' &&
           topic.find("//") == std::string_view::npos;
}

std::string secret(OutputAddress const& address, std::string const& key, char const* variable)
{
    std::string const file = address.option(key);
    if (file.empty()) {
        char const* const value = std::getenv(variable);
        return value == nullptr ? "" : value;
    }
    constexpr std::uintmax_t largest = 1U << 16U;
    std::ifstream in;
    if (whyUnreadable(file, largest).empty()) {
        in.open(file);
    }
    std::string line;
    if (!std::getline(in, line) || line.empty()) {
        rejectBroker(address, key + " names " + file + ", which can't be read or is empty");
    }
    return line;
}

Discovery discoveryOf(OutputAddress const& address)
{
    std::string const text = address.option("discovery", "device");
    if (text != "device" && text != "entity" && text != "off") {
        rejectBroker(address, "discovery is device, entity or off");
    }
    return text == "device" ? Discovery::Device : text == "entity" ? Discovery::Entity : Discovery::Off;
}

std::chrono::seconds keepAliveOf(OutputAddress const& address)
{
    std::string const text = address.option("keep_alive", "30");
    int seconds = 0;
    auto const [stop, error] = std::from_chars(text.data(), text.data() + text.size(), seconds);
    if (error != std::errc() || stop != text.data() + text.size() || seconds < 5 || seconds > 65535) {
        rejectBroker(address, "keep_alive is a number of seconds, from 5 to 65535");
    }
    return std::chrono::seconds(seconds);
}

BrokerPlace brokerPlace(OutputAddress const& address, std::string host, int port)
{
    BrokerPlace place{{}, port};
    std::size_t const colon = host.rfind(':');
    if (colon != std::string::npos && host.back() != ']') {
        char const* const end = host.data() + host.size();
        auto const [stop, error] = std::from_chars(host.data() + colon + 1, end, place.port);
        if (error != std::errc() || stop != end || place.port < 1 || place.port > 65535) {
            rejectBroker(address, "the port must be from 1 to 65535");
        }
        host.resize(colon);
    }
    if (host.size() >= 2 && host.front() == '[' && host.back() == ']') {
        host = host.substr(1, host.size() - 2);
    }
    place.host = host;
    if (host.empty() || host.find('@') != std::string::npos) {
        rejectBroker(address, "the host is missing, or a user stands before it: name that in user_file");
    }
    return place;
}

void takePlaces(OutputAddress const& address, MqttSettings& settings)
{
    std::size_t const slash = address.target.find('/');
    settings.topic = slash == std::string::npos ? "velmora" : address.target.substr(slash + 1);
    if (!isTopic(settings.topic)) {
        rejectBroker(address, "\"" + settings.topic + "\" is no topic");
    }
    std::string hosts = address.target.substr(0, slash) + ",";
    for (std::size_t comma = hosts.find(','); comma != std::string::npos; comma = hosts.find(',')) {
        settings.brokers.push_back(brokerPlace(address, hosts.substr(0, comma), settings.tls ? tlsPort : plainPort));
        hosts.erase(0, comma + 1);
    }
}

} // namespace

MqttSettings mqttSettings(OutputAddress const& address, OutputContext const& context)
{
    MqttSettings settings;
    settings.tls = address.kind == "mqtts";
    takePlaces(address, settings);
    settings.topic += "/" + context.vehicle;
    settings.ca = address.option("ca");
    std::string const qos = address.option("qos", "1");
    if (qos != "0" && qos != "1") {
        rejectBroker(address, "qos is 0 or 1");
    }
    settings.qos = qos == "0" ? 0 : 1;
    settings.keepAlive = keepAliveOf(address);
    settings.user = secret(address, "user_file", "VELMORA_MQTT_USER");
    settings.password = secret(address, "password_file", "VELMORA_MQTT_PASSWORD");
    settings.ackTopic = address.option("ack_topic");
    if (!settings.ackTopic.empty() && !isTopic(settings.ackTopic)) {
        rejectBroker(address, "ack_topic: \"" + settings.ackTopic + "\" is no topic");
    }
    settings.spool = address.option("spool", (context.stateFolder / ("spool-" + context.vehicle + ".db")).string());
    settings.spoolMax = parseSize(address.option("spool_max", "256M"));
    settings.discovery = discoveryOf(address);
    settings.place = {context.vehicle, settings.topic + "/status", settings.topic + "/state",
                      settings.topic + "/event"};
    return settings;
}

std::optional<std::int64_t> storedMark(std::string const& payload, std::string const& spool)
{
    nlohmann::json const mark = nlohmann::json::parse(payload, nullptr, false);
    if (!mark.is_object() || !mark.contains("spool") || !mark.contains("seq") || mark["spool"] != spool ||
        !mark["seq"].is_number_integer()) {
        return std::nullopt;
    }
    return mark["seq"].get<std::int64_t>();
}

} // namespace velmora
