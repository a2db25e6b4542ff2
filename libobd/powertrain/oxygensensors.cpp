#include "libobd/powertrain/oxygensensors.h"

namespace obd {
namespace {

// number: of the sensor, from 0.
std::string placeOf(int number, OxygenSensorBank arrangement)
{
    int const sensorsPerBank = arrangement == OxygenSensorBank::Pid1D ? 2 : 4;
    return "Bank " + std::to_string(number / sensorsPerBank + 1) + " - Sensor " +
           std::to_string(number % sensorsPerBank + 1);
}

} // namespace

std::string OxygenSensorBase::description(IEcu const& ecu)
{
    int const number = row().pid % 0x10 - 4; // the PIDs of each kind end in 4 to B
    return placeOf(number, ecu.oxygenSensorBanks()) + " (" + row().title + ")";
}

} // namespace obd
