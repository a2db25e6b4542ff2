#pragma once

#include "simulator/adapter/command.h"

/// The commands behind the table in command.cpp.
namespace obdsim::handler {

CommandReply accept(CommandContext& context, std::string const& argument);
CommandReply keep(CommandContext& context, std::string const& argument);
CommandReply reset(CommandContext& context, std::string const& argument);
CommandReply warmStart(CommandContext& context, std::string const& argument);
CommandReply defaults(CommandContext& context, std::string const& argument);
CommandReply identity(CommandContext& context, std::string const& argument);
CommandReply description(CommandContext& context, std::string const& argument);
CommandReply identifier(CommandContext& context, std::string const& argument);
CommandReply timeout(CommandContext& context, std::string const& argument);
CommandReply adaptiveTiming(CommandContext& context, std::string const& argument);
CommandReply voltage(CommandContext& context, std::string const& argument);
CommandReply activityCount(CommandContext& context, std::string const& argument);
CommandReply activity(CommandContext& context, std::string const& argument);
CommandReply savedByte(CommandContext& context, std::string const& argument);
CommandReply saveByte(CommandContext& context, std::string const& argument);
CommandReply ignition(CommandContext& context, std::string const& argument);
CommandReply parameters(CommandContext& context, std::string const& argument);
CommandReply baudRate(CommandContext& context, std::string const& argument);
CommandReply baudWait(CommandContext& context, std::string const& argument);
CommandReply sleep(CommandContext& context, std::string const& argument);

CommandReply tryProtocol(CommandContext& context, std::string const& argument);
CommandReply setProtocol(CommandContext& context, std::string const& argument);
CommandReply describeProtocol(CommandContext& context, std::string const& argument);
CommandReply protocolNumber(CommandContext& context, std::string const& argument);
CommandReply closeProtocol(CommandContext& context, std::string const& argument);
CommandReply header(CommandContext& context, std::string const& argument);
CommandReply priority(CommandContext& context, std::string const& argument);
CommandReply canFilter(CommandContext& context, std::string const& argument);
CommandReply canMask(CommandContext& context, std::string const& argument);
CommandReply canAddress(CommandContext& context, std::string const& argument);
CommandReply extendedAddress(CommandContext& context, std::string const& argument);
CommandReply testerAddress(CommandContext& context, std::string const& argument);
CommandReply flowHeader(CommandContext& context, std::string const& argument);
CommandReply flowData(CommandContext& context, std::string const& argument);
CommandReply flowMode(CommandContext& context, std::string const& argument);
CommandReply receiveAddress(CommandContext& context, std::string const& argument);
CommandReply automaticReceive(CommandContext& context, std::string const& argument);
CommandReply slowInit(CommandContext& context, std::string const& argument);
CommandReply fastInit(CommandContext& context, std::string const& argument);
CommandReply monitor(CommandContext& context, std::string const& argument);
CommandReply canStatus(CommandContext& context, std::string const& argument);
CommandReply bufferDump(CommandContext& context, std::string const& argument);
CommandReply keywords(CommandContext& context, std::string const& argument);

CommandReply diamexTryProtocol(CommandContext& context, std::string const& argument);
CommandReply diamexProtocol(CommandContext& context, std::string const& argument);
CommandReply obdProsBaudRate(CommandContext& context, std::string const& argument);

/// On and off, for the settings that are nothing else.
template <bool Settings::*member>
CommandReply onOff(CommandContext& context, std::string const& argument)
{
    context.settings.*member = argument == "1";
    return ok();
}

template <bool Settings::*member, bool value>
CommandReply turn(CommandContext& context, std::string const& /*argument*/)
{
    context.settings.*member = value;
    return ok();
}

} // namespace obdsim::handler
