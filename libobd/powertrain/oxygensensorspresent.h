#pragma once

#include "libobd/powertrain/codedstate.h"
#include "libobd/powertrain/tableparameter.h"

#include <obd/oxygensensorlocation.h>

#include <optional>
#include <vector>

namespace obd {

// Which oxygen sensors a module has: a bit for each place of its arrangement.
class OxygenSensorsPresent : public TableParameter
{
public:
    using TableParameter::TableParameter;

    // The places that have a sensor, in the order of the bits; nothing if the module has not answered.
    std::optional<std::vector<OxygenSensorLocation>> locations(IEcu const& ecu) const;

    // The names of the places with a sensor in the arrangement of a PID, such as "B1S1, B1S2".
    static std::string namesIn13(unsigned int present);
    static std::string namesIn1d(unsigned int present);
};

inline constexpr Quantity locations13 = coded::states(OxygenSensorsPresent::namesIn13);
inline constexpr Quantity locations1d = coded::states(OxygenSensorsPresent::namesIn1d);

inline constexpr ParameterRow oxygenSensorsPresentRows[] = {
    {0x13, 1, 0, "Location of Oxygen Sensors", {{nullptr, always, byteAt(0), formula::plain, &locations13}}},
    {0x1D, 1, 0, "Location of Oxygen Sensors", {{nullptr, always, byteAt(0), formula::plain, &locations1d}}},
};
static_assert(pidsRise(oxygenSensorsPresentRows), "PIDs must rise, none twice");
static_assert(allHoldTheirFields(oxygenSensorsPresentRows));

template <int id>
struct ParameterClass<oxygenSensorsPresentRows, id>
{
    using Type = RowParameter<OxygenSensorsPresent, oxygenSensorsPresentRows, id>;
};

using OxygenSensorsPresent13 = RowParameter<OxygenSensorsPresent, oxygenSensorsPresentRows, 0x13>;
using OxygenSensorsPresent1d = RowParameter<OxygenSensorsPresent, oxygenSensorsPresentRows, 0x1D>;

} // namespace obd
