#include "libvelmora/uds/failuretype.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

struct FailureRow
{
    unsigned char type;
    char const* category;
    char const* name; // empty where too few lists agree on it
};

// SAE J2012-DA, as far as public lists agree.
constexpr FailureRow failureRows[] = {
    {0x00, "General Failure", "No Subtype Information"},
    {0x01, "General Failure", "General Electrical Failure"},
    {0x02, "General Failure", "General Signal Failure"},
    {0x03, "General Failure", "FM or PWM Failure"},
    {0x04, "General Failure", "System Internal Failure"},
    {0x05, "General Failure", "System Programming Failure"},
    {0x06, "General Failure", ""},
    {0x07, "General Failure", "Mechanical Failure"},
    {0x08, "General Failure", "Bus Signal or Message Failure"},
    {0x09, "General Failure", "Component Failure"},
    {0x11, "General Electrical Failure", "Circuit Short to Ground"},
    {0x12, "General Electrical Failure", "Circuit Short to Battery"},
    {0x13, "General Electrical Failure", "Circuit Open"},
    {0x14, "General Electrical Failure", "Circuit Short to Ground or Open"},
    {0x15, "General Electrical Failure", "Circuit Short to Battery or Open"},
    {0x16, "General Electrical Failure", "Circuit Voltage Below Threshold"},
    {0x17, "General Electrical Failure", "Circuit Voltage Above Threshold"},
    {0x18, "General Electrical Failure", "Circuit Current Below Threshold"},
    {0x19, "General Electrical Failure", "Circuit Current Above Threshold"},
    {0x1A, "General Electrical Failure", "Circuit Resistance Below Threshold"},
    {0x1B, "General Electrical Failure", "Circuit Resistance Above Threshold"},
    {0x1C, "General Electrical Failure", "Circuit Voltage Out of Range"},
    {0x1D, "General Electrical Failure", "Circuit Current Out of Range"},
    {0x1E, "General Electrical Failure", "Circuit Resistance Out of Range"},
    {0x1F, "General Electrical Failure", "Circuit Intermittent"},
    {0x21, "General Signal Failure", "Signal Amplitude Below Minimum"},
    {0x22, "General Signal Failure", "Signal Amplitude Above Maximum"},
    {0x23, "General Signal Failure", "Signal Stuck Low"},
    {0x24, "General Signal Failure", "Signal Stuck High"},
    {0x25, "General Signal Failure", "Signal Shape or Waveform Failure"},
    {0x26, "General Signal Failure", "Signal Rate of Change Below Threshold"},
    {0x27, "General Signal Failure", "Signal Rate of Change Above Threshold"},
    {0x28, "General Signal Failure", "Signal Bias Level Out of Range or Zero Adjustment Failure"},
    {0x29, "General Signal Failure", "Signal Invalid"},
    {0x2A, "General Signal Failure", ""},
    {0x2B, "General Signal Failure", ""},
    {0x2F, "General Signal Failure", "Signal Erratic"},
    {0x31, "FM or PWM Failure", "No Signal"},
    {0x32, "FM or PWM Failure", ""},
    {0x33, "FM or PWM Failure", ""},
    {0x34, "FM or PWM Failure", ""},
    {0x35, "FM or PWM Failure", ""},
    {0x36, "FM or PWM Failure", "Signal Frequency Too Low"},
    {0x37, "FM or PWM Failure", "Signal Frequency Too High"},
    {0x38, "FM or PWM Failure", "Signal Frequency Incorrect"},
    {0x39, "FM or PWM Failure", ""},
    {0x3A, "FM or PWM Failure", ""},
    {0x41, "System Internal Failure", "General Checksum Failure"},
    {0x42, "System Internal Failure", "General Memory Failure"},
    {0x43, "System Internal Failure", "Special Memory Failure"},
    {0x44, "System Internal Failure", "Data Memory Failure"},
    {0x45, "System Internal Failure", "Program Memory Failure"},
    {0x46, "System Internal Failure", "Calibration or Parameter Memory Failure"},
    {0x47, "System Internal Failure", "Watchdog or Safety Microcontroller Failure"},
    {0x48, "System Internal Failure", "Supervision Software Failure"},
    {0x49, "System Internal Failure", "Internal Electronic Failure"},
    {0x4A, "System Internal Failure", "Incorrect Component Installed"},
    {0x4B, "System Internal Failure", "Over Temperature"},
    {0x51, "System Programming Failure", "Not Programmed"},
    {0x52, "System Programming Failure", "Not Activated"},
    {0x53, "System Programming Failure", "Deactivated"},
    {0x54, "System Programming Failure", "Missing Calibration"},
    {0x55, "System Programming Failure", "Not Configured"},
    {0x56, "System Programming Failure", "Invalid or Incompatible Configuration"},
    {0x57, "System Programming Failure", ""},
    {0x61, "Algorithm Based Failure", "Signal Calculation Failure"},
    {0x62, "Algorithm Based Failure", "Signal Compare Failure"},
    {0x63, "Algorithm Based Failure", "Circuit or Component Protection Time Out"},
    {0x64, "Algorithm Based Failure", "Signal Plausibility Failure"},
    {0x65, "Algorithm Based Failure", "Signal Has Too Few Transitions or Events"},
    {0x66, "Algorithm Based Failure", "Signal Has Too Many Transitions or Events"},
    {0x67, "Algorithm Based Failure", "Signal Incorrect After Event"},
    {0x68, "Algorithm Based Failure", "Event Information"},
    {0x71, "Mechanical Failure", "Actuator Stuck"},
    {0x72, "Mechanical Failure", "Actuator Stuck Open"},
    {0x73, "Mechanical Failure", "Actuator Stuck Closed"},
    {0x74, "Mechanical Failure", "Actuator Slipping"},
    {0x75, "Mechanical Failure", "Emergency Position Not Reachable"},
    {0x76, "Mechanical Failure", "Wrong Mounting Position"},
    {0x77, "Mechanical Failure", "Commanded Position Not Reachable"},
    {0x78, "Mechanical Failure", "Alignment or Adjustment Incorrect"},
    {0x79, "Mechanical Failure", "Mechanical Linkage Failure"},
    {0x7A, "Mechanical Failure", "Fluid Leak or Seal Failure"},
    {0x7B, "Mechanical Failure", ""},
    {0x7C, "Mechanical Failure", ""},
    {0x7E, "Mechanical Failure", ""},
    {0x7F, "Mechanical Failure", ""},
    {0x81, "Bus Signal or Message Failure", "Invalid Serial Data Received"},
    {0x82, "Bus Signal or Message Failure", "Alive or Sequence Counter Incorrect or Not Updated"},
    {0x83, "Bus Signal or Message Failure", "Value of Signal Protection Calculation Incorrect"},
    {0x84, "Bus Signal or Message Failure", ""},
    {0x85, "Bus Signal or Message Failure", ""},
    {0x86, "Bus Signal or Message Failure", "Signal Invalid"},
    {0x87, "Bus Signal or Message Failure", "Missing Message"},
    {0x88, "Bus Signal or Message Failure", "Bus Off"},
    {0x8F, "Bus Signal or Message Failure", ""},
    {0x91, "Component Failure", "Parametric"},
    {0x92, "Component Failure", "Performance or Incorrect Operation"},
    {0x93, "Component Failure", "No Operation"},
    {0x94, "Component Failure", "Unexpected Operation"},
    {0x95, "Component Failure", "Incorrect Assembly"},
    {0x96, "Component Failure", "Component Internal Failure"},
    {0x97, "Component Failure", "Component or System Operation Obstructed or Blocked"},
    {0x98, "Component Failure", "Component or System Over Temperature"},
    {0x99, "Component Failure", ""},
    {0x9A, "Component Failure", ""},
};

static_assert(std::ranges::adjacent_find(failureRows, std::ranges::greater_equal{}, &FailureRow::type) ==
                  std::ranges::end(failureRows),
              "types must rise, none twice");

constexpr unsigned char firstOfMaker = 0xF0;
constexpr char const* categories[] = {
    "General Failure",         "General Electrical Failure", "General Signal Failure",
    "FM or PWM Failure",       "System Internal Failure",    "System Programming Failure",
    "Algorithm Based Failure", "Mechanical Failure",         "Bus Signal or Message Failure",
    "Component Failure"};

// The high half tells the category.
std::string categoryOf(unsigned char type)
{
    if (type >= firstOfMaker) {
        return "Maker's or Supplier's";
    }
    std::size_t const high = type >> 4U;
    return high < std::size(categories) ? categories[high] : "Reserved";
}

} // namespace

std::string failureTypeText(unsigned char type)
{
    auto const* const row = std::ranges::lower_bound(failureRows, type, {}, &FailureRow::type);
    if (row == std::end(failureRows) || row->type != type) {
        return fmt::format("{} {:02X}", categoryOf(type), type);
    }
    return *row->name != '\0' ? row->name : fmt::format("{} {:02X}", row->category, type);
}

} // namespace velmora
