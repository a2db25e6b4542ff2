#pragma once

#include <obd/measurementunit.h>
#include <obd/parameteridentifier.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace obd {

/// A reading with its statistics, as texts and as numbers, for the application; a copy that keeps nothing alive.
struct SensorValueDataModel
{
    /// Over all readings since the selection, in the unit of the texts, not rounded.
    struct Statistics
    {
        double minimum{0.0};   ///< smallest reading
        double maximum{0.0};   ///< largest reading
        double mean{0.0};      ///< arithmetic mean
        unsigned int count{0}; ///< of the readings
    };

    /// For a numeric sensor.
    SensorValueDataModel(int sensorUid, std::string const& currentText, std::string const& minimumText,
                         std::string const& maximumText, std::string const& meanText)
        : uid(sensorUid), value(currentText), minimum(minimumText), maximum(maximumText), mean(meanText)
    {}

    /// For a textual sensor, which has no statistics.
    SensorValueDataModel(int sensorUid, std::string const& currentText) : uid(sensorUid), value(currentText) {}

    int uid;                              ///< as in SensorInfo
    std::string value;                    ///< the reading, without its unit
    std::string minimum;                  ///< smallest reading; empty for a textual sensor
    std::string maximum;                  ///< largest reading; empty for a textual sensor
    std::string mean;                     ///< empty for a textual sensor
    std::optional<double> number;         ///< the value, not rounded; nothing for a state in words
    std::optional<Statistics> statistics; ///< nothing for a textual sensor, and where none are kept
};

/// A sensor for the application; a copy that keeps nothing of the library alive.
struct SensorDataModel
{
    /// The range to draw a reading in: rounded, and never narrower than that of the sensor.
    struct Numeric
    {
        int minimum{0}; ///< lower end
        int maximum{0}; ///< upper end
    };

    /// Without a reading.
    SensorDataModel(bool isSelectable, int sensorUid, std::string const& sensorName, MeasurementUnit measurementUnit,
                    std::shared_ptr<Numeric> const& range)
        : SensorDataModel(isSelectable, sensorUid, sensorName, measurementUnit, nullptr, range)
    {}

    /// With a reading.
    SensorDataModel(bool isSelectable, int sensorUid, std::string const& sensorName, MeasurementUnit measurementUnit,
                    std::shared_ptr<SensorValueDataModel> const& reading, std::shared_ptr<Numeric> const& range)
        : selectable(isSelectable), uid(sensorUid), name(sensorName), unit(measurementUnit), numeric(range),
          value(reading)
    {}

    bool selectable;                             ///< false if the user may not choose the sensor
    int uid;                                     ///< as in SensorInfo
    std::string name;                            ///< title for people
    MeasurementUnit unit;                        ///< of reading and range
    std::shared_ptr<Numeric> numeric;            ///< null for a textual sensor
    std::shared_ptr<SensorValueDataModel> value; ///< null if none was taken
};

/// A parameter with its sensors for the application; a copy that keeps nothing of the library alive.
struct ParameterDataModel
{
    /// Fills all members.
    ParameterDataModel(ParameterIdentifier::Id parameterId, std::string const& parameterName,
                       std::vector<std::shared_ptr<SensorDataModel>> const& parameterSensors)
        : id(parameterId), name(parameterName), sensors(parameterSensors)
    {}

    ParameterIdentifier::Id id;                            ///< what the parameter is known by
    std::string name;                                      ///< title for people
    std::vector<std::shared_ptr<SensorDataModel>> sensors; ///< in the order of the parameter
};

} // namespace obd
