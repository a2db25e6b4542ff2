#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalhex.h"

#include <fmt/format.h>

namespace velmora {

namespace {

// A basic string of TOML.
std::string quoted(std::string const& text)
{
    std::string result = "\"";
    for (char const each : text) {
        if (each == '"' || each == '\\') {
            result += '\\';
            result += each;
        } else if (static_cast<unsigned char>(each) < 0x20 || each == 0x7F) {
            result += fmt::format("\\u{:04X}", static_cast<unsigned char>(each));
        } else {
            result += each;
        }
    }
    return result + "\"";
}

void line(std::string& text, char const* key, std::string const& value)
{
    if (!value.empty()) {
        text += fmt::format("{} = {}\n", key, quoted(value));
    }
}

template <typename Number>
void line(std::string& text, char const* key, std::optional<Number> const& value)
{
    if (value) {
        text += fmt::format("{} = {}\n", key, *value);
    }
}

void addressLine(std::string& text, char const* key, std::optional<unsigned char> const& address)
{
    if (address) {
        line(text, key, fmt::format("{:02X}", *address));
    }
}

void valuesLine(std::string& text, std::map<long, std::string> const& values)
{
    std::string list;
    for (auto const& [number, meaning] : values) {
        list += fmt::format("{}{} = {}", list.empty() ? "" : ", ", number, quoted(meaning));
    }
    if (!list.empty()) {
        text += "values = { " + list + " }\n";
    }
}

std::string toToml(Signal const& signal)
{
    std::string text = "\n[[signal]]\n";
    line(text, "id", signal.id);
    line(text, "name", signal.name);
    line(text, "header", signal.header);
    line(text, "reply", signal.reply);
    addressLine(text, "ext", signal.extendedAddress);
    addressLine(text, "tester", signal.tester);
    if (signal.flowControl) {
        text += fmt::format("flow = {{ header = \"{}\", data = \"{}\" }}\n", signal.flowControl->header,
                            hexText(signal.flowControl->data));
    }
    line(text, "request", hexText(signal.request));
    line(text, "length", signal.length);
    line(text, "formula", signal.formula ? toText(*signal.formula) : std::string());
    if (signal.text) {
        text += fmt::format("text = {{ first = {}, count = {} }}\n", signal.text->first, signal.text->count);
    }
    valuesLine(text, signal.values);
    line(text, "unit", signal.unit);
    line(text, "min", signal.min);
    line(text, "max", signal.max);
    line(text, "precision", std::optional(signal.precision));
    line(text, "rate", signal.rate);
    line(text, "timeout", signal.timeout);
    if (!signal.enabled) {
        text += "enabled = false\n";
    }
    line(text, "reason", signal.reason);
    if (!signal.verifiedBy.empty()) {
        text +=
            fmt::format("verified = {{ by = {}, on = {} }}\n", quoted(signal.verifiedBy), quoted(signal.verifiedOn));
    }
    return text;
}

} // namespace

std::string toToml(SignalFile const& file)
{
    std::string text = "[vehicle]\n";
    line(text, "maker", file.maker);
    if (!file.models.empty()) {
        std::string list;
        for (std::string const& model : file.models) {
            list += (list.empty() ? "" : ", ") + quoted(model);
        }
        text += "models = [" + list + "]\n";
    }
    line(text, "vin", file.vin);
    for (Signal const& signal : file.signals) {
        text += toToml(signal);
    }
    return text;
}

} // namespace velmora
