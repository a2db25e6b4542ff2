#include "libobd/powertrain/codedparameters.h"

#include <common/logrecord.h>

namespace obd {

formula::Decoded coded::fuelSystem(formula::Raw raw, IEcu const& /*ecu*/)
{
    unsigned int const position = lowestBit(raw);
    if (raw != 1U << position) {
        TERVEX_LOG(Error) << "Invalid bit set: int value " << raw;
        return std::nullopt;
    }
    return position;
}

std::string coded::emissionStandardText(unsigned int code)
{
    unsigned int const first = 14;
    return textOf<texts::emissionStandard>(code < first ? 0 : code - first + 1);
}

bool ControlAreaStatus::fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload)
{
    bool const withoutState = !payload.empty() && (payload[0] & 0x0F) == 0;
    return withoutState || TableParameter::fromPayload(ecu, payload);
}

} // namespace obd
