#include "libvelmora/output/mqtt/spooltext.h"

#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/valuetext.h"

#include <nlohmann/json.hpp>

namespace velmora {

namespace {

using Json = nlohmann::ordered_json;

struct TextMaker
{
    std::string operator()(Reading const& reading) const
    {
        return toLine(
            {toMillis(reading.time), moduleText(reading.module), reading.sensor, valueJson(reading), reading.unit});
    }
    std::string operator()(Event const& event) const
    {
        Json value = toJsonValue(event);
        value["time"] = toMillis(event.time);
        return toLine(value);
    }
    std::string operator()(Trip const& trip) const
    {
        Json value = {{"event", "trip_record"}};
        value.update(toJsonValue(trip));
        value["begin"] = toMillis(trip.begin);
        value["end"] = toMillis(trip.end);
        return toLine(value);
    }
    std::string operator()(CodeChange const& code) const
    {
        return toLine({{"time", toMillis(code.time)},
                       {"event", code.present ? "code" : "code_cleared"},
                       {"module", moduleText(code.module)},
                       {"code", code.code},
                       {"kind", code.kind},
                       {"text", code.text}});
    }
    std::string operator()(auto const& /*record*/) const { return {}; }
};

} // namespace

std::string spoolText(Record const& record)
{
    return std::visit(TextMaker(), record);
}

std::string shiftedText(std::string const& text, std::int64_t millis)
{
    Json value = Json::parse(text, nullptr, false);
    if (value.is_array() && !value.empty() && value[0].is_number_integer()) {
        value[0] = value[0].get<std::int64_t>() + millis;
    } else if (value.is_object()) {
        for (char const* const key : {"time", "begin", "end"}) {
            if (value.contains(key) && value[key].is_number_integer()) {
                value[key] = value[key].get<std::int64_t>() + millis;
            }
        }
    } else {
        return text;
    }
    return toLine(value);
}

std::string batchText(BatchHead const& head, std::vector<Spool::Row> const& rows)
{
    std::string readings;
    std::string events;
    for (Spool::Row const& row : rows) {
        bool const isReading = row.text.starts_with('[');
        std::string& list = isReading ? readings : events;
        list += (list.empty() ? "" : ",") + row.text.substr(0, 1) + (isReading ? "" : "\"seq\":") +
                std::to_string(row.seq) + "," + row.text.substr(1);
    }
    bool const unsure = rows.front().time == Spool::Time::Unsure;
    return R"({"vehicle":")" + head.vehicle + R"(","spool":")" + head.spool + R"(","after":)" +
           std::to_string(head.after) + R"(,"last":)" + std::to_string(rows.back().seq) + R"(,"stored":)" +
           std::to_string(head.stored) + R"(,"clock":)" + (unsure ? "false" : "true") + R"(,"readings":[)" + readings +
           R"(],"events":[)" + events + "]}";
}

} // namespace velmora
