#include "libvelmora/signal/standardpid.h"

#include "libvelmora/signal/formulaparser.h"

#include <algorithm>
#include <iterator>
#include <string>

namespace velmora {

namespace {

struct StandardRow
{
    unsigned char pid;
    char const* name;
    char const* formula;
    char const* unit;
    int precision;
};

constexpr StandardRow standardRows[] = {
    {0x04, "Engine load", "A*100/255", "%", 1},
    {0x05, "Coolant temperature", "A-40", "°C", 0},
    {0x0B, "Intake manifold pressure", "A", "kPa", 0},
    {0x0C, "Engine speed", "(A*256+B)/4", "rpm", 0},
    {0x0D, "Vehicle speed", "A", "km/h", 0},
    {0x0E, "Timing advance", "A/2-64", "°", 1},
    {0x0F, "Intake air temperature", "A-40", "°C", 0},
    {0x10, "Air flow", "(A*256+B)/100", "g/s", 2},
    {0x11, "Throttle position", "A*100/255", "%", 1},
    {0x1F, "Run time", "A*256+B", "s", 0},
    {0x21, "Distance with the lamp on", "A*256+B", "km", 0},
    {0x2F, "Fuel level", "A*100/255", "%", 1},
    {0x31, "Distance since codes were cleared", "A*256+B", "km", 0},
    {0x33, "Barometric pressure", "A", "kPa", 0},
    {0x42, "Control module voltage", "(A*256+B)/1000", "V", 2},
    {0x45, "Relative throttle position", "A*100/255", "%", 1},
    {0x46, "Ambient temperature", "A-40", "°C", 0},
    {0x5B, "Battery charge", "A*100/255", "%", 1},
    {0x5C, "Oil temperature", "A-40", "°C", 0},
    {0x5E, "Fuel rate", "(A*256+B)/20", "l/h", 2},
};

static_assert(std::ranges::adjacent_find(standardRows, std::ranges::greater_equal{}, &StandardRow::pid) ==
                  std::ranges::end(standardRows),
              "PIDs must rise, none twice");

} // namespace

std::optional<Signal> standardPidSignal(unsigned char pid)
{
    auto const* const row = std::ranges::lower_bound(standardRows, pid, {}, &StandardRow::pid);
    if (row == std::end(standardRows) || row->pid != pid) {
        return std::nullopt;
    }
    Signal signal;
    signal.name = row->name;
    signal.request = {0x01, pid};
    signal.formula = parseFormula(row->formula);
    signal.unit = row->unit;
    signal.precision = row->precision;
    return signal;
}

} // namespace velmora
