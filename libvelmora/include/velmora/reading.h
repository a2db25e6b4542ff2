#pragma once

#include <velmora/export.h>

#include <chrono>
#include <iosfwd>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace velmora {

/// One value of one sensor of one control module at one moment. A plain value: copy it, keep it, hand it to any thread.
struct Reading
{
    /// Nothing, when the module did not tell the value; a number in `unit`; or a text, for states and lists.
    using Value = std::variant<std::monostate, double, std::string>;

    std::chrono::system_clock::time_point time; ///< when the reply had come, by the wall clock
    std::string vehicle;                        ///< the name that the user or the program gave it; may be empty
    unsigned int module = 0;                    ///< id of the control module, as obd::IEcu::id tells it
    std::string sensor; ///< stable key of capitals, digits and '_': "RPM", "PID_C2", or a signal's own id
    std::string pid;    ///< what was asked, in hexadecimal from the service on: "010C"; empty for a derived value
    std::string name;   ///< title for people: "Engine RPM"
    Value value;        ///< see Value
    std::string unit;   ///< label as people write it: "rpm", "km/h"; empty for none
    int precision = 0;  ///< digits behind the point that the value is good for
    std::vector<unsigned char> raw; ///< the module's payload from the service byte on; empty for a derived value
};

/// The number of a reading, in its unit; nothing for a text or for none.
VELMORA_EXPORT std::optional<double> number(Reading const& reading);
/// The value as people write it, with its digits behind the point and without its unit; "-" for none.
VELMORA_EXPORT std::string valueText(Reading const& reading);
/// "Engine RPM: 1726 rpm"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Reading const& reading);

} // namespace velmora
