#include <obd/connectionprotocol.h>

#include <cstddef>
#include <iterator>
#include <string_view>

namespace obd {
namespace {

struct ProtocolRow
{
    std::string_view description;
    ObdProtocol family;
};

// By the adapter's protocol number.
constexpr ProtocolRow protocolRows[] = {
    {"Automatic", ObdProtocolUnknown},
    {"SAE J1850 PWM", ObdProtocolJ1850},
    {"SAE J1850 VPW", ObdProtocolJ1850},
    {"ISO 9141-2", ObdProtocolIso9141},
    {"ISO 14230-4 KWP (5 baud init)", ObdProtocolIso14230},
    {"ISO 14230-4 KWP (fast init)", ObdProtocolIso14230},
    {"ISO 15765-4 CAN (11bit, 500kb)", ObdProtocolCan11},
    {"ISO 15765-4 CAN (29bit, 500kb)", ObdProtocolCan29},
    {"ISO 15765-4 CAN (11bit, 250kb)", ObdProtocolCan11},
    {"ISO 15765-4 CAN (29bit, 250kb)", ObdProtocolCan29},
};
static_assert(std::size(protocolRows) == static_cast<std::size_t>(VehicleProtocol::Iso15765Can29Bit250) + 1);

ProtocolRow const& rowOf(VehicleProtocol protocol)
{
    static constexpr ProtocolRow unknown{"", ObdProtocolUnknown};
    auto const number = static_cast<std::size_t>(protocol);
    return number < std::size(protocolRows) ? protocolRows[number] : unknown;
}

} // namespace

ConnectionProtocol::ConnectionProtocol(VehicleProtocol protocol) : m_protocol(protocol) {}

VehicleProtocol ConnectionProtocol::protocol() const
{
    return m_protocol;
}

std::string ConnectionProtocol::description() const
{
    return std::string(rowOf(m_protocol).description);
}

ObdProtocol toObdProtocol(VehicleProtocol protocol)
{
    return rowOf(protocol).family;
}

} // namespace obd
