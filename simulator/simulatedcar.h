#pragma once

#include "simulator/adapter/adapter.h"
#include "simulator/control/control.h"
#include "simulator/control/scenario.h"
#include "simulator/fault.h"

namespace obdsim {

/// A whole simulation: car, adapter, what goes wrong on the way, the line to the host, and the scenario that changes it
/// all while it runs.
class SimulatedCar : public IPeer
{
public:
    SimulatedCar(VehicleData const& vehicle, AdapterProfile profile, FaultPlan const& plan,
                 std::vector<ScenarioLine> scenario = {});

    void receive(std::string_view bytes) override;
    std::optional<Time> nextOutput() const override;
    std::optional<Time> nextWake() const override;
    std::string advanceTo(Time time) override;
    Time now() const override;
    void connect() override;
    bool linkIsUp() const override;

    /// Follows a control line at once; see Control::follow().
    std::string control(std::string const& line);

    /// What control() has changed so far, with its times: a scenario that does the same again.
    std::vector<ScenarioLine> const& typed() const;

    RequestLog const& requests() const;

private:
    std::shared_ptr<Vehicle> m_vehicle;
    std::shared_ptr<Adapter> m_adapter;
    std::shared_ptr<FaultyPeer> m_wire;
    std::shared_ptr<IPeer> m_peer; ///< what the host meets
    Control m_control;
    std::vector<ScenarioLine> m_scenario;
    std::size_t m_next = 0; ///< line of it
    std::vector<ScenarioLine> m_typed;
};

} // namespace obdsim
