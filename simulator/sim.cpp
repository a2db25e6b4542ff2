#include "simulator/server.h"
#include "simulator/simulatedcar.h"
#include "simulator/simulation.h"

#include <obdsim/sim.h>

#include <future>
#include <mutex>

namespace velmora::sim {

namespace {

/// Runs `work`, with the simulator's errors as those of the public face.
template <class Work>
auto translated(Work const& work)
{
    try {
        return work();
    } catch (obdsim::SimulatorError const& error) {
        throw Error(error.what());
    }
}

} // namespace

class Simulator::Impl
{
public:
    explicit Impl(Options const& options)
        : m_car(
              obdsim::simulateCar({options.vehicle, options.adapter, options.faults, options.scenario, options.drive}))
    {}

    /// Works on the car: on the server's thread while it serves.
    template <class Work>
    auto with(Work const& work)
    {
        std::lock_guard<std::mutex> const lock(m_mutex);
        if (!m_server) {
            return work(*m_car);
        }
        std::packaged_task<decltype(work(*m_car))()> task([&] { return work(*m_car); });
        m_server->perform([&task] { task(); });
        return task.get_future().get();
    }

    std::string serve(std::unique_ptr<obdsim::IServer> server)
    {
        std::lock_guard<std::mutex> const lock(m_mutex);
        m_server = std::move(server);
        m_server->start();
        return m_server->address();
    }

    void stop()
    {
        std::lock_guard<std::mutex> const lock(m_mutex);
        m_server.reset();
    }

    std::shared_ptr<obdsim::SimulatedCar> const& car() const { return m_car; }

private:
    std::shared_ptr<obdsim::SimulatedCar> m_car;
    std::mutex m_mutex; ///< guards m_server, and the car while nothing serves it
    std::unique_ptr<obdsim::IServer> m_server;
};

Simulator::Simulator(Options const& options) : m_impl(translated([&] { return std::make_unique<Impl>(options); })) {}

Simulator::~Simulator() = default;
Simulator::Simulator(Simulator&&) noexcept = default;
Simulator& Simulator::operator=(Simulator&&) noexcept = default;

void Simulator::send(std::string_view bytes)
{
    m_impl->with([&](obdsim::SimulatedCar& car) { car.receive(bytes); });
}

std::string Simulator::advance(Time by)
{
    return m_impl->with([&](obdsim::SimulatedCar& car) { return car.advanceTo(car.now() + by); });
}

std::optional<Time> Simulator::nextOutput() const
{
    return m_impl->with([](obdsim::SimulatedCar& car) { return car.nextOutput(); });
}

std::string Simulator::ask(std::string_view line)
{
    return m_impl->with([&](obdsim::SimulatedCar& car) {
        car.receive(std::string(line) + "\r");
        std::string text;
        while (auto const next = car.nextOutput()) {
            text += car.advanceTo(*next);
        }
        return text;
    });
}

Time Simulator::now() const
{
    return m_impl->with([](obdsim::SimulatedCar& car) { return car.now(); });
}

bool Simulator::linkIsUp() const
{
    return m_impl->with([](obdsim::SimulatedCar& car) { return car.linkIsUp(); });
}

std::string Simulator::control(std::string const& line)
{
    return translated([&] { return m_impl->with([&](obdsim::SimulatedCar& car) { return car.control(line); }); });
}

std::string Simulator::scenario() const
{
    return m_impl->with([](obdsim::SimulatedCar& car) { return obdsim::formatScenario(car.typed()); });
}

std::vector<Request> Simulator::requests() const
{
    return m_impl->with([](obdsim::SimulatedCar& car) {
        std::vector<Request> all;
        for (auto const& each : car.requests().entries()) {
            all.push_back({each.time, each.text});
        }
        return all;
    });
}

std::uint64_t Simulator::count(std::string_view text) const
{
    return m_impl->with([&](obdsim::SimulatedCar& car) {
        auto const found = car.requests().counts().find(std::string(text));
        return found == car.requests().counts().end() ? std::uint64_t{0} : found->second;
    });
}

std::string Simulator::serveTcp(std::uint16_t port)
{
    return translated([&] { return m_impl->serve(obdsim::serveTcp(m_impl->car(), "127.0.0.1", port)); });
}

std::string Simulator::servePseudoTerminal()
{
    return translated([&] { return m_impl->serve(obdsim::servePseudoTerminal(m_impl->car())); });
}

void Simulator::stop()
{
    m_impl->stop();
}

std::vector<std::string> vehicles()
{
    return obdsim::simulatedVehicles();
}

std::vector<std::string> adapters()
{
    return obdsim::simulatedAdapters();
}

} // namespace velmora::sim
