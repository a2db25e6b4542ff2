#pragma once

#include "simulator/car/drivemodel.h"

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace obdsim {

/// The drive of one car: that of the model, with what has been changed by hand since.
class Drive
{
public:
    explicit Drive(EngineData const& engine);

    DriveState at(Time time) const;

    /// As if nobody had touched anything: for what a module has kept of a moment.
    DriveState planned(Time time) const;

    /// The engine stands still until it is started; the drive then begins anew, with the temperatures, the fuel and the
    /// odometer that it has reached.
    void stopEngine(Time now);
    void startEngine(Time now);

    /// Keeps a value whatever the drive does; false if there is none of that name. Nothing lets it go.
    bool hold(std::string const& name, std::optional<double> value);

    /// A value of a moment by the name that hold() has for it; nothing for any other name.
    static std::optional<double> value(DriveState const& state, std::string const& name);

    /// The names of hold().
    static std::vector<std::string> names();

private:
    void addColumns(DriveState& state) const;

    EngineData m_planned;
    EngineData m_engine; ///< of the drive since the last start
    Time m_start{};
    double m_secondsBefore = 0; ///< of the drives before
    double m_kilometresBefore = 0;
    std::optional<Time> m_stoppedAt;
    std::map<std::string, double> m_held;
};

} // namespace obdsim
