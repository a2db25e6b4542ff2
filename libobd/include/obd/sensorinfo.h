#pragma once

#include <obd/export.h>
#include <obd/measurementunit.h>
#include <obd/parameteridentifier.h>
#include <obd/unitsystem.h>

#include <map>
#include <string>

namespace obd {

/// What a sensor of a parameter can deliver: its identity, name, and unit and range in each unit system. Does not
/// change once its parameter is built, and may then be read from any thread.
class OBD_EXPORT SensorInfo
{
public:
    /// uid: see Pid2Uid. numeric: false if the readings are texts.
    SensorInfo(int uid, std::string const& description, bool numeric);
    virtual ~SensorInfo() = default;

    /// Says unit and range in one unit system, replacing what was said before. The range is for display: readings may
    /// leave it.
    void add(UnitSystem system, MeasurementUnit unit, double minimum, double maximum);

    int uid() const { return m_uid; }                              ///< see Pid2Uid
    ParameterIdentifier::Id pid() const { return Uid2Pid(m_uid); } ///< of its parameter
    std::string description() const { return m_description; }      ///< the sensor's name
    /// False if the readings are texts.
    bool isNumeric() const { return m_numeric; }

    /// UnitNone, and 0.0 to 0.0, in a unit system of which nothing was said.
    MeasurementUnit unit(UnitSystem system) const;
    double minValue(UnitSystem system) const; ///< lower end of the range
    double maxValue(UnitSystem system) const; ///< upper end of the range

private:
    struct Record
    {
        MeasurementUnit unit{UnitNone};
        double minimum{0.0};
        double maximum{0.0};
    };

    Record record(UnitSystem system) const;

    int m_uid;
    std::string m_description;
    bool m_numeric;
    std::map<UnitSystem, Record> m_units;
};

} // namespace obd
