#pragma once

#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantities.h"
#include "libobd/powertrain/tableparameter.h"

#include <type_traits>

namespace obd {

// An oxygen sensor. The PIDs of each kind, eight in a row, count the sensors; the place of a numbered sensor depends on
// the arrangement of the vehicle's sensors, as the module tells it. The title of the row is the kind of the sensor.
class OxygenSensorBase : public TableParameter
{
public:
    using TableParameter::TableParameter;

    // Such as "Bank 2 - Sensor 1 (O2S)".
    std::string description(IEcu const& ecu) override;
};

// A narrow range sensor, whose voltage jumps at lambda 1, with the trim that follows it.
class OxygenSensor : public OxygenSensorBase
{
public:
    using OxygenSensorBase::OxygenSensorBase;
};

// A wide range sensor that tells equivalence ratio and voltage.
class OxygenSensorErv : public OxygenSensorBase
{
public:
    using OxygenSensorBase::OxygenSensorBase;
};

// A wide range sensor that tells equivalence ratio and current.
class OxygenSensorErc : public OxygenSensorBase
{
public:
    using OxygenSensorBase::OxygenSensorBase;
};

// clang-format off
constexpr ParameterRow narrowRow(int pid)
{
    return {pid, 2, 1, "O2S", {
        {"Oxygen Sensor Output Voltage", always, byteAt(0), formula::fiveThousandths, &quantities::narrowVoltage},
        {"Short Term Fuel Trim",         always, byteAt(1), formula::sensorTrim,      &quantities::trim}}};
}

constexpr ParameterRow wideVoltageRow(int pid)
{
    return {pid, 4, 2, "wide range O2S", {
        {"Equivalence Ratio (lambda)", always, wordAt(0), formula::equivalenceRatio,    &quantities::equivalenceRatio},
        {"Oxygen Sensor Voltage",      always, wordAt(2), formula::oxygenSensorVoltage, &quantities::wideVoltage}}};
}

constexpr ParameterRow wideCurrentRow(int pid)
{
    return {pid, 4, 2, "wide range O2S", {
        {"Equivalence Ratio (lambda)", always, wordAt(0), formula::equivalenceRatio,    &quantities::equivalenceRatio},
        {"Oxygen Sensor Current",      always, wordAt(2), formula::oxygenSensorCurrent, &quantities::wideCurrent}}};
}

inline constexpr ParameterRow oxygenSensorRows[] = {
    narrowRow(0x14), narrowRow(0x15), narrowRow(0x16), narrowRow(0x17),
    narrowRow(0x18), narrowRow(0x19), narrowRow(0x1A), narrowRow(0x1B),
    wideVoltageRow(0x24), wideVoltageRow(0x25), wideVoltageRow(0x26), wideVoltageRow(0x27),
    wideVoltageRow(0x28), wideVoltageRow(0x29), wideVoltageRow(0x2A), wideVoltageRow(0x2B),
    wideCurrentRow(0x34), wideCurrentRow(0x35), wideCurrentRow(0x36), wideCurrentRow(0x37),
    wideCurrentRow(0x38), wideCurrentRow(0x39), wideCurrentRow(0x3A), wideCurrentRow(0x3B),
};
// clang-format on
static_assert(pidsRise(oxygenSensorRows), "PIDs must rise, none twice");
static_assert(allHoldTheirFields(oxygenSensorRows));

template <typename Base, int id>
using OxygenSensorParameter = RowParameter<Base, oxygenSensorRows, id>;

template <int id>
struct ParameterClass<oxygenSensorRows, id>
{
    static constexpr int firstWideVoltage = 0x24;
    static constexpr int firstWideCurrent = 0x34;
    using Wide = std::conditional_t<(id < firstWideCurrent), OxygenSensorErv, OxygenSensorErc>;
    using Type = OxygenSensorParameter<std::conditional_t<(id < firstWideVoltage), OxygenSensor, Wide>, id>;
};

using OxygenSensor1Bank1 = OxygenSensorParameter<OxygenSensor, 0x14>;
using OxygenSensor2Bank1 = OxygenSensorParameter<OxygenSensor, 0x15>;
using OxygenSensor3Bank1 = OxygenSensorParameter<OxygenSensor, 0x16>;
using OxygenSensor4Bank1 = OxygenSensorParameter<OxygenSensor, 0x17>;
using OxygenSensor1Bank2 = OxygenSensorParameter<OxygenSensor, 0x18>;
using OxygenSensor2Bank2 = OxygenSensorParameter<OxygenSensor, 0x19>;
using OxygenSensor3Bank2 = OxygenSensorParameter<OxygenSensor, 0x1A>;
using OxygenSensor4Bank2 = OxygenSensorParameter<OxygenSensor, 0x1B>;

using OxygenSensorErvSensor1 = OxygenSensorParameter<OxygenSensorErv, 0x24>;
using OxygenSensorErvSensor2 = OxygenSensorParameter<OxygenSensorErv, 0x25>;
using OxygenSensorErvSensor3 = OxygenSensorParameter<OxygenSensorErv, 0x26>;
using OxygenSensorErvSensor4 = OxygenSensorParameter<OxygenSensorErv, 0x27>;
using OxygenSensorErvSensor5 = OxygenSensorParameter<OxygenSensorErv, 0x28>;
using OxygenSensorErvSensor6 = OxygenSensorParameter<OxygenSensorErv, 0x29>;
using OxygenSensorErvSensor7 = OxygenSensorParameter<OxygenSensorErv, 0x2A>;
using OxygenSensorErvSensor8 = OxygenSensorParameter<OxygenSensorErv, 0x2B>;

using OxygenSensor1Erc = OxygenSensorParameter<OxygenSensorErc, 0x34>;
using OxygenSensor2Erc = OxygenSensorParameter<OxygenSensorErc, 0x35>;
using OxygenSensor3Erc = OxygenSensorParameter<OxygenSensorErc, 0x36>;
using OxygenSensor4Erc = OxygenSensorParameter<OxygenSensorErc, 0x37>;
using OxygenSensor5Erc = OxygenSensorParameter<OxygenSensorErc, 0x38>;
using OxygenSensor6Erc = OxygenSensorParameter<OxygenSensorErc, 0x39>;
using OxygenSensor7Erc = OxygenSensorParameter<OxygenSensorErc, 0x3A>;
using OxygenSensor8Erc = OxygenSensorParameter<OxygenSensorErc, 0x3B>;

} // namespace obd
