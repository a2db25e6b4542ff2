#include "libvelmora/poll/sensorwish.h"

#include "common/text/text.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <cctype>
#include <charconv>
#include <memory>
#include <string_view>

namespace velmora {

namespace {

constexpr double slowest = 0.001;
constexpr double highestRate = 1000.0;
constexpr std::size_t longestId = 8; // digits of a 29 bit CAN identifier

bool isHexadecimal(std::string_view text)
{
    return std::all_of(text.begin(), text.end(),
                       [](char each) { return std::isxdigit(static_cast<unsigned char>(each)) != 0; });
}

// The module in front of a colon. A word such as "bank 1: trim" has a colon, but no id in front of it.
std::optional<unsigned int> parseModule(std::string_view text)
{
    if (text.size() < 2 || text.size() > longestId || !isHexadecimal(text)) {
        return std::nullopt;
    }
    unsigned int id = 0;
    std::from_chars(std::to_address(text.begin()), std::to_address(text.end()), id, 16);
    return id;
}

} // namespace

std::optional<double> parseRate(std::string const& text)
{
    std::string number = toUpper(text);
    if (number.ends_with("HZ")) {
        number.resize(number.size() - 2);
    }
    while (number.ends_with(' ')) {
        number.pop_back();
    }
    double hertz = 0.0;
    char const* const last = std::to_address(number.end());
    auto const [end, error] = std::from_chars(number.data(), last, hertz);
    bool const whole = error == std::errc() && end == last;
    return whole && hertz >= slowest && hertz <= highestRate ? std::optional(hertz) : std::nullopt;
}

std::string rateText(double hertz)
{
    return fmt::format("{:.3g}", hertz);
}

SensorWish parseSensorWish(std::string const& word)
{
    SensorWish wish;
    wish.sensor = word;
    if (std::size_t const at = word.rfind('@'); at != std::string::npos) {
        wish.hertz = parseRate(word.substr(at + 1));
        if (!wish.hertz) {
            throw Error(ErrorKind::WrongUse,
                        fmt::format("\"{}\" is no rate of a sensor (\"{}\")", word.substr(at + 1), word),
                        {"a rate is a number of readings a second, 0.001 to 1000: RPM@10hz, COOLANT_TEMP@0.2hz"});
        }
        wish.sensor.resize(at);
    }
    if (std::size_t const colon = wish.sensor.find(':'); colon != std::string::npos) {
        wish.module = parseModule(std::string_view(wish.sensor).substr(0, colon));
        if (wish.module) {
            wish.sensor.erase(0, colon + 1);
        }
    }
    if (wish.sensor.empty()) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" names no sensor", word),
                    {"say which: RPM, 7E8:RPM, RPM@10hz"});
    }
    return wish;
}

} // namespace velmora
