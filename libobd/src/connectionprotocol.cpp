#include <obd/connectionprotocol.h>

#include <array>
#include <cstddef>

namespace obd {
namespace {

// By protocol number.
constexpr std::array<char const*, 10> descriptions{
    "Automatic",
    "SAE J1850 PWM",
    "SAE J1850 VPW",
    "ISO 9141-2",
    "ISO 14230-4 KWP (5 baud init)",
    "ISO 14230-4 KWP (fast init)",
    "ISO 15765-4 CAN (11bit, 500kb)",
    "ISO 15765-4 CAN (29bit, 500kb)",
    "ISO 15765-4 CAN (11bit, 250kb)",
    "ISO 15765-4 CAN (29bit, 250kb)",
};

} // namespace

std::string ConnectionProtocol::description() const
{
    auto const number = static_cast<std::size_t>(m_protocol);
    return number < descriptions.size() ? descriptions[number] : "";
}

} // namespace obd
