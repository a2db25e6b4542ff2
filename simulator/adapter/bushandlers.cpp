#include "simulator/adapter/handlers.h"

namespace obdsim::handler {

namespace {

constexpr std::uint32_t largestProtocol = 0xC;

/// The bytes of a header of 3, 6 or 8 digits; 11-bit identifiers take two bytes.
Bytes headerBytes(std::string const& digits)
{
    return parseHex(digits.size() % 2 == 0 ? digits : "0" + digits).value_or(Bytes{});
}

CommandReply fromBus(BusReply const& reply)
{
    std::string text;
    for (auto const& part : reply.texts) {
        text += part.text;
    }
    text.pop_back();
    return {{text}, After::Nothing, reply.end};
}

} // namespace

CommandReply tryProtocol(CommandContext& context, std::string const& argument)
{
    bool const searches = argument.size() > 1 && argument[0] == 'A';
    auto const number = parseHexNumber(searches ? argument.substr(1) : argument).value_or(0);
    if (number > largestProtocol) {
        return refused();
    }
    context.bus.select(static_cast<int>(number), searches || number == 0);
    return ok();
}

/// Unlike the protocol that is only tried, this one outlasts a reset.
CommandReply setProtocol(CommandContext& context, std::string const& argument)
{
    CommandReply reply = tryProtocol(context, argument);
    context.bus.store();
    reply.delay = stored().delay;
    return reply;
}

CommandReply describeProtocol(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.bus.description());
}

CommandReply protocolNumber(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.bus.numberText());
}

CommandReply closeProtocol(CommandContext& context, std::string const& /*argument*/)
{
    context.bus.close();
    return ok();
}

CommandReply header(CommandContext& context, std::string const& argument)
{
    context.settings.header = headerBytes(argument);
    return ok();
}

CommandReply priority(CommandContext& context, std::string const& argument)
{
    context.settings.priority = static_cast<std::uint8_t>(parseHexNumber(argument).value_or(0));
    return ok();
}

CommandReply canFilter(CommandContext& context, std::string const& argument)
{
    context.settings.canFilter = parseHexNumber(argument);
    return ok();
}

CommandReply canMask(CommandContext& context, std::string const& argument)
{
    context.settings.canMask = parseHexNumber(argument);
    return ok();
}

/// Filter and mask in one; without an address back to hearing all.
CommandReply canAddress(CommandContext& context, std::string const& argument)
{
    context.settings.canFilter.reset();
    context.settings.canMask.reset();
    if (argument.empty()) {
        return ok();
    }
    std::string filter = argument;
    std::string mask = argument;
    for (std::size_t i = 0; i < argument.size(); ++i) {
        bool const any = argument[i] == 'X';
        filter[i] = any ? '0' : argument[i];
        mask[i] = any ? '0' : 'F';
    }
    context.settings.canFilter = parseHexNumber(filter);
    context.settings.canMask = parseHexNumber(mask);
    return ok();
}

CommandReply extendedAddress(CommandContext& context, std::string const& argument)
{
    context.settings.extendedAddress.reset();
    if (auto const address = parseHex(argument); address && !address->empty()) {
        context.settings.extendedAddress = (*address)[0];
    }
    return ok();
}

CommandReply testerAddress(CommandContext& context, std::string const& argument)
{
    context.settings.testerAddress = static_cast<std::uint8_t>(parseHexNumber(argument).value_or(0));
    return ok();
}

CommandReply flowHeader(CommandContext& context, std::string const& argument)
{
    context.settings.flowHeader = parseHexNumber(argument);
    return ok();
}

/// One to five bytes (ELM327 data sheet v2.1, "FC SD").
CommandReply flowData(CommandContext& context, std::string const& argument)
{
    constexpr std::size_t most = 5;
    auto const data = parseHex(argument);
    if (!data || data->empty() || data->size() > most) {
        return refused();
    }
    context.settings.flowData = *data;
    return ok();
}

/// A mode of one's own needs what it is to send first.
CommandReply flowMode(CommandContext& context, std::string const& argument)
{
    int const mode = argument[0] - '0';
    bool const lacks = (mode == 1 && !context.settings.flowHeader) || (mode != 0 && context.settings.flowData.empty());
    if (lacks) {
        return refused();
    }
    context.settings.flowMode = mode;
    return ok();
}

CommandReply receiveAddress(CommandContext& context, std::string const& argument)
{
    context.settings.receiveAddress = static_cast<std::uint8_t>(parseHexNumber(argument).value_or(0));
    return ok();
}

CommandReply automaticReceive(CommandContext& context, std::string const& /*argument*/)
{
    context.settings.receiveAddress.reset();
    context.settings.canFilter.reset();
    context.settings.canMask.reset();
    return ok();
}

CommandReply slowInit(CommandContext& context, std::string const& /*argument*/)
{
    return fromBus(context.bus.wake(BusInit::FiveBaud));
}

CommandReply fastInit(CommandContext& context, std::string const& /*argument*/)
{
    return fromBus(context.bus.wake(BusInit::Fast));
}

CommandReply monitor(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return {{}, After::Monitor, Time(0)};
}

CommandReply canStatus(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return line("T:00 R:00 ");
}

/// The adapter's message buffer: its length, and twelve bytes.
CommandReply bufferDump(CommandContext& context, std::string const& /*argument*/)
{
    Bytes buffer(13, 0);
    Bytes const* header = context.settings.header ? &*context.settings.header : nullptr;
    buffer[0] = header == nullptr ? std::uint8_t{0} : static_cast<std::uint8_t>(header->size());
    for (std::size_t i = 0; header != nullptr && i < header->size(); ++i) {
        buffer[i + 1] = (*header)[i];
    }
    return line(hexText(buffer, " ") + " ");
}

/// Key words exist once a K line has been woken: 08 08 on ISO 9141-2, 8F E9 on KWP.
CommandReply keywords(CommandContext& context, std::string const& /*argument*/)
{
    Protocol const* protocol = context.bus.protocol();
    if (protocol == nullptr || protocol->init == BusInit::None || !context.bus.isOpen()) {
        return line("1:-- 2:--");
    }
    return line(protocol->family == BusFamily::Kwp ? "1:E9 2:8F" : "1:08 2:08");
}

/// Diamex adapters repeat the chosen number: "6=ISO 15765-4 (CAN 11/500)".
CommandReply diamexTryProtocol(CommandContext& context, std::string const& argument)
{
    CommandReply const reply = tryProtocol(context, argument);
    bool const chosen = reply.lines.front() == "OK";
    return chosen ? line(argument + "=" + context.bus.description()) : reply;
}

CommandReply diamexProtocol(CommandContext& context, std::string const& argument)
{
    CommandReply reply = diamexTryProtocol(context, argument);
    context.bus.store();
    return reply;
}

} // namespace obdsim::handler
