#pragma once

#include "libvelmora/dash/dashdesk.h"
#include "libvelmora/watch/sessioncar.h"

namespace velmora {

// Does for the pages what they ask of the car, between two steps of the watch and on its thread.
class DashClerk
{
public:
    // Both must outlive it. name: of the vehicle, where its number is not told.
    DashClerk(SessionCar& car, DashDesk& desk, std::string name) : m_car(car), m_desk(desk), m_name(std::move(name)) {}

    struct Outcome
    {
        bool sensors = false; // others are read from now on
        bool cleared = false; // codes were cleared
    };
    // Throws Error of kind Interrupted; all else becomes an answer.
    Outcome serve();

private:
    void attempt(DashAsk const& ask, Outcome& outcome);
    void introduce();
    void serveOne(DashAsk const& ask, Outcome& outcome);
    Json read(std::string const& topic);
    Json readCodes();
    Json clear();
    Json talk(std::string const& command);
    void chooseSensors(std::string const& ids);
    Json timeRuns(std::string const& wish);

    SessionCar& m_car;
    DashDesk& m_desk;
    std::string const m_name;
    unsigned int m_visit = 0; // the connection that was introduced
    std::vector<SensorEntry> m_offered;
};

} // namespace velmora
