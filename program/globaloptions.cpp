#include "program/globaloptions.h"

#include "common/text/text.h"

#include <obd/connectionprotocol.h>

#include <string_view>

namespace velmora::cli {

std::optional<int> parseProtocol(std::string const& text)
{
    if (text == "auto") {
        return static_cast<int>(obd::VehicleProtocol::Automatic);
    }
    std::string_view digits = text;
    if (digits.size() == 2 && (digits.front() == 'A' || digits.front() == 'a')) {
        digits.remove_prefix(1);
    }
    int const protocol = digits.empty() ? 0 : digits.front() - '0';
    bool const known = digits.size() == 1 &&
                       obd::toObdProtocol(static_cast<obd::VehicleProtocol>(protocol)) != obd::ObdProtocolUnknown;
    return known ? std::optional(protocol) : std::nullopt;
}

std::optional<unsigned int> parseEcuId(std::string const& text)
{
    return parseHex(text, 0x1FFFFFFF);
}

} // namespace velmora::cli
