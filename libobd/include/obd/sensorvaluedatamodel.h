#pragma once

#include <optional>
#include <string>

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

} // namespace obd
