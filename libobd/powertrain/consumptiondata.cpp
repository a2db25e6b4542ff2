#include "libobd/powertrain/consumptiondata.h"

#include <algorithm>
#include <cmath>

namespace obd {
namespace {

struct Fuel
{
    double stoichiometricRatio; // air to fuel, by mass
    double density;             // kg/l
};

constexpr Fuel gasoline{14.7, 0.745};
constexpr Fuel diesel{14.5, 0.832};

constexpr double idleConsumption = 0.5; // what is shown for a vehicle that hardly moves
constexpr double idleSpeed = 2.0;       // km/h
constexpr double lowestSpeed = 5.0;     // km/h; so that creeping along does not read as a huge consumption
constexpr double idleLoad = 2.0;        // percent

constexpr double molarMassOfAir = 28.966; // g/mol
constexpr double gasConstant = 8.3144621; // J/(mol K)
constexpr double celsiusToKelvin = 273.15;
constexpr double intakesPerRevolution = 0.5; // of a four-stroke engine's displacement

// Litres per 100 km by the air that is burnt, in g/s.
double consumptionOf(double air, double lambda, Fuel const& fuel, double loadFactor, double speed)
{
    return air / (lambda * fuel.stoichiometricRatio * fuel.density) * loadFactor / std::max(lowestSpeed, speed) * 360.0;
}

double gasConsumption(double air, double lambda, double speed)
{
    return speed < idleSpeed ? idleConsumption : consumptionOf(air, lambda, gasoline, 1.0, speed);
}

} // namespace

ConsumptionData::ConsumptionData()
{
    m_inputs[static_cast<std::size_t>(ConsumptionInput::Lambda)] = SamplePair(1.0);
}

void ConsumptionData::add(ConsumptionInput input, Sample const& sample)
{
    m_inputs[static_cast<std::size_t>(input)].add(sample);
    if (input == ConsumptionInput::Air) {
        return;
    }
    if (std::optional<double> const consumption = result()) {
        append(*consumption);
    }
}

void ConsumptionData::append(double consumption)
{
    // No air is no fuel even where lambda is 0, which makes the quotient of both no number.
    m_results.add({pair(ConsumptionInput::Air).newest().time, consumption > 0.0 ? consumption : 0.0});
    // One at the most, so that a list which has grown stays so when lambda comes to 1.0.
    if (m_results.size() > window() + (lambda() == 1.0 ? 0 : 1)) {
        m_results.dropOldest();
    }
}

double ConsumptionData::air() const
{
    return pair(ConsumptionInput::Air).newest().value;
}

double ConsumptionData::lambda() const
{
    return at(ConsumptionInput::Lambda).value_or(1.0);
}

std::optional<double> ConsumptionData::at(ConsumptionInput input) const
{
    return pair(input).at(pair(ConsumptionInput::Air).newest().time);
}

std::optional<double> GasConsumptionDataMaf::result() const
{
    std::optional<double> const speed = at(ConsumptionInput::Speed);
    if (!speed) {
        return std::nullopt;
    }
    return gasConsumption(air(), lambda(), *speed);
}

void GasConsumptionDataMap::setEngine(double efficiency, double displacement)
{
    m_efficiency = efficiency;
    m_displacement = displacement;
}

std::optional<double> GasConsumptionDataMap::result() const
{
    std::optional<double> const speed = at(ConsumptionInput::Speed);
    std::optional<double> const rpm = at(ConsumptionInput::Rpm);
    std::optional<double> const temperature = at(ConsumptionInput::IntakeTemperature);
    if (!speed || !rpm || !temperature) {
        return std::nullopt;
    }
    double const airFlow = (*rpm / 60.0) * air() / (*temperature + celsiusToKelvin) * (m_efficiency / 100.0) *
                           (m_displacement * intakesPerRevolution) * molarMassOfAir / gasConstant;
    return gasConsumption(airFlow, lambda(), *speed);
}

std::optional<double> DieselConsumptionData::result() const
{
    std::optional<double> const speed = at(ConsumptionInput::Speed);
    std::optional<double> const load = at(ConsumptionInput::Load);
    if (!speed || !load) {
        return std::nullopt;
    }
    if (std::fabs(*load) < 1.0) {
        return 0.0;
    }
    if (*load < idleLoad || *speed < idleSpeed) {
        return idleConsumption;
    }
    return consumptionOf(air(), lambda(), diesel, *load / 100.0, *speed);
}

} // namespace obd
