#pragma once

#include <nlohmann/json.hpp>

#include <optional>
#include <string>

namespace velmora {

using Json = nlohmann::ordered_json;

// A text that was not told is null, never an empty text.
inline Json textOrNull(std::string const& text)
{
    return text.empty() ? Json(nullptr) : Json(text);
}

template <typename Value>
Json valueOrNull(std::optional<Value> const& value)
{
    return value ? Json(*value) : Json(nullptr);
}

// The document as it is printed. A vehicle, an adapter or the user may say anything: bytes that are no UTF-8 are
// replaced.
inline std::string printed(Json const& document)
{
    return document.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

// The same on one line, without blanks and without its end.
inline std::string dumpedJson(Json const& document)
{
    return document.dump(-1, ' ', false, Json::error_handler_t::replace);
}

} // namespace velmora
