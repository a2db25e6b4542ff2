#include "libvelmora/output/ndjsonoutput.h"

#include "libvelmora/output/recordjson.h"
#include "libvelmora/output/recordtime.h"
#include "libvelmora/output/valuetext.h"

#include <nlohmann/json.hpp>

namespace velmora {

namespace {

// What a record looks like in the stream; lists of modules and sensors and a lamp as it was are no part of it.
struct JsonLine
{
    std::string operator()(Reading const& reading) const { return toLine(toJsonValue(reading)) + "\n"; }
    std::string operator()(Event const& event) const { return toLine(toJsonValue(event)) + "\n"; }
    std::string operator()(Trip const& trip) const
    {
        nlohmann::ordered_json value = {{"time", utcTime(trip.end)}, {"event", "trip"}};
        value.update(toJsonValue(trip));
        return toLine(value) + "\n";
    }
    std::string operator()(ModuleInfo const& /*info*/) const { return {}; }
    std::string operator()(SensorList const& /*list*/) const { return {}; }
    std::string operator()(LampState const& /*lamp*/) const { return {}; }
    std::string operator()(CodeChange const& code) const
    {
        nlohmann::ordered_json const value = {{"time", utcTime(code.time)},
                                              {"vehicle", code.vehicle},
                                              {"event", code.present ? "code" : "code_cleared"},
                                              {"module", moduleText(code.module)},
                                              {"code", code.code},
                                              {"kind", code.kind},
                                              {"text", code.text}};
        return toLine(value) + "\n";
    }
};

} // namespace

void NdjsonOutput::write(Records records)
{
    std::string lines;
    for (SharedRecord const& record : records) {
        lines += std::visit(JsonLine(), *record);
    }
    if (!lines.empty()) {
        m_file.add(lines, timeOf(*records.back()));
    }
}

} // namespace velmora
