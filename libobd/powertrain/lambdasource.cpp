#include "libobd/powertrain/lambdasource.h"

#include "libobd/powertrain/numericparameters.h"
#include "libobd/powertrain/oxygensensors.h"

namespace obd {
namespace {

template <typename Parameter>
std::unique_ptr<TableParameter> make()
{
    return std::make_unique<Parameter>(ObdMode::CurrentData, static_cast<unsigned char>(0));
}

// The best first: what is commanded is steadier than what a sensor sees.
constexpr LambdaSource sources[] = {
    {0x44, "Using Commanded FA ratio as lambda source", make<CommandedFar>},
    {0x24, "Using O2S ER-V as lambda source", make<OxygenSensorErvSensor1>},
    {0x34, "Using O2S ER-C as lambda source", make<OxygenSensor1Erc>},
};

} // namespace

LambdaSource const* findLambdaSource(IEcu const& ecu)
{
    for (LambdaSource const& source : sources) {
        if (ecu.isSupported(ObdMode::CurrentData, source.pid, 0)) {
            return &source;
        }
    }
    return nullptr;
}

char const* lambdaSourceText(LambdaSource const* source)
{
    return source != nullptr ? source->text : "No lambda source available";
}

} // namespace obd
