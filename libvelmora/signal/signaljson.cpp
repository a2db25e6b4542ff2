#include "libvelmora/report/json.h"
#include "libvelmora/signal/signalfile.h"
#include "libvelmora/signal/signalhex.h"

namespace velmora {

namespace {

Json toJsonValue(Signal const& signal)
{
    Json values = Json::object();
    for (auto const& [number, text] : signal.values) {
        values[std::to_string(number)] = text;
    }
    return {{"id", signal.id},
            {"name", signal.name},
            {"header", textOrNull(signal.header)},
            {"reply", textOrNull(signal.reply)},
            {"request", textOrNull(hexText(signal.request))},
            {"formula", signal.formula ? Json(toText(*signal.formula)) : Json(nullptr)},
            {"values", signal.values.empty() ? Json(nullptr) : values},
            {"unit", textOrNull(signal.unit)},
            {"min", valueOrNull(signal.min)},
            {"max", valueOrNull(signal.max)},
            {"precision", signal.precision},
            {"rate", valueOrNull(signal.rate)},
            {"enabled", signal.enabled},
            {"reason", textOrNull(signal.reason)}};
}

} // namespace

nlohmann::ordered_json toJsonValue(SignalFile const& file)
{
    Json signals = Json::array();
    for (Signal const& signal : file.signals) {
        signals.push_back(toJsonValue(signal));
    }
    return {
        {"file", file.path}, {"maker", textOrNull(file.maker)}, {"vin", textOrNull(file.vin)}, {"signals", signals}};
}

} // namespace velmora
