#pragma once

#include "libobd/powertrain/formula.h"
#include "libobd/powertrain/quantities.h"
#include "libobd/powertrain/tableparameter.h"

#include <obd/sensorpids.h>

#include <algorithm>

namespace obd {

// A fuel trim of bank 1 or 2. A vehicle with four banks sends that of bank 3 or 4 in a second byte, of which nothing in
// the reply itself tells: whether it is in use holds for the whole library.
class FuelTrim : public TableParameter
{
public:
    using TableParameter::TableParameter;

    // Says that the vehicle has four banks. It holds for every trim read from then on, also on a later connection; only
    // tests take it back.
    static void setByteBInUse(bool inUse);
    static bool byteBInUse();

    // The formula of byte B. A trim below 0 of bank 3 or 4 is taken for one that is not there.
    static formula::Decoded secondTrim(formula::Raw raw, IEcu const& ecu);

    std::string description(IEcu const& ecu) override;

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;
};

// bank: 1 or 2 of the first byte; the second is that of the bank two on.
constexpr ParameterRow fuelTrimRow(int pid, char const* title, int bank)
{
    return {pid,
            1,
            1,
            title,
            {{bank == 1 ? "Bank 1" : "Bank 2", always, byteAt(0), formula::trim, &quantities::trim},
             {bank == 1 ? "Bank 3" : "Bank 4", always, byteAt(1), FuelTrim::secondTrim, &quantities::trim}}};
}

inline constexpr ParameterRow fuelTrimRows[] = {
    fuelTrimRow(0x06, "Short Term Fuel Trim", 1),
    fuelTrimRow(0x07, "Long Term Fuel Trim", 1),
    fuelTrimRow(0x08, "Short Term Fuel Trim", 2),
    fuelTrimRow(0x09, "Long Term Fuel Trim", 2),
    fuelTrimRow(0x55, "Short Term Secondary O2 Sensor Fuel Trim", 1),
    fuelTrimRow(0x56, "Long Term Secondary O2 Sensor Fuel Trim", 1),
    fuelTrimRow(0x57, "Short Term Secondary O2 Sensor Fuel Trim", 2),
    fuelTrimRow(0x58, "Long Term Secondary O2 Sensor Fuel Trim", 2),
};
static_assert(pidsRise(fuelTrimRows), "PIDs must rise, none twice");
static_assert(std::ranges::all_of(fuelTrimRows, isFuelTrim, &ParameterRow::pid), "<obd/sensorpids.h> tells otherwise");

template <int id>
using FuelTrimParameter = RowParameter<FuelTrim, fuelTrimRows, id>;

template <int id>
struct ParameterClass<fuelTrimRows, id>
{
    using Type = FuelTrimParameter<id>;
};

using ShortTermFuelTrimBank1 = FuelTrimParameter<0x06>;
using LongTermFuelTrimBank1 = FuelTrimParameter<0x07>;
using ShortTermFuelTrimBank2 = FuelTrimParameter<0x08>;
using LongTermFuelTrimBank2 = FuelTrimParameter<0x09>;
using ShortTermSecondaryFuelTrimBank1 = FuelTrimParameter<0x55>;
using LongTermSecondaryFuelTrimBank1 = FuelTrimParameter<0x56>;
using ShortTermSecondaryFuelTrimBank2 = FuelTrimParameter<0x57>;
using LongTermSecondaryFuelTrimBank2 = FuelTrimParameter<0x58>;

} // namespace obd
