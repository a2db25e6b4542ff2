#pragma once

#include <nlohmann/json.hpp>

#include <optional>
#include <string>
#include <string_view>

namespace velmora {

// A member of a JSON object, null if it is not there or the value is no object.
inline nlohmann::json const& memberOf(nlohmann::json const& object, std::string const& key)
{
    static nlohmann::json const none;
    if (!object.is_object()) {
        return none;
    }
    auto const found = object.find(key);
    return found == object.end() ? none : *found;
}

// A member that is a text; empty for any other.
inline std::string textOf(nlohmann::json const& object, std::string const& key)
{
    nlohmann::json const& member = memberOf(object, key);
    return member.is_string() ? member.get<std::string>() : std::string();
}

// A member that is a finite number, or a text that holds one; nothing for any other.
std::optional<double> numberOf(nlohmann::json const& object, std::string const& key);

// The document of a text; throws Error (wrong use) for one that is no JSON.
nlohmann::json parseJson(std::string_view text, std::string const& path);

} // namespace velmora
