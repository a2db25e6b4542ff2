#pragma once

namespace obd {

inline constexpr unsigned char monitorStatusPid = 0x01;
inline constexpr unsigned char freezeFrameCodePid = 0x02;

/// The support masks, which every service has and which are asked for at the opening of a connection: each tells of so
/// many PIDs behind it.
inline constexpr int supportMaskStep = 0x20;
inline constexpr int lastSupportMask = 0xE0;

/// Up to it the library knows every PID, be it as a mask or a part of another one; above, those of its tables alone.
inline constexpr unsigned char lastListedPid = 0x7F;

/// Whether an identifier of any service is such a mask, and no thing to ask for.
constexpr bool isSupportMask(unsigned char id)
{
    return id % supportMaskStep == 0;
}

/// Whether a PID is read as a sensor. The support masks (0x00, 0x20, ...), the readiness and the trouble code of the
/// freeze frame have their own ways.
constexpr bool isSensor(unsigned char pid)
{
    return !isSupportMask(pid) && pid != monitorStatusPid && pid != freezeFrameCodePid;
}

/// Whether a PID is a fuel trim. On a vehicle of four banks some come with the value of a second bank, others without.
constexpr bool isFuelTrim(unsigned char pid)
{
    return (pid >= 0x06 && pid <= 0x09) || (pid >= 0x55 && pid <= 0x58);
}

} // namespace obd
