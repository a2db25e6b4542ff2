#pragma once

#include <velmora/export.h>
#include <velmora/topics.h>

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

/// What the adapter says of itself. Empty texts and missing values were not told.
struct AdapterReport
{
    std::string device;         ///< name and version
    std::string description;    ///< its own words, such as "OBDII to RS232 Interpreter"
    std::string identification; ///< what its owner has stored in it
    std::optional<float> volts; ///< supply voltage, as the adapter measures it
};

/// The bus that the vehicle was found on.
struct ProtocolReport
{
    std::optional<int> number; ///< the adapter's, 1 to 9
    std::string name;          ///< the adapter's words
};

/// A sensor of service 01 as it stood while the report was made. Some are asked again behind all else.
struct LiveValue
{
    unsigned int pid;            ///< of service 01
    int part;                    ///< which of the PID's sensors, from 0 on
    std::string name;            ///< title for people
    std::string value;           ///< that of the last reading, in the unit system of the settings
    std::string unit;            ///< label; empty for none
    std::vector<double> samples; ///< all readings, metric whatever the unit system; none for a state in words
};

/// All that one control module told.
struct ModuleReport
{
    unsigned int id;                        ///< of the control module, such as 0x7E8
    std::string name;                       ///< such as "ECM"
    std::vector<unsigned int> supported;    ///< identifiers of service 01 that are sensors
    InfoReport info;                        ///< what it says of itself and the vehicle
    CodeReport codes;                       ///< lamp and trouble codes
    FreezeReport freeze;                    ///< frame 0
    ReadinessReport readiness;              ///< monitors of an emissions test
    MonitorsReport monitors;                ///< results of on-board tests
    OxygenReport oxygen;                    ///< oxygen sensors
    CountersReport counters;                ///< in-use counters
    TopicAnswer offers = TopicAnswer::Read; ///< how asking for what it supports of services 01 and 06 went
    std::vector<LiveValue> values = {};     ///< those of what it supports that findings need
};

/// Whether the module told all that it supports: else what is missing in its sets may only not have been read.
inline bool toldOffers(ModuleReport const& module)
{
    return module.offers == TopicAnswer::Read;
}

/// All that a vehicle told, as Car::report gives it. Plain data: copy it, keep it, hand it to any thread.
struct VehicleReport
{
    AdapterReport adapter;             ///< what the adapter says of itself
    ProtocolReport protocol;           ///< the bus
    std::vector<ModuleReport> modules; ///< in rising order of id

    /// The document that docs/json.md describes.
    VELMORA_EXPORT std::string toJson() const;
};

/// Adapter, bus, and for each module its codes: what one looks at first. toJson tells all.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, VehicleReport const& report);

} // namespace velmora
