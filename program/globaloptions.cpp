#include "program/globaloptions.h"

#include "common/text/text.h"

#include <string_view>

namespace velmora::cli {

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
    return parseHex(text, 0x1FFFFFFF);
}

} // namespace velmora::cli
