#pragma once

#include "simulator/car/vehicle.h"
#include "simulator/control/controlline.h"
#include "simulator/faultypeer.h"
#include "simulator/requestlog.h"

#include <memory>

namespace obdsim {

/// Changes a car while it runs, by lines such as "ignition off". The forms are one table, which help prints.
class Control
{
public:
    /// All must outlive this.
    Control(Vehicle& vehicle, FaultyPeer& wire, RequestLog const& requests);

    /// Follows a line at `now`. Returns what there is to tell, lines ended by LF; nothing for most. Throws
    /// ControlError.
    std::string follow(std::string const& line, Time now);

    /// Throws ControlError if the line has no form. The words that only a car can judge are taken.
    static void check(std::string const& line);

    /// What a line only asks, such as "requests", is no part of a scenario.
    static bool changesSomething(std::string const& line);

    /// All forms with what they do.
    static std::vector<ControlForm> forms();

private:
    using Words = std::vector<std::string>;
    struct Command
    {
        ControlForm form;
        bool changes;
        std::string (Control::*follow)(Words const& words, Time now);
    };
    static std::vector<Command> const& commands();
    static Command const& find(Words const& words);

    std::string ignition(Words const& words, Time now);
    std::string engine(Words const& words, Time now);
    std::string set(Words const& words, Time now);
    std::string clear(Words const& words, Time now);
    std::string value(Words const& words, Time now);
    std::string hold(Words const& words, Time now);
    std::string voltage(Words const& words, Time now);
    std::string fault(Words const& words, Time now);
    std::string loss(Words const& words, Time now);
    std::string module(Words const& words, Time now);
    std::string requests(Words const& words, Time now);
    std::string help(Words const& words, Time now);
    Module& moduleAt(Words const& words, std::size_t index);

    Vehicle& m_vehicle;
    FaultyPeer& m_wire;
    RequestLog const& m_requests;
};

} // namespace obdsim
