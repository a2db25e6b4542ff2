#pragma once

#include <obd/parameterdescriptor.h>
#include <obd/sensordatamodels.h>
#include <obd/sensorvalue.h>

#include <memory>
#include <string>
#include <vector>

namespace obd {

// The leading flag of a sensor's data model: false for coolant temperature, engine speed, vehicle speed and intake air
// temperature, which applications always show.
bool isSelectable(int uid);

// The reading of a sensor without statistics; null for null.
std::shared_ptr<SensorValueDataModel> makeValueModel(std::shared_ptr<SensorValue> const& value);

// A sensor under a name, with its reading, which may be null, and without a range.
std::shared_ptr<SensorDataModel> makeSensorModel(SensorDescriptor const& sensor, std::string const& name,
                                                 std::shared_ptr<SensorValue> const& value);

// The same with a reading that is a model already, and with the range of a numeric sensor.
std::shared_ptr<SensorDataModel> makeLiveModel(SensorDescriptor const& sensor, std::string const& name,
                                               std::shared_ptr<SensorValueDataModel> const& value);

// The range to draw a sensor's readings in, in whole numbers: widened, and symmetric around 0 if that of the sensor is
// nearly so. Ends beyond what an int holds are limited.
SensorDataModel::Numeric displayRange(double minimum, double maximum);

// The value of a sensor among those of its parameter, which leave out the sensors without a reading. Null for those.
std::shared_ptr<SensorValue> findValue(std::vector<std::shared_ptr<SensorValue>> const& values, int uid);

} // namespace obd
