#include "libvelmora/car/carcore.h"
#include "libvelmora/car/carsensors.h"

#include <velmora/car.h>
#include <velmora/vin.h>

#include <utility>

namespace velmora {

namespace {

CarOptions portOnly(std::string const& port)
{
    CarOptions options;
    options.port = port;
    return options;
}

} // namespace

Watch::Watch() = default;

Watch::Watch(std::shared_ptr<WatchState> state) : m_state(std::move(state)) {}

Watch::~Watch()
{
    end();
}

Watch::Watch(Watch&& other) noexcept = default;

Watch& Watch::operator=(Watch&& other) noexcept
{
    if (this != &other) {
        end();
        m_state = std::move(other.m_state);
    }
    return *this;
}

void Watch::end()
{
    if (m_state != nullptr) {
        std::exchange(m_state, nullptr)->end();
    }
}

Car::Car(std::string const& port) : Car(portOnly(port)) {}

Car::Car(CarOptions options) : m_core(std::make_shared<CarCore>(std::move(options))) {}

Car::~Car() = default;

std::vector<Reading> Car::read(std::vector<std::string> const& sensors)
{
    return m_core->call([&](Session& session) { return readOnce(session, pollSources(session, sensors)); });
}

Watch Car::watch(std::vector<std::string> const& sensors, OnReading onReading, OnLink onLink)
{
    return Watch(m_core->watch(sensors, std::move(onReading), std::move(onLink)));
}

std::unique_ptr<LiveReader> Car::live(LiveWish const& wish)
{
    return std::unique_ptr<LiveReader>(new LiveReader(m_core, m_core->live(wish)));
}

std::string Car::vehicleKey()
{
    return m_core->call([](Session& session) { return velmora::vehicleKey(vehicleVin(*session.proxy())); });
}

void Car::reconnect()
{
    m_core->reconnect();
}

void Car::keepAsking(std::vector<std::string> const& sensors)
{
    m_core->keepAsking(sensors);
}

void Car::check()
{
    m_core->check();
}

std::string Car::trouble()
{
    return m_core->trouble();
}

std::string Car::port()
{
    return m_core->port();
}

void Car::library(std::function<void(obd::IObdVelmora&)> const& function)
{
    m_core->call([&function](Session& session) { function(session.obd()); });
}

} // namespace velmora
