#pragma once

#include <obd/measurementunit.h>
#include <obd/sensorvaluedatamodel.h>

#include <memory>
#include <string>

namespace obd {

/// A sensor for the application; a copy that keeps nothing of the library alive.
struct SensorDataModel
{
    /// The range to draw a reading in: rounded, and never narrower than that of the sensor.
    struct Numeric
    {
        int minimum{0};
        int maximum{0};
    };

    SensorDataModel(bool isSelectable, int sensorUid, std::string const& sensorName, MeasurementUnit measurementUnit,
                    std::shared_ptr<Numeric> const& range)
        : SensorDataModel(isSelectable, sensorUid, sensorName, measurementUnit, nullptr, range)
    {}

    SensorDataModel(bool isSelectable, int sensorUid, std::string const& sensorName, MeasurementUnit measurementUnit,
                    std::shared_ptr<SensorValueDataModel> const& reading, std::shared_ptr<Numeric> const& range)
        : selectable(isSelectable), uid(sensorUid), name(sensorName), unit(measurementUnit), numeric(range),
          value(reading)
    {}

    bool selectable; ///< false if the user may not choose the sensor
    int uid;
    std::string name;
    MeasurementUnit unit;
    std::shared_ptr<Numeric> numeric;            ///< null for a textual sensor
    std::shared_ptr<SensorValueDataModel> value; ///< null if none was taken
};

} // namespace obd
