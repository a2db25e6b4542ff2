#pragma once

#include "libvelmora/output/record.h"

#include <nlohmann/json_fwd.hpp>

namespace velmora {

// {"time", "vehicle", "module", "pid", "sensor", "name", "value": number, text or null, "unit", "raw"}.
nlohmann::ordered_json toJsonValue(Reading const& reading);
// Its value alone.
nlohmann::ordered_json valueJson(Reading const& reading);
// {"time", "vehicle", "event", "module" or null, "text"}.
nlohmann::ordered_json toJsonValue(Event const& event);
// {"begin", "end", "vehicle", "kind", "distance_km", ...}.
nlohmann::ordered_json toJsonValue(Trip const& trip);

// Without line breaks; bytes that are no UTF-8 become U+FFFD.
std::string toLine(nlohmann::ordered_json const& value);

} // namespace velmora
