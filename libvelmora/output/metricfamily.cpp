#include "libvelmora/output/metricfamily.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace velmora {

namespace {

struct FamilyRow
{
    std::string_view unit;
    std::string_view name; // behind velmora_
    std::string_view help;
    double factor = 1.0;
    double offset = 0.0;
};

constexpr double poundMass = 453.59237; // g
constexpr double inchWater = 249.08891; // Pa
constexpr FamilyRow familyRows[] = {
    {"", "number", "Counts, states and ratios without a unit."},
    {"rpm", "rotation_revolutions_per_minute", "Rotational speed."},
    {"km/h", "speed_meters_per_second", "Speed.", 1.0 / 3.6},
    {"mph", "speed_meters_per_second", "Speed.", 0.44704},
    {"V", "voltage_volts", "Voltage."},
    {"A", "current_amperes", "Current."},
    {"mA", "current_amperes", "Current.", 1e-3},
    {"µA", "current_amperes", "Current.", 1e-6},
    {"Ω", "resistance_ohms", "Resistance."},
    {"kΩ", "resistance_ohms", "Resistance.", 1e3},
    {"s", "duration_seconds", "Duration."},
    {"min", "duration_seconds", "Duration.", 60.0},
    {"%", "share_ratio", "Ratio; 1 is 100 percent.", 0.01},
    {"ppm", "share_ratio", "Ratio; 1 is 100 percent.", 1e-6},
    {"lambda", "equivalence_ratio", "Air-fuel equivalence ratio; 1 is stoichiometric."},
    {"A/F", "air_fuel_ratio", "Air-fuel ratio, by mass."},
    {"°C", "temperature_celsius", "Temperature."},
    {"°F", "temperature_celsius", "Temperature.", 5.0 / 9.0, -160.0 / 9.0},
    {"K", "temperature_difference_celsius", "Difference of temperatures."},
    {"kPa", "pressure_pascals", "Pressure.", 1e3},
    {"Pa", "pressure_pascals", "Pressure."},
    {"psi", "pressure_pascals", "Pressure.", 6894.757293},
    {"inHg", "pressure_pascals", "Pressure.", 3386.389},
    {"inH2O", "pressure_pascals", "Pressure.", inchWater},
    {"kPa/s", "pressure_change_pascals_per_second", "Rate of pressure change.", 1e3},
    {"Pa/s", "pressure_change_pascals_per_second", "Rate of pressure change."},
    {"inH2O/s", "pressure_change_pascals_per_second", "Rate of pressure change.", inchWater},
    {"°", "angle_degrees", "Angle."},
    {"Hz", "frequency_hertz", "Frequency."},
    {"MHz", "frequency_hertz", "Frequency.", 1e6},
    {"km", "distance_meters", "Distance.", 1e3},
    {"mi", "distance_meters", "Distance.", 1609.344},
    {"mm", "length_meters", "Length.", 1e-3},
    {"in", "length_meters", "Length.", 0.0254},
    {"V/ms", "voltage_change_volts_per_second", "Rate of voltage change.", 1e3},
    {"mV/s", "voltage_change_volts_per_second", "Rate of voltage change.", 1e-3},
    {"g/s", "mass_flow_grams_per_second", "Mass flow."},
    {"kg/h", "mass_flow_grams_per_second", "Mass flow.", 1.0 / 3.6},
    {"lb/s", "mass_flow_grams_per_second", "Mass flow.", poundMass},
    {"lb/min", "mass_flow_grams_per_second", "Mass flow.", poundMass / 60.0},
    {"g", "mass_grams", "Mass."},
    {"lb", "mass_grams", "Mass.", poundMass},
    {"g/cyl", "cylinder_charge_grams", "Mass of air per cylinder and stroke."},
    {"mg/stroke", "cylinder_charge_grams", "Mass of air per cylinder and stroke.", 1e-3},
    {"l", "volume_liters", "Volume."},
    {"l/h", "volume_flow_liters_per_second", "Volume flow.", 1.0 / 3600.0},
    {"l/100 km", "consumption_liters_per_meter", "Fuel per distance.", 1e-5},
    {"mm²", "area_square_meters", "Area.", 1e-6},
    {"Nm", "torque_newton_meters", "Torque."},
    {"lb-ft", "torque_newton_meters", "Torque.", 1.3558179483},
    {"kW", "power_watts", "Power.", 1e3},
    {"hp", "power_watts", "Power.", 745.69987158},
    {"kJ", "energy_joules", "Energy.", 1e3},
    {"BTU", "energy_joules", "Energy.", 1055.05585262},
};

std::string sanitised(std::string_view unit)
{
    std::string text;
    for (char const each : unit) {
        bool const plain = (each >= 'a' && each <= 'z') || (each >= '0' && each <= '9');
        bool const capital = each >= 'A' && each <= 'Z';
        text += plain ? each : capital ? static_cast<char>(each - 'A' + 'a') : '_';
    }
    return text;
}

} // namespace

MetricFamily metricFamily(std::string const& unit)
{
    auto const* const row = std::ranges::find(familyRows, unit, &FamilyRow::unit);
    if (row == std::end(familyRows)) {
        return {"velmora_value_in_" + sanitised(unit), "Values in " + unit + ".", 1.0, 0.0};
    }
    return {"velmora_" + std::string(row->name), std::string(row->help), row->factor, row->offset};
}

std::string escapedLabel(std::string const& text)
{
    std::string result;
    for (char const each : text) {
        result += each == '\\' || each == '"' ? std::string{'\\', each}
                  : each == '\n'              ? std::string("\\n")
                  : each == '\r'              ? std::string(" ")
                                              : std::string{each};
    }
    return result;
}

} // namespace velmora
