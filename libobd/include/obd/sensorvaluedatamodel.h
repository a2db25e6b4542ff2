#pragma once

#include <string>

namespace obd {

/// A reading with its statistics as texts, for the application; a copy that keeps nothing alive.
struct SensorValueDataModel
{
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
};

} // namespace obd
