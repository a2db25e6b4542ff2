#include "program/view/live/livelines.h"

#include "program/view/json.h"

#include <obd/parameteridentifier.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

// A number with the decimals that the sensor has, a text, or null.
Json toJson(std::string const& text, bool numeric)
{
    if (text.empty()) {
        return nullptr;
    }
    if (!numeric) {
        return text;
    }
    return Json::parse(text, nullptr, false).is_number() ? Json::parse(text) : Json(nullptr);
}

} // namespace

std::string toLine(LiveRow const& row)
{
    if (row.value.empty() || row.unit.empty()) {
        return fmt::format("{}: {}\n", row.name, orDash(row.value));
    }
    return fmt::format("{}: {} {}\n", row.name, row.value, row.unit);
}

std::string toJsonLine(LiveRow const& row, std::string const& time)
{
    Json line = {
        {"time", textOrNull(time)},
        {"module", fmt::format("{:X}", row.module)},
        {"pid", fmt::format("{:02X}", static_cast<int>(obd::Uid2Pid(row.uid)))},
        {"uid", row.uid},
        {"name", row.name},
        {"value", toJson(row.value, row.numeric)},
        {"unit", textOrNull(row.unit)},
        {"minimum", toJson(row.minimum, row.numeric)},
        {"mean", toJson(row.mean, row.numeric)},
        {"maximum", toJson(row.maximum, row.numeric)},
    };
    if (row.isSignal) {
        line["pid"] = textOrNull(row.request);
        line["sensor"] = row.key;
    }
    return line.dump(-1, ' ', false, Json::error_handler_t::replace) + "\n";
}

} // namespace velmora::cli
