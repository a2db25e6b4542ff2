#pragma once

#include "libobd/powertrain/samplelist.h"

#include <array>
#include <cstddef>
#include <optional>

namespace obd {

enum class ConsumptionInput : unsigned char
{
    Air, // the mass flow in g/s, or the manifold's pressure in kPa
    Load,
    Lambda,
    IntakeTemperature,
    Rpm,
    Speed,
};

// What a model of the fuel consumption knows of one module: the readings of its inputs, and the results over which the
// consumption is smoothed. All readings are taken at the time of the newest reading of the air.
class ConsumptionData
{
public:
    ConsumptionData();
    virtual ~ConsumptionData() = default;
    ConsumptionData(ConsumptionData const&) = default;
    ConsumptionData& operator=(ConsumptionData const&) = default;

    // A reading in its metric unit. Each one but those of the air makes a result, if the others allow one.
    void add(ConsumptionInput input, Sample const& sample);

    double mean() const { return m_results.mean(); } // litres per 100 km

protected:
    double air() const;
    // 1.0 while there are no two readings.
    double lambda() const;
    // Nothing while there are no two readings.
    std::optional<double> at(ConsumptionInput input) const;

private:
    // From the present readings, in litres per 100 km; nothing if one is missing.
    virtual std::optional<double> result() const = 0;
    // Over how many results the consumption is smoothed without a lambda; it takes one more with.
    virtual std::size_t window() const = 0;

    SamplePair const& pair(ConsumptionInput input) const { return m_inputs[static_cast<std::size_t>(input)]; }
    void append(double consumption);

    std::array<SamplePair, 6> m_inputs; // by ConsumptionInput
    SampleList m_results;
};

// A gasoline engine with a mass air flow sensor.
class GasConsumptionDataMaf : public ConsumptionData
{
    std::optional<double> result() const override;
    std::size_t window() const override { return 1; }
};

// A gasoline engine without one: what the cylinders take in follows from the manifold's pressure.
class GasConsumptionDataMap : public ConsumptionData
{
public:
    // The volumetric efficiency in percent, the displacement in litres.
    void setEngine(double efficiency, double displacement);

private:
    std::optional<double> result() const override;
    std::size_t window() const override { return 3; } // a round of readings makes three results

    double m_efficiency{0.0};
    double m_displacement{0.0};
};

// A diesel engine, which takes in more air than its fuel needs: the load tells how much of it counts.
class DieselConsumptionData : public ConsumptionData
{
    std::optional<double> result() const override;
    std::size_t window() const override { return 2; }
};

} // namespace obd
