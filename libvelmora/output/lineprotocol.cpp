#include "libvelmora/output/lineprotocol.h"

#include "libvelmora/output/valuetext.h"

namespace velmora {

namespace {

// A backslash at the end of a tag and a line break in it spoil the line, and nothing escapes them.
std::string escapedTag(std::string const& text)
{
    std::string result;
    for (char const each : text) {
        if (each == '\\' || static_cast<unsigned char>(each) < ' ') {
            result += '_';
        } else {
            result += each == ',' || each == '=' || each == ' ' ? std::string{'\\', each} : std::string{each};
        }
    }
    return result;
}

std::string tag(char const* name, std::string const& value)
{
    return value.empty() ? "" : "," + std::string(name) + "=" + escapedTag(value);
}

std::string quotedField(std::string const& text)
{
    std::string result = "\"";
    for (char const each : text) {
        if (static_cast<unsigned char>(each) < ' ') {
            result += ' ';
        } else {
            result += each == '"' || each == '\\' ? std::string{'\\', each} : std::string{each};
        }
    }
    return result + "\"";
}

std::string field(Reading const& reading)
{
    if (std::string const* const text = std::get_if<std::string>(&reading.value)) {
        return "text=" + quotedField(*text);
    }
    std::optional<double> const number = numberOf(reading);
    return number ? "value=" + numberText(*number) : "";
}

} // namespace

std::string toLineProtocol(Reading const& reading)
{
    std::string const value = field(reading);
    if (value.empty()) {
        return {};
    }
    return "velmora" + tag("vehicle", reading.vehicle) + tag("module", moduleText(reading.module)) +
           tag("sensor", reading.sensor) + " " + value + " " + std::to_string(toMillis(reading.time)) + "000000\n";
}

} // namespace velmora
