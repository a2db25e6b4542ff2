#pragma once

#include "libobd/powertrain/consumptiondata.h"
#include "libobd/powertrain/derivedparameter.h"
#include "libobd/powertrain/ecustore.h"

#include <memory>
#include <vector>

namespace obd {

// The fuel consumption, worked out from the air that the engine takes in. The models differ in what they need; see
// createConsumption for which one suits a vehicle.
class FuelConsumption : public DerivedParameter
{
public:
    // Litres per 100 km, or miles per gallon; 0.0 without results, and in miles per gallon for less than a litre.
    double consumption(IEcu const& ecu, UnitSystem system) const;

    // On what the model gives, 1.0 unless set. Before the first update.
    void setCorrectionFactor(double factor) { m_correctionFactor = factor; }

    // Reads the inputs one after the other; an input that can't be read is left out. Fails if none can.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    bool keepsHistory() const override { return true; }

protected:
    FuelConsumption();

    // In the order in which they are to be read, the air first.
    void addInput(ConsumptionInput input, std::unique_ptr<TableParameter> parameter);
    template <typename Parameter>
    void addInput(ConsumptionInput input)
    {
        addInput(input, std::make_unique<Parameter>(ObdMode::CurrentData, static_cast<unsigned char>(0)));
    }
    // Takes the best source that the module has, and says in the log which.
    void addLambda(IEcu const& ecu);

private:
    struct Input
    {
        ConsumptionInput input;
        std::unique_ptr<TableParameter> parameter;
    };

    // Whether the model suits a module.
    virtual bool suits(IEcu const& ecu) const = 0;
    virtual void feed(IEcu const& ecu, ConsumptionInput input, Sample const& sample) = 0;
    virtual double mean(IEcu const& ecu) const = 0; // litres per 100 km

    double value(IEcu const& ecu, UnitSystem system) const override { return consumption(ecu, system); }
    double convert(double litres, UnitSystem system) const;
    Inputs neededBy(IEcu const& ecu) const;

    std::vector<Input> m_inputs;
    double m_correctionFactor{1.0};
};

// Keeps the data of a model.
template <typename Data>
class ConsumptionModel : public FuelConsumption
{
public:
    // Of all objects of the class.
    void clear() override { s_history.clear(); }

protected:
    virtual void prepare(Data& /*data*/) const {}

private:
    void feed(IEcu const& ecu, ConsumptionInput input, Sample const& sample) override
    {
        s_history.change(ecu, [this, input, &sample](Data& data) {
            prepare(data);
            data.add(input, sample);
        });
    }
    double mean(IEcu const& ecu) const override
    {
        return s_history.read(ecu, [](Data const& data) { return data.mean(); });
    }

    inline static EcuHistory<Data> s_history;
};

// For gasoline engines with a mass air flow sensor.
class GasConsumption : public ConsumptionModel<GasConsumptionDataMaf>
{
public:
    explicit GasConsumption(IEcu const& ecu);

    // Whether the module reports what is needed.
    static bool isValid(IEcu const& ecu);

private:
    bool suits(IEcu const& ecu) const override { return isValid(ecu); }
};

// For gasoline engines without one, by the pressure and temperature in the manifold.
class GasConsumptionMap : public ConsumptionModel<GasConsumptionDataMap>
{
public:
    explicit GasConsumptionMap(IEcu const& ecu);

    // Whether the module reports what is needed.
    static bool isValid(IEcu const& ecu);

    // Before the first update. Percent, 85 unless set.
    void setVolumetricEfficiency(double percent) { m_volumetricEfficiency = percent; }
    // Before the first update. Litres, 2 unless set.
    void setEngineDisplacement(double litres) { m_engineDisplacement = litres; }

private:
    bool suits(IEcu const& ecu) const override { return isValid(ecu); }
    void prepare(GasConsumptionDataMap& data) const override
    {
        data.setEngine(m_volumetricEfficiency, m_engineDisplacement);
    }

    double m_volumetricEfficiency{85.0};
    double m_engineDisplacement{2.0};
};

// For diesel engines.
class DieselConsumption : public ConsumptionModel<DieselConsumptionData>
{
public:
    explicit DieselConsumption(IEcu const& ecu);

    // Whether the module reports what is needed.
    static bool isValid(IEcu const& ecu);

private:
    bool suits(IEcu const& ecu) const override { return isValid(ecu); }
};

} // namespace obd
