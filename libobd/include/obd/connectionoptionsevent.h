#pragma once

namespace obd {

/// Which connection option was set. Fired also when the value is the same as before.
enum class ConnectionOptionsEvent : int
{
    BusChanged = 1,
    ProtocolChanged = 2,
    BluetoothDescriptorChanged = 3,
    SerialDescriptorChanged = 4,
    TcpDescriptorChanged = 5,
};

} // namespace obd
