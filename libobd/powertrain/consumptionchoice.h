#pragma once

#include <obd/iecu.h>

#include <memory>

namespace obd {

class PowertrainParameter;
class TableParameter;

// The models of the fuel consumption.
enum class ConsumptionKind : int
{
    None = 0,
    GasMaf = 1,
    GasMap = 2,
    Diesel = 3,
};

// What the user says about the vehicle, for its fuel consumption.
struct ConsumptionSettings
{
    double correctionFactor{1.0};
    double volumetricEfficiency{85.0}; // percent
    double engineDisplacement{2.0};    // litres
};

// The model that suits an ignition type, which may be the user's choice, and what the module reports.
ConsumptionKind chooseConsumption(IEcu const& ecu, IgnitionType ignitionType);

// The parameter of that model. Null if none suits.
std::shared_ptr<PowertrainParameter> createConsumption(IEcu const& ecu, IgnitionType ignitionType,
                                                       ConsumptionSettings const& settings);

// From where a module's air to fuel ratio can be read.
struct LambdaSource
{
    unsigned char pid;
    char const* text; // for the log
    // The parameter, whose first sensor is the equivalence ratio.
    std::unique_ptr<TableParameter> (*make)();
};

// The best source that the module has; null if it has none.
LambdaSource const* findLambdaSource(IEcu const& ecu);

// What is said about the source in the log.
char const* lambdaSourceText(LambdaSource const* source);

} // namespace obd
