#include "libvelmora/output/recordjson.h"

#include "libvelmora/output/valuetext.h"

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include <cmath>

namespace velmora {

namespace {

using OrderedJson = nlohmann::ordered_json;

OrderedJson orNull(std::optional<double> const& value)
{
    return value ? OrderedJson::parse(fmt::format("{:.6g}", *value)) : OrderedJson(nullptr);
}

} // namespace

OrderedJson valueJson(Reading const& reading)
{
    if (std::string const* const text = std::get_if<std::string>(&reading.value)) {
        return *text;
    }
    std::optional<double> const number = numberOf(reading);
    return number ? OrderedJson::parse(numberText(*number)) : OrderedJson(nullptr);
}

OrderedJson toJsonValue(Reading const& reading)
{
    OrderedJson raw = nullptr;
    if (!reading.raw.empty()) {
        raw = fmt::format("{:02X}", fmt::join(reading.raw, ""));
    }
    return {{"time", utcTime(reading.time)},
            {"vehicle", reading.vehicle},
            {"module", moduleText(reading.module)},
            {"pid", reading.pid},
            {"sensor", reading.sensor},
            {"name", reading.name},
            {"value", valueJson(reading)},
            {"unit", reading.unit},
            {"raw", raw}};
}

OrderedJson toJsonValue(Event const& event)
{
    return {{"time", utcTime(event.time)},
            {"vehicle", event.vehicle},
            {"event", event.kind},
            {"module", event.module ? OrderedJson(moduleText(*event.module)) : OrderedJson(nullptr)},
            {"text", event.text}};
}

OrderedJson toJsonValue(Trip const& trip)
{
    return {{"begin", utcTime(trip.begin)},
            {"end", utcTime(trip.end)},
            {"vehicle", trip.vehicle},
            {"kind", trip.engineRun ? "engine run" : "trip"},
            {"distance_km", orNull(trip.distanceKm)},
            {"odometer_km", orNull(trip.odometerKm)},
            {"duration_s", orNull(trip.durationS)},
            {"idle_s", orNull(trip.idleS)},
            {"gap_s", orNull(trip.gapS)},
            {"fuel_l", orNull(trip.fuelL)},
            {"mean_kmh", orNull(trip.meanKmh)},
            {"max_kmh", orNull(trip.maxKmh)},
            {"max_rpm", orNull(trip.maxRpm)},
            {"max_coolant_c", orNull(trip.maxCoolantC)}};
}

std::string toLine(OrderedJson const& value)
{
    return value.dump(-1, ' ', false, OrderedJson::error_handler_t::replace);
}

} // namespace velmora
