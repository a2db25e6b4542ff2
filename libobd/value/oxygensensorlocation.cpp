#include <obd/oxygensensorlocation.h>

namespace obd {

unsigned char oxygenSensorByte(OxygenSensorLocation location)
{
    struct Row
    {
        OxygenSensorLocation location;
        unsigned char byte;
    };
    using enum OxygenSensorLocation;
    static constexpr Row rows[] = {
        {Bank1Sensor1, 0x01}, {Bank1Sensor2, 0x02}, {Bank1Sensor3, 0x04}, {Bank1Sensor4, 0x08},
        {Bank2Sensor1, 0x10}, {Bank2Sensor2, 0x20}, {Bank2Sensor3, 0x40}, {Bank2Sensor4, 0x80},
        {Bank3Sensor1, 0x10}, {Bank3Sensor2, 0x20}, {Bank4Sensor1, 0x40}, {Bank4Sensor2, 0x80},
    };
    for (Row const& row : rows) {
        if (row.location == location) {
            return row.byte;
        }
    }
    return 0;
}

} // namespace obd
