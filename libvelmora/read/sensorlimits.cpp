#include "libvelmora/read/sensorlimits.h"

#include "common/text/text.h"
#include "libvelmora/read/sensornames.h"
#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <memory>
#include <string_view>

namespace velmora {

namespace {

constexpr char const* limitGroup = "limit/";
constexpr std::size_t longestLimitKey = 64;

std::optional<double> endOf(std::string_view text)
{
    if (text.empty()) {
        return std::nullopt;
    }
    double number = 0.0;
    char const* const last = std::to_address(text.end());
    auto const [end, error] = std::from_chars(std::to_address(text.begin()), last, number);
    if (error != std::errc() || end != last || !std::isfinite(number)) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no limit", text),
                    {"give the highest value, such as 6000, or a range: 11.8..14.8, 11.8.. or ..14.8"});
    }
    return number;
}

// "0C", "010C", "0x0C", "$0C"; a name that happens to be hexadecimal is looked for before.
std::optional<unsigned int> pidIn(std::string const& sensor)
{
    std::string const digits = sensor.starts_with('$') ? sensor.substr(1) : sensor;
    std::optional<unsigned int> const number = parseHex(digits, 0x1FF);
    bool const named = number && (digits.size() == 2 || (digits.size() == 4 && digits.front() == '0'));
    return named ? std::optional(*number & 0xFFU) : std::nullopt;
}

bool mayBeId(std::string const& text)
{
    return !text.empty() && text.size() <= longestLimitKey && std::ranges::all_of(text, [](unsigned char c) {
        return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '_' || c == '-' ||
               c == '.';
    });
}

} // namespace

SensorLimit parseLimit(std::string const& text)
{
    std::size_t const dots = text.find("..");
    SensorLimit limit;
    if (dots == std::string::npos) {
        limit.highest = endOf(text);
    } else {
        limit = {endOf(std::string_view(text).substr(0, dots)), endOf(std::string_view(text).substr(dots + 2))};
    }
    bool const empty = !limit.lowest && !limit.highest;
    if (empty || (limit.lowest && limit.highest && *limit.lowest > *limit.highest)) {
        throw Error(ErrorKind::WrongUse,
                    fmt::format("\"{}\" is no limit: {}", text, empty ? "it has no end" : "no value can meet it"),
                    {"give the highest value, such as 6000, or a range: 11.8..14.8, 11.8.. or ..14.8"});
    }
    return limit;
}

std::string limitText(SensorLimit const& limit)
{
    if (!limit.lowest && !limit.highest) {
        return {};
    }
    return (limit.lowest ? fmt::format("{}", *limit.lowest) : "") + ".." +
           (limit.highest ? fmt::format("{}", *limit.highest) : "");
}

std::string limitKey(std::string const& sensor)
{
    if (auto const pid = findSensorName(sensor)) {
        return sensorKey(*pid);
    }
    if (auto const pid = pidIn(sensor)) {
        return sensorKey(static_cast<int>(*pid));
    }
    if (!mayBeId(sensor)) {
        throw Error(ErrorKind::WrongUse, "\"" + sensor + "\" is no name of a sensor",
                    {"`velmora sensors` lists the names", "for a signal of your own, give its id"});
    }
    return sensor;
}

SensorLimit limitOf(SettingsStore& store, std::string const& key)
{
    std::string text;
    if (!store.getString(limitGroup + key, text)) {
        int number = 0;
        return store.getInt(limitGroup + key, number) ? SensorLimit{{}, number} : SensorLimit();
    }
    try {
        return parseLimit(text);
    } catch (Error const& /*written by hand*/) {
        return {};
    }
}

void setLimit(SettingsStore& store, std::string const& key, SensorLimit const& limit)
{
    if (limit == SensorLimit()) {
        store.remove(limitGroup + key);
    } else {
        store.setString(limitGroup + key, limitText(limit));
    }
}

std::vector<std::string> limitedSensors(SettingsStore& store)
{
    return store.keysBelow(limitGroup);
}

struct SensorLimits::Parts
{
    explicit Parts(std::filesystem::path const& file) : store(file) {}

    SettingsStore store;
};

SensorLimits::SensorLimits(std::string const& settingsFile)
    : m_parts(std::make_unique<Parts>(settingsFile.empty() ? SettingsStore::defaultFile()
                                                           : std::filesystem::path(settingsFile)))
{}

SensorLimits::~SensorLimits() = default;

SensorLimit SensorLimits::of(std::string const& key) const
{
    return limitOf(m_parts->store, key);
}

std::vector<std::string> SensorLimits::sensors() const
{
    return limitedSensors(m_parts->store);
}

void SensorLimits::set(std::string const& key, SensorLimit const& limit)
{
    setLimit(m_parts->store, key, limit);
    m_parts->store.sync();
}

} // namespace velmora
