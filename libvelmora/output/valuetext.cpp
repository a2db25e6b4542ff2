#include "libvelmora/output/valuetext.h"

#include <fmt/format.h>

#include <cmath>
#include <ctime>

namespace velmora {

std::string utcTime(WallTime time)
{
    std::int64_t const millis = toMillis(time);
    std::int64_t const fraction = ((millis % 1000) + 1000) % 1000;
    std::time_t const seconds = static_cast<std::time_t>((millis - fraction) / 1000);
    std::tm fields{};
    ::gmtime_r(&seconds, &fields);
    return fmt::format("{:04}-{:02}-{:02}T{:02}:{:02}:{:02}.{:03}Z", fields.tm_year + 1900, fields.tm_mon + 1,
                       fields.tm_mday, fields.tm_hour, fields.tm_min, fields.tm_sec, fraction);
}

std::int64_t toMillis(WallTime time)
{
    return std::chrono::floor<std::chrono::milliseconds>(time).time_since_epoch().count();
}

WallTime fromMillis(std::int64_t millis)
{
    return WallTime(std::chrono::milliseconds(millis));
}

std::string numberText(double value)
{
    return fmt::format("{:.10g}", value == 0.0 ? 0.0 : value);
}

std::string moduleText(unsigned int id)
{
    return fmt::format("{:X}", id);
}

std::optional<double> numberOf(Reading const& reading)
{
    double const* const number = std::get_if<double>(&reading.value);
    return number != nullptr && std::isfinite(*number) ? std::optional(*number) : std::nullopt;
}

} // namespace velmora
