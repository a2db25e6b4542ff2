#include "simulator/adapter/handlers.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace obdsim::handler {

namespace {

constexpr Time resetTime = Ms(800);
constexpr Time baudWaitStep = Ms(5);

// ATPPS: the programmable parameters of a v1.5 as delivered, number:value F(actory)/N.
constexpr char const* parameterLines[] = {
    "00:FF F  01:FF F  02:FF F  03:32 F", "04:01 F  05:FF F  06:F1 F  07:09 F", "08:FF F  09:00 F  0A:0A F  0B:FF F",
    "0C:68 F  0D:0D F  0E:9A F  0F:FF F", "10:0D F  11:00 F  12:FF F  13:32 F", "14:FF F  15:0A F  16:FF F  17:92 F",
    "18:00 F  19:28 F  1A:FF F  1B:FF F", "1C:FF F  1D:FF F  1E:FF F  1F:FF F", "20:FF F  21:FF F  22:FF F  23:FF F",
    "24:00 F  25:00 F  26:00 F  27:FF F", "28:FF F  29:FF F  2A:38 F  2B:02 F", "2C:81 F  2D:04 F  2E:81 F  2F:01 F",
};

int hexValue(std::string const& digits)
{
    return static_cast<int>(parseHexNumber(digits).value_or(0));
}

} // namespace

CommandReply accept(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return ok();
}

CommandReply keep(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return stored();
}

CommandReply reset(CommandContext& context, std::string const& /*argument*/)
{
    context.settings = factorySettings(context.profile);
    context.bus.restore();
    return {{context.profile.banner}, After::Reset, resetTime};
}

/// As a reset, without the self-test: 2 ms (ELM327 data sheet v2.1, page 7).
CommandReply warmStart(CommandContext& context, std::string const& argument)
{
    CommandReply reply = reset(context, argument);
    reply.delay = Ms(2);
    return reply;
}

CommandReply defaults(CommandContext& context, std::string const& /*argument*/)
{
    bool const echo = context.settings.echo;
    context.settings = factorySettings(context.profile);
    context.settings.echo = echo || !context.profile.quirks.has(Quirk::EchoKeptOff);
    context.bus.restore();
    return ok();
}

CommandReply identity(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.profile.banner);
}

CommandReply description(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.profile.description);
}

CommandReply identifier(CommandContext& context, std::string const& /*argument*/)
{
    return context.profile.identifier.empty() ? refused() : line(context.profile.identifier);
}

CommandReply timeout(CommandContext& context, std::string const& argument)
{
    context.settings.timeoutTicks = hexValue(argument);
    return ok();
}

CommandReply adaptiveTiming(CommandContext& context, std::string const& argument)
{
    context.settings.adaptiveTiming = hexValue(argument);
    return ok();
}

CommandReply voltage(CommandContext& context, std::string const& /*argument*/)
{
    auto const tenths = std::lround(context.bus.volts(context.now) * 10);
    return line(std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) + "V");
}

/// Steps of 0.65536 s without a byte on the bus, of which it counts 255 (ELM327 data sheet v2.1, "AMC"). Nothing moves
/// on our buses but what the adapter asks for.
CommandReply activityCount(CommandContext& context, std::string const& /*argument*/)
{
    constexpr Time step(655360);
    constexpr Time::rep most = 0xFF;
    auto const steps = std::min(context.bus.quietFor(context.now) / step, most);
    return line(hexByte(static_cast<std::uint8_t>(steps)));
}

/// Whether the protocol is active.
CommandReply activity(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.bus.isOpen() ? "Y" : "N");
}

CommandReply savedByte(CommandContext& context, std::string const& /*argument*/)
{
    return line(hexByte(context.bus.savedByte()));
}

CommandReply saveByte(CommandContext& context, std::string const& argument)
{
    context.bus.saveByte(static_cast<std::uint8_t>(hexValue(argument)));
    return stored();
}

CommandReply ignition(CommandContext& context, std::string const& /*argument*/)
{
    return line(context.bus.ignition() ? "ON" : "OFF");
}

CommandReply parameters(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return {{std::begin(parameterLines), std::end(parameterLines)}, After::Nothing, Time(0)};
}

CommandReply baudRate(CommandContext& /*context*/, std::string const& argument)
{
    if (hexValue(argument) == 0) {
        return refused();
    }
    return {{"OK"}, After::BaudRate, Time(0)};
}

CommandReply baudWait(CommandContext& context, std::string const& argument)
{
    context.settings.baudWait = hexValue(argument) * baudWaitStep;
    return ok();
}

CommandReply sleep(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return {{"OK"}, After::Sleep, Time(0)};
}

CommandReply obdProsBaudRate(CommandContext& /*context*/, std::string const& /*argument*/)
{
    return ok();
}

} // namespace obdsim::handler
