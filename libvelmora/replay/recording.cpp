#include "libvelmora/replay/recording.h"

#include "libvelmora/output/valuetext.h"

#include <algorithm>
#include <charconv>
#include <chrono>
#include <cmath>
#include <string_view>
#include <utility>

namespace velmora {

namespace {

constexpr int mostDecimals = 6;
constexpr std::int64_t latestTime = 7258118400000; // the year 2200; what lies beyond is no time of a recording

int decimalsOf(std::string_view number)
{
    std::size_t const point = number.find('.');
    std::size_t const exponent = number.find_first_of("eE");
    return point == std::string_view::npos || exponent != std::string_view::npos
               ? 0
               : std::min(mostDecimals, static_cast<int>(number.size() - point - 1));
}

std::optional<double> finiteIn(std::string_view text)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool const whole = error == std::errc() && end == text.data() + text.size();
    return whole && std::isfinite(number) ? std::optional(number) : std::nullopt;
}

int valueOfDigits(std::string_view digits)
{
    int number = 0;
    for (char const digit : digits) {
        number = number * 10 + (digit - '0');
    }
    return number;
}

} // namespace

std::optional<std::int64_t> timeIn(std::string_view text)
{
    constexpr std::string_view form = "0000-00-00T00:00:00.000Z";
    bool const fits = std::ranges::equal(text, form, [](char given, char wanted) {
        return wanted == '0' ? given >= '0' && given <= '9' : given == wanted;
    });
    if (!fits) {
        return std::nullopt;
    }
    using namespace std::chrono;
    auto const part = [text](std::size_t at, std::size_t count) { return valueOfDigits(text.substr(at, count)); };
    year_month_day const date{year(part(0, 4)), month(static_cast<unsigned int>(part(5, 2))),
                              std::chrono::day(static_cast<unsigned int>(part(8, 2)))};
    if (!date.ok() || part(11, 2) > 23 || part(14, 2) > 59 || part(17, 2) > 60) {
        return std::nullopt;
    }
    return duration_cast<milliseconds>(sys_days(date).time_since_epoch()).count() +
           ((part(11, 2) * 60LL + part(14, 2)) * 60LL + part(17, 2)) * 1000LL + part(20, 3);
}

std::size_t RecordingMaker::sensor(SensorEntry const& about)
{
    std::string const key = moduleText(about.module) + "\n" + about.sensor + "\n" + about.unit;
    auto const known = m_numbers.find(key);
    if (known != m_numbers.end() || m_recording.sensors.size() >= mostSensors) {
        m_recording.cut |= known == m_numbers.end();
        return known != m_numbers.end() ? known->second : noRoom;
    }
    m_recording.sensors.push_back({about, 0, true, {}});
    return m_numbers[key] = m_recording.sensors.size() - 1;
}

bool RecordingMaker::add(std::size_t sensor, std::int64_t time, std::string const& text)
{
    if (std::optional<double> const number = finiteIn(text)) {
        if (sensor < m_recording.sensors.size()) {
            int& decimals = m_recording.sensors[sensor].decimals;
            decimals = std::max(decimals, decimalsOf(text));
        }
        return add(sensor, time, Reading::Value(*number));
    }
    return add(sensor, time, text.empty() || text == "-" ? Reading::Value() : Reading::Value(text));
}

bool RecordingMaker::add(std::size_t sensor, std::int64_t time, Reading::Value value)
{
    if (sensor >= m_recording.sensors.size() || time < 0 || time > latestTime) {
        return true; // left out: a sensor that found no room, or a time that can't be
    }
    if (m_values == m_mostValues) {
        m_recording.cut = true;
        return false;
    }
    ++m_values;
    RecordedSensor& one = m_recording.sensors[sensor];
    one.numeric = one.numeric && !std::holds_alternative<std::string>(value);
    one.values.push_back({time, std::move(value)});
    return true;
}

Recording RecordingMaker::finish()
{
    std::erase_if(m_recording.sensors, [](RecordedSensor const& each) { return each.values.empty(); });
    bool first = true;
    for (RecordedSensor& each : m_recording.sensors) {
        std::ranges::stable_sort(each.values, {}, &RecordedValue::time);
        std::int64_t const begin = each.values.front().time;
        std::int64_t const end = each.values.back().time;
        m_recording.begin = first ? begin : std::min(m_recording.begin, begin);
        m_recording.end = first ? end : std::max(m_recording.end, end);
        first = false;
    }
    return std::exchange(m_recording, {});
}

} // namespace velmora
