#include "libvelmora/read/sensornames.h"

#include "common/text/text.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

std::vector<SensorName> const& sensorNames()
{
    static std::vector<SensorName> const names = {
        {0x03, "FUEL_STATUS"},
        {0x04, "ENGINE_LOAD"},
        {0x04, "LOAD"},
        {0x05, "COOLANT_TEMP"},
        {0x05, "COOLANT"},
        {0x05, "ECT"},
        {0x06, "SHORT_FUEL_TRIM_1"},
        {0x06, "STFT1"},
        {0x07, "LONG_FUEL_TRIM_1"},
        {0x07, "LTFT1"},
        {0x08, "SHORT_FUEL_TRIM_2"},
        {0x08, "STFT2"},
        {0x09, "LONG_FUEL_TRIM_2"},
        {0x09, "LTFT2"},
        {0x0A, "FUEL_PRESSURE"},
        {0x0B, "INTAKE_PRESSURE"},
        {0x0B, "MAP"},
        {0x0C, "RPM"},
        {0x0C, "ENGINE_SPEED"},
        {0x0D, "SPEED"},
        {0x0D, "VEHICLE_SPEED"},
        {0x0D, "VSS"},
        {0x0E, "TIMING_ADVANCE"},
        {0x0F, "INTAKE_TEMP"},
        {0x0F, "IAT"},
        {0x10, "MAF"},
        {0x10, "AIR_FLOW"},
        {0x11, "THROTTLE_POS"},
        {0x11, "THROTTLE"},
        {0x11, "TPS"},
        {0x12, "SECONDARY_AIR"},
        {0x13, "O2_SENSORS"},
        {0x14, "O2_B1S1"},
        {0x15, "O2_B1S2"},
        {0x1C, "OBD_STANDARD"},
        {0x1E, "AUX_INPUT"},
        {0x1E, "PTO"},
        {0x1F, "RUN_TIME"},
        {0x21, "MIL_DISTANCE"},
        {0x23, "FUEL_RAIL_PRESSURE"},
        {0x2C, "EGR"},
        {0x2D, "EGR_ERROR"},
        {0x2E, "EVAP_PURGE"},
        {0x2F, "FUEL_LEVEL"},
        {0x2F, "FUEL"},
        {0x30, "WARM_UPS"},
        {0x31, "CLEAR_DISTANCE"},
        {0x32, "EVAP_PRESSURE"},
        {0x33, "BAROMETRIC_PRESSURE"},
        {0x33, "BARO"},
        {0x3C, "CATALYST_TEMP_B1S1"},
        {0x3D, "CATALYST_TEMP_B2S1"},
        {0x3E, "CATALYST_TEMP_B1S2"},
        {0x3F, "CATALYST_TEMP_B2S2"},
        {0x42, "MODULE_VOLTAGE"},
        {0x43, "ABSOLUTE_LOAD"},
        {0x44, "LAMBDA"},
        {0x45, "RELATIVE_THROTTLE_POS"},
        {0x46, "AMBIENT_TEMP"},
        {0x47, "THROTTLE_POS_B"},
        {0x48, "THROTTLE_POS_C"},
        {0x49, "PEDAL_POS_D"},
        {0x4A, "PEDAL_POS_E"},
        {0x4B, "PEDAL_POS_F"},
        {0x4C, "THROTTLE_ACTUATOR"},
        {0x4D, "MIL_TIME"},
        {0x4E, "CLEAR_TIME"},
        {0x51, "FUEL_TYPE"},
        {0x52, "ETHANOL"},
        {0x52, "ALCOHOL"},
        {0x59, "ABSOLUTE_FUEL_RAIL_PRESSURE"},
        {0x5A, "RELATIVE_PEDAL_POS"},
        {0x5B, "BATTERY_CHARGE"},
        {0x5C, "OIL_TEMP"},
        {0x5D, "INJECTION_TIMING"},
        {0x5E, "FUEL_RATE"},
        {0x5F, "EMISSION_STANDARD"},
        {0x61, "REQUESTED_TORQUE"},
        {0x62, "ACTUAL_TORQUE"},
        {0x63, "REFERENCE_TORQUE"},
        {0x66, "MAF_SENSORS"},
        {0x67, "COOLANT_TEMPS"},
        {0x68, "INTAKE_TEMPS"},
        {0x70, "BOOST_CONTROL"},
        {0x74, "TURBO_RPM"},
        {0x78, "EXHAUST_TEMP_BANK_1"},
        {0x78, "EGT1"},
        {0x79, "EXHAUST_TEMP_BANK_2"},
        {0x79, "EGT2"},
        {0x7A, "DPF_BANK_1"},
        {0x7B, "DPF_BANK_2"},
        {0x7C, "DPF_TEMP"},
        {0x7F, "RUN_TIMES"},
        {0xF0, "CONSUMPTION"},
        {0xF0, "FUEL_CONSUMPTION"},
        {0xF4, "BATTERY"},
        {0xF4, "VOLTAGE"},
        {0xF5, "POWER"},
        {0xF6, "TORQUE"},
        {0xF7, "BOOST"},
    };
    return names;
}

