#include "libvelmora/signal/importing/jsonsource.h"

#include <velmora/error.h>

#include <charconv>

namespace velmora {

std::optional<double> numberOf(nlohmann::json const& object, std::string const& key)
{
    nlohmann::json const& member = memberOf(object, key);
    if (member.is_number()) {
        return member.get<double>();
    }
    std::string const text = textOf(object, key);
    double number = 0.0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return !text.empty() && error == std::errc() && end == text.data() + text.size() ? std::optional(number)
                                                                                     : std::nullopt;
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
