#pragma once

#include <obd/measurementunit.h>
#include <velmora/export.h>
#include <velmora/topics.h>
#include <velmora/units.h>

#include <optional>
#include <string>
#include <vector>

namespace velmora {

/// What one control module offers by the services of OBD; see Car::offers.
struct ModuleOffers
{
    /// The identifiers that a module says it supports of one service.
    struct Service
    {
        int number;                            ///< 1, 6, 8 or 9
        std::vector<unsigned int> identifiers; ///< rising, without the markers of ranges
        TopicAnswer answer;                    ///< how asking went: what was not read may be missing
    };

    /// One value of a parameter.
    struct Value
    {
        int uid;                    ///< the core's number of the sensor
        std::string name;           ///< title for people
        std::string unit;           ///< label; empty for none
        std::optional<int> minimum; ///< of its range, in that unit; nothing for a text
        std::optional<int> maximum; ///< as minimum
    };

    /// A parameter of service 01 that the library decodes.
    struct Parameter
    {
        unsigned int pid;          ///< of service 01
        std::string name;          ///< title for people
        bool offered;              ///< by this module; always true unless all were asked for
        std::vector<Value> values; ///< what it is made of
    };

    /// A value by a published layout, which signals of one's own can replace.
    struct LaterValue
    {
        std::string sensor;   ///< the signal's id
        std::string name;     ///< title for people
        std::string unit;     ///< label; empty for none
        std::string standing; ///< how well the layout is known, in a word
    };

    /// A parameter that the module offers and the library itself does not decode.
    struct LaterParameter
    {
        unsigned int pid;               ///< of service 01
        std::string name;               ///< by SAE J1979, or "PID C2"
        std::vector<LaterValue> values; ///< none where no layout is known
    };

    unsigned int id;                     ///< such as 0x7E8
    std::string name;                    ///< such as "ECM"
    std::string description;             ///< such as "Engine Control"
    std::vector<Service> services;       ///< 01, 06, 08 and 09
    std::vector<Parameter> parameters;   ///< by PID
    std::vector<LaterParameter> further; ///< by PID
};

/// A short name of a PID of service 01, as people type it.
struct SensorName
{
    int pid;          ///< of service 01
    char const* name; ///< capitals, digits and underscores
};

/// All names, by PID; the first one of a PID is the one that messages use.
VELMORA_EXPORT std::vector<SensorName> const& sensorNames();
/// Names that other tools' users know, by PID: understood, but never written, so that keys stay as they are.
VELMORA_EXPORT std::vector<SensorName> const& sensorAliases();
/// The first name of a PID, empty for one without.
VELMORA_EXPORT std::string sensorNameOf(int pid);
/// The key of a PID for programs: its first name, or "PID_C2".
VELMORA_EXPORT std::string sensorKey(int pid);

/// The label of a sensor's unit, as the core's descriptors tell both, in the units that people are shown: "km/h",
/// "mpg (UK)"; empty for none. Never null.
VELMORA_EXPORT char const* sensorUnit(int uid, MeasurementUnit unit, Units units);

} // namespace velmora
