#include "libvelmora/poll/pollpace.h"

#include <obd/protocolfamily.h>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds oldJ1850Gap{100};
constexpr int newJ1850Year = 2003; // the rule of April 2002 lets the next request follow at once

} // namespace

PollPace choosePace(PollWill const& will, obd::ObdProtocol protocol, int modelYear)
{
    PollPace pace;
    if (protocol == obd::ObdProtocolJ1850 && modelYear < newJ1850Year) {
        pace.gap = oldJ1850Gap;
        return pace;
    }
    if (will.fast && (obd::isCan(protocol) || protocol == obd::ObdProtocolJ1850)) {
        pace.floor = std::chrono::milliseconds(0);
    }
    if (will.fast && obd::isCan(protocol)) {
        pace.pidsPerRequest = will.pidsPerRequest;
        pace.addresses = true;
    }
    return pace;
}

PollPace carefulPace(obd::ObdProtocol protocol)
{
    return choosePace({}, protocol, 0);
}

} // namespace velmora
