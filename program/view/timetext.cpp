#include "program/view/timetext.h"

#include <fmt/format.h>

#include <ctime>

namespace velmora::cli {

std::string isoTime(std::chrono::system_clock::time_point time)
{
    return isoTimeOf(std::chrono::floor<std::chrono::milliseconds>(time).time_since_epoch().count());
}

std::string isoTimeOf(std::int64_t millis)
{
    std::int64_t const fraction = ((millis % 1000) + 1000) % 1000;
    auto const seconds = static_cast<std::time_t>((millis - fraction) / 1000);
    std::tm fields{};
    ::gmtime_r(&seconds, &fields);
    return fmt::format("{:04}-{:02}-{:02}T{:02}:{:02}:{:02}.{:03}Z", fields.tm_year + 1900, fields.tm_mon + 1,
                       fields.tm_mday, fields.tm_hour, fields.tm_min, fields.tm_sec, fraction);
}

std::string localTime(std::chrono::system_clock::time_point time, char const* form)
{
    std::time_t const seconds = std::chrono::system_clock::to_time_t(time);
    std::tm fields{};
    ::localtime_r(&seconds, &fields);
    char text[32] = {};
    std::strftime(text, sizeof(text), form, &fields);
    return text;
}

} // namespace velmora::cli
