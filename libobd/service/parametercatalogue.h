#pragma once

#include <obd/sensordatamodels.h>
#include <obd/unitsystem.h>

#include <memory>
#include <vector>

namespace obd {

class IEcu;
class PowertrainParameter;

// A parameter for display, without readings: its sensors with names, units and ranges.
std::shared_ptr<ParameterDataModel> describeParameter(std::shared_ptr<PowertrainParameter> const& parameter,
                                                      std::shared_ptr<IEcu> const& ecu, UnitSystem system);

// Every parameter of a PID up to 0x7F that the library has a class for, in the order of the PIDs, then those that it
// works out. Whether the module supports them is not asked.
std::vector<std::shared_ptr<ParameterDataModel>> describeAllParameters(std::shared_ptr<IEcu> const& ecu,
                                                                       UnitSystem system);

// The same of the PIDs above 0x7F.
std::vector<std::shared_ptr<ParameterDataModel>> describeFurtherParameters(std::shared_ptr<IEcu> const& ecu,
                                                                           UnitSystem system);

} // namespace obd
