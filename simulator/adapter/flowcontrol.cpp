#include "simulator/adapter/flowcontrol.h"

namespace obdsim {

namespace {

/// The PCI byte of a CAN frame, behind the address byte where there is one.
std::uint8_t pciOf(Frame const& frame, bool extended)
{
    std::size_t const at = extended ? 1 : 0;
    return frame.data.size() > at ? frame.data[at] : std::uint8_t{0};
}

/// The identifier to which an adapter sends flow control by itself. For replies that are no OBD module's it takes that
/// of the reply, which no module heeds.
std::uint32_t automaticFlowHeader(Protocol const& protocol, std::uint32_t reply)
{
    if (protocol.family == BusFamily::Can11) {
        return (reply & 0x7F8) == 0x7E8 ? reply - 8 : reply;
    }
    bool const obd = (reply & 0x1FFFFF00) == 0x18DAF100;
    return obd ? 0x18DA00F1 | (reply & 0xFF) << 8 : reply;
}

std::uint32_t requestIdentifier(Protocol const& protocol, ModuleData const& module)
{
    std::uint32_t const usual = protocol.family == BusFamily::Can11
                                    ? module.id - 8
                                    : (module.id & 0xFFFF0000U) | (module.id & 0xFF) << 8 | (module.id >> 8 & 0xFF);
    return module.request.value_or(usual);
}

} // namespace

bool isFirstFrame(Frame const& frame, bool extended)
{
    return pciOf(frame, extended) >> 4 == 0x1;
}

bool isConsecutiveFrame(Frame const& frame, bool extended)
{
    return pciOf(frame, extended) >> 4 == 0x2;
}

std::size_t promisedFrames(Frame const& frame, bool extended)
{
    std::size_t const at = extended ? 1 : 0;
    if (frame.data.size() < at + 2) {
        return 0;
    }
    std::size_t const length = (frame.data[at] & 0x0FU) << 8U | frame.data[at + 1];
    std::size_t const inFirst = 6 - at;
    std::size_t const inEach = 7 - at;
    return length > inFirst ? (length - inFirst + inEach - 1) / inEach : 0;
}

int allowedFrames(Protocol const& protocol, Settings const& settings, ModuleData const& module)
{
    constexpr int all = 0xFFF;
    if (!settings.flowControl) {
        return 0;
    }
    std::uint32_t header = settings.flowMode == 2 ? module.id : automaticFlowHeader(protocol, module.id);
    Bytes data = {0x30, 0x00, 0x00};
    if (settings.flowMode != 0) {
        header = settings.flowMode == 1 ? settings.flowHeader.value_or(0) : header;
        data = settings.flowData;
    }
    if (module.address) {
        bool const addressed = !data.empty() && data[0] == *module.address;
        data = addressed ? Bytes(data.begin() + 1, data.end()) : Bytes();
    }
    if (header != requestIdentifier(protocol, module) || data.empty() || data[0] != 0x30) {
        return 0;
    }
    return data.size() < 2 || data[1] == 0 ? all : data[1];
}

} // namespace obdsim
