#pragma once

#include <obd/export.h>

namespace obd {

/// The arrangement of the oxygen sensors: that of PID 0x13 (two banks of four) or PID 0x1D (four banks of two).
enum class OxygenSensorBank : int
{
    None = 0,
    Pid13 = 1,
    Pid1D = 2
};

/// An oxygen sensor by bank and position.
enum class OxygenSensorLocation : int
{
    Bank1Sensor1 = 0,
    Bank1Sensor2 = 1,
    Bank1Sensor3 = 2,
    Bank1Sensor4 = 3,
    Bank2Sensor1 = 4,
    Bank2Sensor2 = 5,
    Bank2Sensor3 = 6,
    Bank2Sensor4 = 7,
    Bank3Sensor1 = 8,
    Bank3Sensor2 = 9,
    Bank4Sensor1 = 10,
    Bank4Sensor2 = 11,
};

/// The byte that names the sensor in a service 05 request (SAE J1979), 0 for a value outside the enumeration. Sensors
/// of the two arrangements share bytes: an ECU uses one arrangement or the other.
OBD_EXPORT unsigned char oxygenSensorByte(OxygenSensorLocation location);

} // namespace obd
