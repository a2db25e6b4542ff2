#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// What a parameter is known by: the PID of services 01 and 02 for a parameter of the standard (ParameterIdentifier::Id
/// (0x0C) is the engine speed), and above their range the library's own derived parameters.
class OBD_EXPORT ParameterIdentifier
{
public:
    /// A PID by its number, or a derived parameter by its name.
    enum Id : int
    {
        FuelConsumption = 0xF0,
        BatteryVoltage = 0xF4,
        EnginePower = 0xF5,
        Torque = 0xF6,
        BoostPressure = 0xF7,
    };

    explicit ParameterIdentifier(int id) : m_id(static_cast<Id>(id)) {} ///< a PID, or a derived parameter's number
    explicit ParameterIdentifier(Id id) : m_id(id) {}                   ///< the same

    Id id() const { return m_id; } ///< as it was given
    /// The byte that stands in a request.
    unsigned char toOid() const { return static_cast<unsigned char>(m_id & 0xFF); }
    /// "$" and at least two upper-case hexadecimal digits, such as "$0C".
    std::string toString() const;

private:
    Id m_id;
};

/// A sensor's uid is ten times the id of its parameter plus its index within it, 0 to 9.
constexpr int Pid2Uid(int pid)
{
    return pid * 10;
}

constexpr int Pid2Uid(ParameterIdentifier::Id pid, int index)
{
    return pid * 10 + index;
}

constexpr int Pid2Uid(ParameterIdentifier::Id pid)
{
    return Pid2Uid(pid, 0);
}

constexpr ParameterIdentifier::Id Uid2Pid(int uid)
{
    return static_cast<ParameterIdentifier::Id>(uid / 10);
}

} // namespace obd
