#include "program/globaloptions.h"

#include "common/text/text.h"

#include <obd/connectionprotocol.h>

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
    auto const protocol = static_cast<obd::VehicleProtocol>(digits.empty() ? 0 : digits.front() - '0');
    bool const known = digits.size() == 1 && obd::toObdProtocol(protocol) != obd::ObdProtocolUnknown;
    return known ? std::optional(protocol) : std::nullopt;
}

std::optional<unsigned int> parseEcuId(std::string const& text)
{
    return parseHex(text, 0x1FFFFFFF);
}

} // namespace velmora::cli
