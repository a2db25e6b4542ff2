#include "simulator/simulatedcar.h"

#include "simulator/linerate.h"

#include <algorithm>

namespace obdsim {

namespace {

std::shared_ptr<IPeer> behindLine(std::shared_ptr<IPeer> peer, int baud)
{
    return baud == 0 ? peer : std::make_shared<LineRate>(std::move(peer), baud);
}

} // namespace

SimulatedCar::SimulatedCar(VehicleData const& vehicle, AdapterProfile profile, FaultPlan const& plan,
                           std::vector<ScenarioLine> scenario)
    : m_vehicle(std::make_shared<Vehicle>(vehicle)),
      m_adapter(std::make_shared<Adapter>(std::move(profile), m_vehicle)),
      m_wire(std::make_shared<FaultyPeer>(m_adapter, plan)),
      m_peer(behindLine(m_wire, m_adapter->profile().timing.baud)),
      m_control(*m_vehicle, *m_wire, m_adapter->requests()), m_scenario(std::move(scenario))
{}

void SimulatedCar::receive(std::string_view bytes)
{
    m_peer->receive(bytes);
}

std::optional<Time> SimulatedCar::nextOutput() const
{
    return m_peer->nextOutput();
}

std::optional<Time> SimulatedCar::nextWake() const
{
    auto const output = nextOutput();
    if (m_next == m_scenario.size()) {
        return output;
    }
    return output ? std::min(*output, m_scenario[m_next].time) : m_scenario[m_next].time;
}

std::string SimulatedCar::advanceTo(Time time)
{
    std::string said;
    for (; m_next < m_scenario.size() && m_scenario[m_next].time <= time; ++m_next) {
        said += m_peer->advanceTo(m_scenario[m_next].time);
        try {
            m_control.follow(m_scenario[m_next].command, now());
        } catch (ControlError const&) {
            // What was typed meanwhile is in its way, such as an ignition that is off.
        }
    }
    return said + m_peer->advanceTo(time);
}

Time SimulatedCar::now() const
{
    return m_peer->now();
}

void SimulatedCar::connect()
{
    m_peer->connect();
}

bool SimulatedCar::linkIsUp() const
{
    return m_peer->linkIsUp();
}

std::string SimulatedCar::control(std::string const& line)
{
    std::string answer = m_control.follow(line, now());
    if (Control::changesSomething(line)) {
        m_typed.push_back({now(), line});
    }
    return answer;
}

std::vector<ScenarioLine> const& SimulatedCar::typed() const
{
    return m_typed;
}

RequestLog const& SimulatedCar::requests() const
{
    return m_adapter->requests();
}

} // namespace obdsim
