#include "libvelmora/signal/importing/jsonsource.h"

#include <velmora/error.h>

#include <charconv>
#include <cmath>
#include <memory>

namespace velmora {

std::optional<double> numberOf(nlohmann::json const& object, std::string const& key)
{
    nlohmann::json const& member = memberOf(object, key);
    if (member.is_number()) {
        return member.get<double>();
    }
    std::string const text = textOf(object, key);
    double number = 0.0;
    char const* const last = std::to_address(text.end());
    auto const [end, error] = std::from_chars(text.data(), last, number);
    return error == std::errc() && end == last && std::isfinite(number) ? std::optional(number) : std::nullopt;
}

nlohmann::json parseJson(std::string_view text, std::string const& path)
{
    try {
        return nlohmann::json::parse(text);
    } catch (nlohmann::json::exception const& error) {
        throw Error(ErrorKind::WrongUse, path + " is no JSON: " + error.what());
    }
}

} // namespace velmora
