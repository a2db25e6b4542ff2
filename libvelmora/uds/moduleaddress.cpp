#include "libvelmora/uds/moduleaddress.h"

#include "common/text/text.h"

#include <obd/protocolfamily.h>

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
constexpr std::size_t legacyHeader = 6;

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

unsigned int byteOf(std::string const& header, std::size_t place)
{
    return parseHex(header.substr(2 * place, 2), 0xFF).value_or(0);
}

// ISO 14230-2: two bits of the format byte say that one module is meant. SAE J1850: one bit of the priority byte does.
bool isPhysical(std::string const& header, obd::ObdProtocol protocol)
{
    unsigned int const first = byteOf(header, 0);
    return protocol == obd::ObdProtocolIso14230 ? (first & 0xC0U) == 0x80U : (first & 0x04U) != 0;
}

// Format or priority, receiver and sender. The adapter fills in the length, and takes what is sent to the tester.
AddressOrReason legacyAddress(std::string const& header, std::string const& reply, bool extended,
                              obd::ObdProtocol protocol)
{
    if (protocol == obd::ObdProtocolIso9141) {
        return refused("ISO 9141-2 has no header for a single module");
    }
    if (header.size() != legacyHeader) {
        return refused(
            fmt::format("the header {} is none of this bus, whose headers have {} digits", header, legacyHeader));
    }
    if (!isPhysical(header, protocol)) {
        return refused(fmt::format("the header {} does not mean one module", header));
    }
    if (extended) {
        return refused("only CAN has an address byte beside the header");
    }
    if (!reply.empty() && (reply.size() != legacyHeader || reply.substr(4) != header.substr(2, 2))) {
        return refused(
            fmt::format("the reply {} is not one of the module {}, which is asked", reply, header.substr(2, 2)));
    }
    RequestAddress address;
    address.header = header;
    address.stays = true;
    return {address, {}};
}

} // namespace

bool isLegacyHeader(std::string const& header)
{
    return header.size() == legacyHeader;
}

unsigned int answeringModule(RequestAddress const& address)
{
    return isLegacyHeader(address.header) ? byteOf(address.header, 1) : parseHex(address.reply, 0x1FFFFFFF).value_or(0);
}

std::string shownModule(std::string const& reply)
{
    return isLegacyHeader(reply) ? reply.substr(4) : reply;
}

bool isBroadcast(Signal const& signal)
{
    return signal.header.empty() || isFunctionalHeader(signal.header);
}

AddressOrReason addressOf(std::string const& header, std::string const& reply, std::optional<unsigned char> ext,
                          obd::ObdProtocol protocol)
{
    if (!obd::isCan(protocol)) {
        return legacyAddress(header, reply, ext.has_value(), protocol);
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
    if (signal.timeout) {
        address.waitMs = std::max(address.waitMs, *signal.timeout);
    }
    if (isLegacyHeader(address.header)) {
        return result;
    }
    if (signal.tester) {
        address.tester = frameDigits({*signal.tester});
    }
    if (signal.flowControl) {
        address.flowHeader = wholeIdentifier(signal.flowControl->header);
        address.flowData = frameDigits(signal.flowControl->data);
    }
    return result;
}

std::optional<std::string> standardRequest(unsigned int reply, obd::ObdProtocol protocol)
{
    if (protocol == obd::ObdProtocolIso14230 && reply <= 0xFF) {
        return fmt::format("80{:02X}F1", reply);
    }
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