std::vector<SensorName> const& sensorAliases()
{
    static std::vector<SensorName> const aliases = {
        {0x00, "PIDS_A"},
        {0x01, "STATUS"},
        {0x02, "FREEZE_DTC"},
        {0x12, "AIR_STATUS"},
        {0x16, "O2_B1S3"},
        {0x17, "O2_B1S4"},
        {0x18, "O2_B2S1"},
        {0x19, "O2_B2S2"},
        {0x1A, "O2_B2S3"},
        {0x1B, "O2_B2S4"},
        {0x1C, "OBD_COMPLIANCE"},
        {0x1D, "O2_SENSORS_ALT"},
        {0x1E, "AUX_INPUT_STATUS"},
        {0x20, "PIDS_B"},
        {0x21, "DISTANCE_W_MIL"},
        {0x22, "FUEL_RAIL_PRESSURE_VAC"},
        {0x23, "FUEL_RAIL_PRESSURE_DIRECT"},
        {0x24, "O2_S1_WR_VOLTAGE"},
        {0x25, "O2_S2_WR_VOLTAGE"},
        {0x26, "O2_S3_WR_VOLTAGE"},
        {0x27, "O2_S4_WR_VOLTAGE"},
        {0x28, "O2_S5_WR_VOLTAGE"},
        {0x29, "O2_S6_WR_VOLTAGE"},
        {0x2A, "O2_S7_WR_VOLTAGE"},
        {0x2B, "O2_S8_WR_VOLTAGE"},
        {0x2C, "COMMANDED_EGR"},
        {0x2E, "EVAPORATIVE_PURGE"},
        {0x30, "WARMUPS_SINCE_DTC_CLEAR"},
        {0x31, "DISTANCE_SINCE_DTC_CLEAR"},
        {0x32, "EVAP_VAPOR_PRESSURE"},
        {0x34, "O2_S1_WR_CURRENT"},
        {0x35, "O2_S2_WR_CURRENT"},
        {0x36, "O2_S3_WR_CURRENT"},
        {0x37, "O2_S4_WR_CURRENT"},
        {0x38, "O2_S5_WR_CURRENT"},
        {0x39, "O2_S6_WR_CURRENT"},
        {0x3A, "O2_S7_WR_CURRENT"},
        {0x3B, "O2_S8_WR_CURRENT"},
        {0x40, "PIDS_C"},
        {0x41, "STATUS_DRIVE_CYCLE"},
        {0x42, "CONTROL_MODULE_VOLTAGE"},
        {0x44, "COMMANDED_EQUIV_RATIO"},
        {0x46, "AMBIANT_AIR_TEMP"},
        {0x49, "ACCELERATOR_POS_D"},
        {0x4A, "ACCELERATOR_POS_E"},
        {0x4B, "ACCELERATOR_POS_F"},
        {0x4D, "RUN_TIME_MIL"},
        {0x4E, "TIME_SINCE_DTC_CLEARED"},
        {0x4F, "MAX_VALUES"},
        {0x50, "MAX_MAF"},
        {0x52, "ETHANOL_PERCENT"},
        {0x53, "EVAP_VAPOR_PRESSURE_ABS"},
        {0x54, "EVAP_VAPOR_PRESSURE_ALT"},
        {0x55, "SHORT_O2_TRIM_B1"},
        {0x56, "LONG_O2_TRIM_B1"},
        {0x57, "SHORT_O2_TRIM_B2"},
        {0x58, "LONG_O2_TRIM_B2"},
        {0x59, "FUEL_RAIL_PRESSURE_ABS"},
        {0x5A, "RELATIVE_ACCEL_POS"},
        {0x5B, "HYBRID_BATTERY_REMAINING"},
        {0x5D, "FUEL_INJECT_TIMING"},
        {0x5F, "EMISSION_REQ"},
    };
    return aliases;
}

std::optional<int> findSensorName(std::string const& text)
{
    std::string wanted = toUpper(text);
    std::replace_if(
        wanted.begin(), wanted.end(), [](char each) { return each == '-' || each == ' '; }, '_');
    for (auto const* const names : {&sensorNames(), &sensorAliases()}) {
        for (SensorName const& each : *names) {
            if (wanted == each.name) {
                return each.pid;
            }
        }
    }
    return std::nullopt;
}

std::string sensorNameOf(int pid)
{
    for (SensorName const& each : sensorNames()) {
        if (each.pid == pid) {
            return each.name;
        }
    }
    return {};
}

std::string sensorKey(int pid)
{
    std::string const name = sensorNameOf(pid);
    return name.empty() ? fmt::format("PID_{:02X}", pid) : name;
}

} // namespace velmora
