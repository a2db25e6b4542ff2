#include "libvelmora/poll/pollpace.h"

namespace velmora {

namespace {

constexpr std::chrono::milliseconds oldJ1850Gap{100};
constexpr int newJ1850Year = 2003; // the rule of April 2002 lets the next request follow at once

} // namespace

PollPace choosePace(PollWill const& will, obd::ObdProtocol protocol, int modelYear)
{
    PollPace pace;
    switch (protocol) {
    case obd::ObdProtocolCan11:
    case obd::ObdProtocolCan29:
        if (will.fast) {
            pace.floor = std::chrono::milliseconds(0);
            pace.pidsPerRequest = will.pidsPerRequest;
            pace.addresses = true;
        }
        break;
    case obd::ObdProtocolJ1850:
        if (modelYear < newJ1850Year) {
            pace.gap = oldJ1850Gap;
        } else if (will.fast) {
            pace.floor = std::chrono::milliseconds(0);
        }
        break;
    default:
        break;
    }
    return pace;
}

PollPace carefulPace(obd::ObdProtocol protocol)
{
    return choosePace({}, protocol, 0);
}

} // namespace velmora
