#pragma once

#include "simulator/adapter/command.h"

/// The commands behind the table in command.cpp.
namespace obdsim::handler {

CommandReply accept(CommandContext& context, const std::string& argument);
CommandReply reset(CommandContext& context, const std::string& argument);
CommandReply defaults(CommandContext& context, const std::string& argument);
CommandReply identity(CommandContext& context, const std::string& argument);
CommandReply description(CommandContext& context, const std::string& argument);
CommandReply identifier(CommandContext& context, const std::string& argument);
CommandReply timeout(CommandContext& context, const std::string& argument);
CommandReply adaptiveTiming(CommandContext& context, const std::string& argument);
CommandReply voltage(CommandContext& context, const std::string& argument);
CommandReply ignition(CommandContext& context, const std::string& argument);
CommandReply parameters(CommandContext& context, const std::string& argument);
CommandReply baudRate(CommandContext& context, const std::string& argument);
CommandReply baudWait(CommandContext& context, const std::string& argument);
CommandReply sleep(CommandContext& context, const std::string& argument);

CommandReply tryProtocol(CommandContext& context, const std::string& argument);
CommandReply setProtocol(CommandContext& context, const std::string& argument);
CommandReply describeProtocol(CommandContext& context, const std::string& argument);
CommandReply protocolNumber(CommandContext& context, const std::string& argument);
CommandReply closeProtocol(CommandContext& context, const std::string& argument);
CommandReply header(CommandContext& context, const std::string& argument);
CommandReply priority(CommandContext& context, const std::string& argument);
CommandReply canFilter(CommandContext& context, const std::string& argument);
CommandReply canMask(CommandContext& context, const std::string& argument);
CommandReply canAddress(CommandContext& context, const std::string& argument);
CommandReply receiveAddress(CommandContext& context, const std::string& argument);
CommandReply automaticReceive(CommandContext& context, const std::string& argument);
CommandReply slowInit(CommandContext& context, const std::string& argument);
CommandReply fastInit(CommandContext& context, const std::string& argument);
CommandReply monitor(CommandContext& context, const std::string& argument);
CommandReply canStatus(CommandContext& context, const std::string& argument);
CommandReply bufferDump(CommandContext& context, const std::string& argument);
CommandReply keywords(CommandContext& context, const std::string& argument);

CommandReply diamexTryProtocol(CommandContext& context, const std::string& argument);
CommandReply diamexProtocol(CommandContext& context, const std::string& argument);
CommandReply obdProsBaudRate(CommandContext& context, const std::string& argument);

/// On and off, for the settings that are nothing else.
template <bool Settings::*member>
CommandReply onOff(CommandContext& context, const std::string& argument)
{
    context.settings.*member = argument == "1";
    return ok();
}

} // namespace obdsim::handler
