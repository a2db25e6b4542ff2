#include "libvelmora/uds/moduleaddress.h"

#include <fmt/format.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::size_t shortHeader = 3;
constexpr std::size_t longHeader = 8;
// Modules with an address byte wait for one, and answer slowly: 64 hex or more, and no shortening by the adapter.
constexpr unsigned int extendedWaitMs = 500;
constexpr char const* usualTester = "F1";
constexpr unsigned int longestIdentifier11 = 0x7FF;

// Six digits leave the priority of ISO 15765-4 away.
std::string wholeIdentifier(std::string const& text)
{
    return text.size() == 6 ? "18" + text : text;
}

AddressOrReason refused(std::string reason)
{
    return {std::nullopt, std::move(reason)};
}

// The adapter sends flow control by itself to the modules of ISO 15765-4 only. 00 00: all frames at once, since the
// adapter answers a first frame no second time.
void addFlowControl(RequestAddress& address, std::string const& header)
{
    address.flowHeader = header;
    address.flowData = address.extended + "300000";
}

} // namespace

bool isCanBus(obd::ObdProtocol protocol)
{
    return protocol == obd::ObdProtocolCan11 || protocol == obd::ObdProtocolCan29;
}

bool isBroadcast(Signal const& signal)
{
    return signal.header.empty() || signal.header == "7DF" || wholeIdentifier(signal.header) == "18DB33F1";
}

AddressOrReason addressOf(std::string const& header, std::string const& reply, std::optional<unsigned char> ext,
                          obd::ObdProtocol protocol)
{
    if (!isCanBus(protocol)) {
        return refused("the bus is no CAN; only there modules are asked by a header of their own");
    }
    RequestAddress address;
    address.header = wholeIdentifier(header);
    std::size_t const digits = protocol == obd::ObdProtocolCan29 ? longHeader : shortHeader;
    if (address.header.size() != digits) {
        return refused(
            fmt::format("the header {} is none of this bus, whose identifiers have {} digits", header, digits));
    }
    std::optional<std::string> const standard = standardReply(address.header);
    address.reply = reply.empty() ? standard.value_or("") : wholeIdentifier(reply);
    if (address.reply.size() != digits) {
        return refused(reply.empty() ? "the identifier of its reply is not told"
                                     : fmt::format("the reply {} is none of this bus", reply));
    }
    address.stays = true;
    if (ext) {
        address.extended = frameDigits({*ext});
        address.tester = usualTester;
    }
    if (ext || !standard || *standard != address.reply) {
        addFlowControl(address, address.header);
    }
    if (ext) {
        address.adaptive = false;
        address.waitMs = extendedWaitMs;
    }
    return {address, {}};
}

AddressOrReason addressOf(Signal const& signal, obd::ObdProtocol protocol)
{
    AddressOrReason result = addressOf(signal.header, signal.reply, signal.extendedAddress, protocol);
    if (!result.address) {
        return result;
    }
    RequestAddress& address = *result.address;
    if (signal.tester) {
        address.tester = frameDigits({*signal.tester});
    }
    if (signal.flowControl) {
        address.flowHeader = wholeIdentifier(signal.flowControl->header);
        address.flowData = frameDigits(signal.flowControl->data);
    }
    if (signal.timeout) {
        address.waitMs = std::max(address.waitMs, *signal.timeout);
    }
    return result;
}

std::optional<std::string> standardRequest(unsigned int reply)
{
    if (reply >= 0x7E8 && reply <= 0x7EF) {
        return fmt::format("{:03X}", reply - 8);
    }
    if ((reply & 0xFFFFFF00U) == 0x18DAF100U) {
        return fmt::format("18DA{:02X}F1", reply & 0xFFU);
    }
    return std::nullopt;
}

std::string identifierText(unsigned int id)
{
    return id <= longestIdentifier11 ? fmt::format("{:03X}", id) : fmt::format("{:08X}", id);
}

} // namespace velmora
