#pragma once

// The texts of coded states, by their number (SAE J1979). Spellings stand as users know them.
namespace obd::texts {

// clang-format off
// PID 0x03, by the number of the set bit.
inline constexpr char const* fuelSystem[] = {
    /*  0 */ "Open loop (0)",
    /*  1 */ "Closed loop (1)",
    /*  2 */ "Open loop (2)",
    /*  3 */ "Open loop (3)",
    /*  4 */ "Closed loop (4)",
    /*  5 */ "Open loop (5)",
    /*  6 */ "Open loop (6)",
    /*  7 */ "Open loop (7)",
};

// PID 0x12, by the number of the lowest set bit; the last is for all other bits.
inline constexpr char const* secondaryAir[] = {
    /*  0 */ "Upstream of first catalytic converter",
    /*  1 */ "Downstream of first catalytic converter inlet",
    /*  2 */ "Atmosphere / off",
    /*  3 */ "Pump commanded on for diagnostics",
    /*  4 */ "Reserved",
};

// PID 0x1C.
inline constexpr char const* saeStandard[] = {
    /*  0 */ "Invalid OBD standard",
    /*  1 */ "OBD II (California ARB)",
    /*  2 */ "OBD (Federal EPA)",
    /*  3 */ "OBD and OBD II",
    /*  4 */ "OBD I",
    /*  5 */ "NO OBD (Not OBD compliant)",
    /*  6 */ "EOBD",
    /*  7 */ "EOBD and OBD II",
    /*  8 */ "EOBD and OBD",
    /*  9 */ "EOBD, OBD and OBD II",
    /* 10 */ "JOBD",
    /* 11 */ "JOBD and OBD II",
    /* 12 */ "JOBD and EOBD",
    /* 13 */ "JOBD, EOBD, and OBD II",
    /* 14 */ "OBD, EOBD and KOBD",
    /* 15 */ "OBD, OBD II, EOBD and KOBD",
    /* 16 */ "SAE/ISO reserved",
    /* 17 */ "EMD (Engine Manufacturer Diagnostics)",
    /* 18 */ "EMD+ (Engine Manufacturer Diagnostics Enhanced)",
    /* 19 */ "HD OBD-C (Heavy Duty On-Board Diagnostics, Child/Partial)",
    /* 20 */ "HD OBD (Heavy Duty On-Board Diagnostics)",
    /* 21 */ "WWH OBD (World Wide Harmonized OBD)",
    /* 22 */ "SAE/ISO reserved",
    /* 23 */ "HD EOBD-I (Heavy Duty Euro OBD Stage I without NOx Control)",
    /* 24 */ "HD EOBD-I N (Heavy Duty Euro OBD Stage I with NOx Control)",
    /* 25 */ "HD EOBD-II (Heavy Duty Euro OBD Stage II without NOx Control)",
    /* 26 */ "HD EOBD-II N (Heavy Duty Euro OBD Stage II with NOx Control)",
    /* 27 */ "HD-ZEV (Heavy Duty ZEV)",
    /* 28 */ "OBDBr-1 (Brazil OBD Phase 1)",
    /* 29 */ "OBDBr-2 (Brazil OBD Phase 2 and Phase 2+)",
    /* 30 */ "KOBD (Korean OBD)",
    /* 31 */ "IOBD-I-BS4 (India BS4 OBD I)",
    /* 32 */ "IOBD-II-BS4 (India BS4 OBD II)",
    /* 33 */ "HD EOBD-VI (Euro VI)",
    /* 34 */ "OBD, OBD II and HD OBD",
    /* 35 */ "OBDBr-3 (Brazil OBD Phase 3)",
    /* 36 */ "MC EOBD-I (Motorcycle, Euro OBD-I)",
    /* 37 */ "MC EOBD-II (Motorcycle, Euro OBD-II)",
    /* 38 */ "MC COBD-I (Motorcycle, China OBD-I)",
    /* 39 */ "MC TOBD-I (Motorcycle, Taiwan OBD-I)",
    /* 40 */ "MC JOBD-I (Motorcycle, Japan OBD-I)",
    /* 41 */ "CN-OBD-6 (China Nationwide Stage 6)",
    /* 42 */ "OBDBr-P7 (Brazil OBD Phase 7)",
    /* 43 */ "CN-HDOBD-VI (China Heavy Duty VI)",
    /* 44 */ "IOBD-I-BS6 (India BS6 OBD I)",
    /* 45 */ "IOBD-II-BS6 (India BS6 OBD II)",
    /* 46 */ "IHDOBD-BSVI (India BSVI HD OBD)",
    /* 47 */ "OBDBr-P8 (Brazil OBD Phase 8)",
    /* 48 */ "HD-JOBD-II (Japan Heavy Duty OBD-II)",
    /* 49 */ "HD-KOBD-II (Korea Heavy Duty OBD-II)",
    /* 50 */ "CN-OROBD-IV (China Off-Road IV OBD)",
    /* 51 */ "ZEV Placeholder",
    /* 52 */ "MC JOBD-II (Motorcycle, Japan OBD-II)",
};

// PID 0x1E.
inline constexpr char const* auxiliaryInput[] = {
    /*  0 */ "Power Take Off: Not active",
    /*  1 */ "Power Take Off: Active",
};

// PID 0x51.
inline constexpr char const* fuelType[] = {
    /*  0 */ "Not available",
    /*  1 */ "Gasoline/Petrol",
    /*  2 */ "Methanol",
    /*  3 */ "Ethanol",
    /*  4 */ "Diesel",
    /*  5 */ "Liquefied Petroleum Gas",
    /*  6 */ "Compressed Natural Gas",
    /*  7 */ "Propane",
    /*  8 */ "Battery/Electric",
    /*  9 */ "Bi-fuel; Gasoline",
    /* 10 */ "Bi-fuel; Methanol",
    /* 11 */ "Bi-fuel; Ethanol",
    /* 12 */ "Bi-fuel; Liquefied Petroleum Gas",
    /* 13 */ "Bi-fuel; Compressed Natural Gas",
    /* 14 */ "Bi-fuel; Propage",
    /* 15 */ "Bi-fuel; Battery",
    /* 16 */ "Bi-fuel; Battery and combustion engine",
    /* 17 */ "Hybrid; Gasoline engine",
    /* 18 */ "Hybrid; Gasoline engine on ethanol",
    /* 19 */ "Hybrid; Diesel engine",
    /* 20 */ "Hybrid; Battery",
    /* 21 */ "Hybrid; Battery and combustion engine",
    /* 22 */ "Hybrid; Regeneration mode",
    /* 23 */ "Bi-fuel; Diesel",
};

// PID 0x5F, by the place among the codes that have a text of their own, counted from 1.
inline constexpr char const* emissionStandard[] = {
    /*  0 */ "ISO/SAE reserved",
    /*  1 */ "EURO IV B1 - Heavy Duty Vehicles (EURO IV) B1",
    /*  2 */ "EURO V B2 - Heavy Duty Vehicles (EURO V) B2",
    /*  3 */ "EURO C - Heavy Duty Vehicles (EURO EEV) C",
    /*  4 */ "EURO VI - Heavy Duty Vehicles (Euro VI)",
};

// PID 0x65, by the state bit plus 1.
inline constexpr char const* powerTakeOff[] = {"Not supported", "Off", "On"};
inline constexpr char const* autoTransmission[] = {"Not supported", "Park/Neutral", "Gear/Drive"};
inline constexpr char const* manualTransmission[] = {"Not supported", "Clutch/Neutral", "Gear"};
inline constexpr char const* glowPlugLamp[] = {"Not supported", "Off", "On"};

// Boost and turbocharger controls of PIDs 0x70 and 0x71.
inline constexpr char const* controlStatus[] = {"Not defined", "Open loop", "Closed loop", "Fault present"};

// PIDs 0x7D and 0x7E, by the number of the lowest set bit (NTE: the area of loads and speeds not to exceed the limits in).
inline constexpr char const* controlArea[] = {
    /*  0 */ "Inside control area",
    /*  1 */ "Outside control area",
    /*  2 */ "Inside NTE carve-out area",
    /*  3 */ "NTE deficiency",
};

// clang-format on

} // namespace obd::texts
