#pragma once

namespace obd {

/// OBD services by their number (SAE J1979).
enum class ObdMode : int
{
    CurrentData = 1,
    FreezeFrame = 2,
    OxygenSensorTests = 5,
    MonitorTests = 6,
    SystemControl = 8,
    VehicleInformation = 9,
};

} // namespace obd
