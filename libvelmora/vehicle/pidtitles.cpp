#include "libvelmora/vehicle/pidtitles.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

struct PidTitle
{
    unsigned char pid;
    char const* title;
};

constexpr PidTitle pidTitles[] = {
    {0x81, "AECD 1 to 5 Run Times"},
    {0x82, "AECD 6 to 10 Run Times"},
    {0x83, "NOx Sensors"},
    {0x84, "Manifold Surface Temperature"},
    {0x85, "NOx Reagent System"},
    {0x86, "Particulate Matter Sensors"},
    {0x87, "Intake Manifold Absolute Pressure A and B"},
    {0x88, "SCR Inducement System"},
    {0x89, "AECD 11 to 15 Run Times"},
    {0x8A, "AECD 16 to 20 Run Times"},
    {0x8B, "DPF and NOx Adsorber Regeneration"},
    {0x8C, "O2 Concentration and Lambda, Sensors 1 and 2"},
    {0x8D, "Absolute Throttle Position G"},
    {0x8E, "Engine Friction Percent Torque"},
    {0x8F, "Particulate Matter Sensor Outputs"},
    {0x90, "Continuous MI Run Time"},
    {0x91, "ECU Continuous MI Run Time"},
    {0x92, "Closed Loop Fuel Control Status"},
    {0x93, "Cumulative Continuous MI Run Time"},
    {0x94, "NOx Warning and Inducement Counters"},
    {0x98, "Exhaust Gas Temperatures Bank 1, Further Sensors"},
    {0x99, "Exhaust Gas Temperatures Bank 2, Further Sensors"},
    {0x9A, "Hybrid/EV Battery"},
    {0x9B, "Reagent Concentration, Temperature and Level"},
    {0x9C, "O2 Concentration and Lambda, Sensors 3 and 4"},
    {0x9D, "Engine Fuel Rate (Mass)"},
    {0x9E, "Engine Exhaust Flow Rate"},
    {0x9F, "Fuel System Use"},
    {0xA1, "NOx Sensors Corrected"},
    {0xA2, "Cylinder Fuel Rate"},
    {0xA3, "Evap System Vapor Pressure"},
    {0xA4, "Transmission Actual Gear"},
    {0xA5, "Commanded Reagent Dosing"},
    {0xA6, "Odometer"},
    {0xA7, "NOx Sensors 3 and 4"},
    {0xA8, "NOx Sensors 3 and 4 Corrected"},
    {0xA9, "ABS Disable Switch"},
    {0xAA, "Current Vehicle Speed Limit"},
    {0xB2, "Traction Battery State of Health"},
    {0xC3, "Fuel Level Inputs A and B"},
    {0xC4, "Exhaust Particulate Control Diagnostic Time and Count"},
    {0xC5, "Fuel Pressures A and B"},
    {0xC6, "Particulate Aftertreatment Counters"},
    {0xC7, "Distance Since Reflash or Module Replacement"},
    {0xC8, "NCD and PCD Warning Lamp Status"},
    {0xD2, "State of Certified Energy and Range"},
    {0xD3, "Engine Odometer"},
};

static_assert(std::ranges::adjacent_find(pidTitles, std::ranges::greater_equal{}, &PidTitle::pid) ==
                  std::ranges::end(pidTitles),
              "PIDs must rise, none twice");

} // namespace

std::string pidTitle(unsigned char pid)
{
    auto const* const found = std::ranges::lower_bound(pidTitles, pid, {}, &PidTitle::pid);
    return found != std::end(pidTitles) && found->pid == pid ? found->title : fmt::format("PID {:02X}", pid);
}

} // namespace velmora
