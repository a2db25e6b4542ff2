#include "libvelmora/report/unitlabel.h"

#include <obd/parameteridentifier.h>

namespace velmora {

char const* unitLabel(int uid, MeasurementUnit unit)
{
    constexpr int ignitionTiming = 0x0E;
    constexpr int injectionTiming = 0x5D;
    int const pid = obd::Uid2Pid(uid);
    bool const angle = unit == UnitNone && (pid == ignitionTiming || pid == injectionTiming);
    return unitLabel(angle ? UnitDegree : unit);
}

} // namespace velmora
