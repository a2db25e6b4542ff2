#include "velmora/globaloptions.h"

#include <charconv>
#include <string_view>

namespace velmora {

std::optional<obd::VehicleProtocol> parseProtocol(std::string const& text)
{
    if (text == "auto") {
        return obd::VehicleProtocol::Automatic;
    }
    std::string_view digits = text;
    if (digits.size() == 2 && (digits.front() == 'A' || digits.front() == 'a')) {
        digits.remove_prefix(1);
    }
    if (digits.size() != 1 || digits.front() < '1' || digits.front() > '9') {
        return std::nullopt;
    }
    return static_cast<obd::VehicleProtocol>(digits.front() - '0');
}

std::optional<unsigned int> parseEcuId(std::string const& text)
{
    std::string_view digits = text;
    if (digits.starts_with("0x") || digits.starts_with("0X")) {
        digits.remove_prefix(2);
    }
    unsigned int id = 0;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), id, 16);
    if (digits.empty() || error != std::errc() || end != digits.data() + digits.size() || id > 0x1FFFFFFF) {
        return std::nullopt;
    }
    return id;
}

} // namespace velmora
