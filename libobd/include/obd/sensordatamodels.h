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
        double minimum{0.0};
        double maximum{0.0};
        double mean{0.0};
        unsigned int count{0}; ///< of the readings
    };

    SensorValueDataModel(int sensorUid, std::string const& currentText, std::string const& minimumText,
                         std::string const& maximumText, std::string const& meanText)
        : uid(sensorUid), value(currentText), minimum(minimumText), maximum(maximumText), mean(meanText)
    {}

    /// For a textual sensor, which has no statistics.
    SensorValueDataModel(int sensorUid, std::string const& currentText) : uid(sensorUid), value(currentText) {}

    int uid;
    std::string value;
    std::string minimum;
    std::string maximum;
    std::string mean;
    std::optional<double> number;         ///< the value, not rounded; nothing for a state in words
    std::optional<Statistics> statistics; ///< nothing for a textual sensor, and where none are kept
};

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

/// A parameter with its sensors for the application; a copy that keeps nothing of the library alive.
struct ParameterDataModel
{
    ParameterDataModel(ParameterIdentifier::Id parameterId, std::string const& parameterName,
                       std::vector<std::shared_ptr<SensorDataModel>> const& parameterSensors)
        : id(parameterId), name(parameterName), sensors(parameterSensors)
    {}

    ParameterIdentifier::Id id;
    std::string name;
    std::vector<std::shared_ptr<SensorDataModel>> sensors;
};

} // namespace obd
