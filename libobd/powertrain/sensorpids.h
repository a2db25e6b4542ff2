#pragma once

namespace obd {

inline constexpr unsigned char monitorStatusPid = 0x01;
inline constexpr unsigned char freezeFrameCodePid = 0x02;

// The support masks (0x00, 0x20, ...), the readiness and the trouble code of the freeze frame have their own ways.
constexpr bool isSensor(unsigned char pid)
{
    return (pid & 0x1FU) != 0 && pid != monitorStatusPid && pid != freezeFrameCodePid;
}

} // namespace obd
