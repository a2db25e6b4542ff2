// Texts that settings of the watch and its options share.

#include "libvelmora/watch/watchsettings.h"

#include <algorithm>
#include <charconv>
#include <iterator>

namespace velmora {

std::optional<std::chrono::milliseconds> parseDuration(std::string_view text)
{
    struct Unit
    {
        std::string_view name;
        std::int64_t millis;
    };
    static constexpr Unit units[] = {{"ms", 1}, {"s", 1000}, {"min", 60000}, {"h", 3600000}};
    constexpr std::int64_t highest = 1000000;
    std::int64_t value = 0;
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(text.data(), end, value);
    auto const* const unit = std::ranges::find(units, std::string_view(stop, end), &Unit::name);
    if (error != std::errc() || value <= 0 || value > highest || unit == std::end(units)) {
        return std::nullopt;
    }
    return std::chrono::milliseconds(value * unit->millis);
}

bool parseWake(std::string_view text, BatterySettings& settings)
{
    if (text == "voltage") {
        settings.wakeEvery.reset();
        return true;
    }
    std::string_view const every = "every ";
    auto const pause = text.starts_with(every) ? parseDuration(text.substr(every.size())) : std::nullopt;
    if (!pause || *pause < std::chrono::minutes(1)) {
        return false;
    }
    settings.wakeEvery = std::chrono::floor<std::chrono::minutes>(*pause);
    return true;
}

bool isVehicleName(std::string_view text)
{
    return !text.empty() && text.size() <= 64 && std::ranges::all_of(text, [](char each) {
        return (each >= 'a' && each <= 'z') || (each >= 'A' && each <= 'Z') || (each >= '0' && each <= '9') ||
               each == '-' || each == '_';
    });
}

} // namespace velmora
