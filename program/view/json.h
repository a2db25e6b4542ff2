#pragma once

#include <nlohmann/json.hpp>

#include <string>

// The documents that the program makes itself; those of a car come whole from the companion.

namespace velmora::cli {

using Json = nlohmann::ordered_json;

// A text that was not told is null, never an empty text.
inline Json textOrNull(std::string const& text)
{
    return text.empty() ? Json(nullptr) : Json(text);
}

// The document as it is printed. A vehicle, an adapter or the user may say anything: bytes that are no UTF-8 are
// replaced.
inline std::string printed(Json const& document)
{
    return document.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

} // namespace velmora::cli
