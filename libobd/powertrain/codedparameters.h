#pragma once

#include "libobd/powertrain/codedstate.h"
#include "libobd/powertrain/statetexts.h"
#include "libobd/powertrain/tableparameter.h"

namespace obd {
namespace coded {

// The position of the one set bit; nothing, and a log line, if it isn't one.
formula::Decoded fuelSystem(formula::Raw raw, IEcu const& ecu);

// The codes 14 to 17; 0 for all others, which are reserved.
constexpr formula::Decoded emissionStandard(formula::Raw raw, IEcu const& /*ecu*/)
{
    return raw >= 14 && raw <= 17 ? raw : 0;
}
std::string emissionStandardText(unsigned int code);

constexpr formula::Decoded secondaryAir(formula::Raw raw, IEcu const& /*ecu*/)
{
    unsigned int const reserved = 4;
    unsigned int const state = lowestBit(raw);
    return state < reserved ? state : reserved;
}

constexpr formula::Decoded controlArea(formula::Raw raw, IEcu const& /*ecu*/)
{
    return lowestBit(raw);
}

// The two states of a bit, counted from 1.
template <unsigned int position>
constexpr formula::Decoded inputOutput(formula::Raw raw, IEcu const& /*ecu*/)
{
    return (raw >> position & 1U) + 1U;
}

} // namespace coded

namespace states {

inline constexpr Quantity fuelSystem = coded::states(coded::textOf<texts::fuelSystem>);
inline constexpr Quantity secondaryAir = coded::states(coded::textOf<texts::secondaryAir>);
inline constexpr Quantity saeStandard = coded::states(coded::textOf<texts::saeStandard>);
inline constexpr Quantity auxiliaryInput = coded::states(coded::textOf<texts::auxiliaryInput>);
inline constexpr Quantity fuelType = coded::states(coded::textOf<texts::fuelType>);
inline constexpr Quantity emissionStandard = coded::states(coded::emissionStandardText);
inline constexpr Quantity powerTakeOff = coded::states(coded::textOf<texts::powerTakeOff>);
inline constexpr Quantity autoTransmission = coded::states(coded::textOf<texts::autoTransmission>);
inline constexpr Quantity manualTransmission = coded::states(coded::textOf<texts::manualTransmission>);
inline constexpr Quantity glowPlugLamp = coded::states(coded::textOf<texts::glowPlugLamp>);
inline constexpr Quantity controlStatus = coded::states(coded::textOf<texts::controlStatus>);
inline constexpr Quantity controlArea = coded::states(coded::textOf<texts::controlArea>);

} // namespace states

// The row of a parameter with one byte for one state. A module that has not answered has none.
constexpr ParameterRow singleState(int pid, Formula formula, Quantity const& states, char const* title)
{
    return {pid, 1, 0, title, {{nullptr, always, byteAt(0), formula, &states}}};
}

// The PIDs that decode to states, in PID order.
// clang-format off
inline constexpr ParameterRow codedRows[] = {
    {0x03, 2, 0, "Fuel system status", {
        {"Fuel system A", always, byteAt(0), coded::fuelSystem, &states::fuelSystem},
        {"Fuel system B", always, byteAt(1), coded::fuelSystem, &states::fuelSystem}}},
    singleState(0x12, coded::secondaryAir,             states::secondaryAir,     "Commanded Secondary Air Status"),
    singleState(0x1C, coded::code<texts::saeStandard>, states::saeStandard,      "OBD requirements to which vehicle or engine is certified"),
    singleState(0x1E, coded::bits<0>,                  states::auxiliaryInput,   "Auxiliary Input Status"),
    singleState(0x51, coded::code<texts::fuelType>,    states::fuelType,         "Fuel type being utilized"),
    singleState(0x5F, coded::emissionStandard,         states::emissionStandard, "Emission requirements to which vehicle is designed"),
    {0x65, 2, 0, "Auxiliary Inputs / Outputs", {
        {"Power Take Off",      bit(0), byteAt(1), coded::inputOutput<0>, &states::powerTakeOff},
        {"Auto Transmission",   bit(1), byteAt(1), coded::inputOutput<1>, &states::autoTransmission},
        {"Manual Transmission", bit(2), byteAt(1), coded::inputOutput<2>, &states::manualTransmission},
        {"Glow Plug Lamp",      bit(3), byteAt(1), coded::inputOutput<3>, &states::glowPlugLamp}}},
    singleState(0x7D, coded::controlArea,              states::controlArea,      "NOx NTE Control Area Status"),
    singleState(0x7E, coded::controlArea,              states::controlArea,      "PM NTE Control Area Status"),
};
// clang-format on
static_assert(pidsRise(codedRows), "PIDs must rise, none twice");
static_assert(allHoldTheirFields(codedRows));

template <int id, typename Base = TableParameter>
using CodedParameter = RowParameter<Base, codedRows, id>;

// Where the engine runs against the area of loads and speeds in which it must not exceed its limits. A reply without
// any of the states is taken, and leaves the last one.
class ControlAreaStatus : public TableParameter
{
public:
    using TableParameter::TableParameter;

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;
};

using FuelSystem = CodedParameter<0x03>;
using SecondaryAirStatus = CodedParameter<0x12>;

class SaeStandard : public CodedParameter<0x1C>
{
public:
    using CodedParameter<0x1C>::CodedParameter;

    // The code of the requirements; 0 if it is not a known one, or the module has not answered.
    ObdStandard standard(IEcu const& ecu) const { return static_cast<ObdStandard>(value(ecu, UnitSystem::Metric)); }
};

template <>
struct ParameterClass<codedRows, 0x1C>
{
    using Type = SaeStandard;
};

using AuxiliaryInputStatus = CodedParameter<0x1E>;
using FuelTypeParameter = CodedParameter<0x51>;
using EmissionStandard = CodedParameter<0x5F>;
using AuxiliaryIo = CodedParameter<0x65>;
using NOxControlAreaStatus = CodedParameter<0x7D, ControlAreaStatus>;
using PmControlAreaStatus = CodedParameter<0x7E, ControlAreaStatus>;

template <>
struct ParameterClass<codedRows, 0x7D>
{
    using Type = NOxControlAreaStatus;
};

template <>
struct ParameterClass<codedRows, 0x7E>
{
    using Type = PmControlAreaStatus;
};

} // namespace obd
