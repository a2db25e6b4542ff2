#include "simulator/adapter/command.h"

#include "simulator/adapter/handlers.h"

#include <algorithm>
#include <string_view>

namespace obdsim {

namespace {

constexpr unsigned int mask(AdapterFamily family)
{
    return static_cast<unsigned int>(family);
}

constexpr unsigned int elm = mask(AdapterFamily::Elm) | mask(AdapterFamily::Stn);
constexpr unsigned int diamex = mask(AdapterFamily::Diamex);
constexpr unsigned int obdPros = mask(AdapterFamily::ObdPros);
constexpr unsigned int all = ~0U;
constexpr unsigned int notDiamex = all & ~diamex;
constexpr unsigned int hasBaudRate = all & ~obdPros & ~mask(AdapterFamily::ObdKey);

using namespace handler;

// clang-format off
Command const commands[] = {
    {"@1", "", 100, notDiamex, description},
    {"@2", "", 100, notDiamex & ~elm, identifier},
    {"@2", "", 130, elm, identifier},
    {"@3", "*", 130, elm, keep},
    {"!00", "", 100, diamex, identifier},
    {"!01", "", 100, diamex, description},
    {"!10", "", 100, diamex, voltage},
    {"AL", "", 100, all, turn<&Settings::longMessages, true>},
    {"AMC", "", 200, elm, activityCount},
    {"AMT", "hh", 200, elm, accept},
    {"AR", "", 120, all, automaticReceive},
    {"AT", "t", 120, all, adaptiveTiming},
    {"BD", "", 100, all, bufferDump},
    {"BI", "", 100, all, accept},
    {"BRD", "hh", 120, hasBaudRate, baudRate},
    {"BRT", "hh", 120, hasBaudRate, baudWait},
    {"C", "f", 230, elm, accept},
    {"CAF", "f", 100, all, onOff<&Settings::formatting>},
    {"CEA", "|hh", 140, all, extendedAddress},
    {"CER", "hh", 220, elm, accept},
    {"CF", "hhh|hhhhhhhh", 100, all, canFilter},
    {"CFC", "f", 100, all, onOff<&Settings::flowControl>},
    {"CM", "hhh|hhhhhhhh", 100, all, canMask},
    {"CP", "hh", 100, all, priority},
    {"CRA", "", 142, all, canAddress},
    {"CRA", "hhh|hhhhhhhh", 130, all, canAddress},
    {"CRA", "xxx|xxxxxxxx", 200, all, canAddress},
    {"CS", "", 100, all, canStatus},
    {"CSM", "f", 142, all, accept},
    {"CTM", "1|5", 210, elm, accept},
    {"CV", "hhhh", 100, all, keep},
    {"D", "", 100, all, defaults},
    {"D", "f", 130, all, onOff<&Settings::lengths>},
    {"DM1", "", 120, all, monitor},
    {"DP", "", 100, all, describeProtocol},
    {"DPN", "", 100, notDiamex, protocolNumber},
    {"E", "f", 100, all, onOff<&Settings::echo>},
    {"FCSD", "*", 110, all, flowData},
    {"FCSH", "hhh|hhhhhhhh", 110, all, flowHeader},
    {"FCSM", "t", 110, all, flowMode},
    {"FE", "", 131, all, accept},
    {"FI", "", 140, all, fastInit},
    {"FT", "|hh", 220, elm, accept},
    {"H", "f", 100, all, onOff<&Settings::headers>},
    {"I", "", 100, all, identity},
    {"IB", "10|96", 100, all, accept},
    {"IB", "48", 140, all, accept},
    {"IB", "12|15", 220, elm, accept},
    {"IFR", "t|H|S", 120, all, accept},
    {"IFR", "4|5|6", 220, elm, accept},
    {"IA", "", 220, elm, activity},
    {"IGN", "", 140, all, ignition},
    {"IIA", "hh", 120, all, accept},
    {"JE", "", 130, all, accept},
    {"JHF", "f", 142, all, accept},
    {"JS", "", 130, all, accept},
    {"JTM", "1|5", 142, all, accept},
    {"KW", "", 130, all, keywords},
    {"KW", "f", 120, all, accept},
    {"L", "f", 100, all, onOff<&Settings::linefeeds>},
    {"LP", "", 140, all, handler::sleep},
    {"M", "f", 100, all, accept},
    {"MA", "", 100, all, monitor},
    {"MP", "hhhh", 120, all, monitor},
    {"MP", "hhhhhh", 130, all, monitor},
    {"MP", "hhhhh|hhhhhhh", 142, all, monitor},
    {"MR", "hh", 100, all, monitor},
    {"MT", "hh", 100, all, monitor},
    {"N", "", 100, diamex, protocolNumber},
    {"NL", "", 100, all, turn<&Settings::longMessages, false>},
    {"P", "h", 100, diamex, diamexProtocol},
    {"PA", "h", 100, diamex, diamexTryProtocol},
    {"PB", "hhhh", 140, all, accept},
    {"PC", "", 100, all, closeProtocol},
    {"PP", "hhON|hhOFF|hhSVhh", 110, all, keep},
    {"PPS", "", 110, all, parameters},
    {"R", "f", 100, all, onOff<&Settings::responses>},
    {"RA", "hh", 130, all, receiveAddress},
    {"RD", "", 140, all, savedByte},
    {"RTR", "", 130, all, accept},
    {"RV", "", 100, notDiamex, voltage},
    {"S", "f", 130, all, onOff<&Settings::spaces>},
    {"SCS", "h", 100, obdPros, obdProsBaudRate},
    {"SD", "hh", 140, all, saveByte},
    {"SH", "hhh|hhhhhh", 100, all, header},
    {"SH", "hhhhhhhh", 200, all, header},
    {"SI", "", 140, all, slowInit},
    {"SP", "h|Ah", 100, notDiamex, setProtocol},
    {"SP", "00", 130, notDiamex, setProtocol},
    {"SR", "hh", 120, all, receiveAddress},
    {"SS", "", 140, all, accept},
    {"ST", "h|hh", 100, all, timeout},
    {"SW", "h|hh", 100, all, accept},
    {"TA", "hh", 140, all, testerAddress},
    {"TP", "h|Ah", 100, elm, tryProtocol},
    {"V", "f", 130, all, accept},
    {"WM", "hhhhhhhh|hhhhhhhhhh|hhhhhhhhhhhh", 100, all, accept},
    {"WM", "hh|hhhh|hhhhhh", 120, all, accept},
    {"WS", "", 100, all, warmStart},
    {"Z", "", 100, all, reset},
};
// clang-format on

bool fits(char token, char character)
{
    switch (token) {
    case 'h':
        return isHexDigit(character);
    case 'x':
        return isHexDigit(character) || character == 'X';
    case 'f':
        return character == '0' || character == '1';
    case 't':
        return character >= '0' && character <= '2';
    default:
        return token == character;
    }
}

bool matchesOne(std::string_view shape, std::string const& argument)
{
    if (shape == "*") {
        return isHexText(argument);
    }
    return shape.size() == argument.size() && std::equal(shape.begin(), shape.end(), argument.begin(), fits);
}

bool matches(std::string_view shape, std::string const& argument)
{
    while (true) {
        auto const bar = shape.find('|');
        if (matchesOne(shape.substr(0, bar), argument)) {
            return true;
        }
        if (bar == std::string_view::npos) {
            return false;
        }
        shape.remove_prefix(bar + 1);
    }
}

bool knows(AdapterProfile const& profile, Command const& command)
{
    return (command.families & mask(profile.family)) != 0 && command.level <= profile.level;
}

std::optional<CommandCall> findExact(AdapterProfile const& profile, std::string const& text)
{
    for (auto const& command : commands) {
        std::string_view const name = command.name;
        if (text.compare(0, name.size(), name) == 0 && knows(profile, command)) {
            std::string const argument = text.substr(name.size());
            if (matches(command.shape, argument)) {
                return CommandCall{&command, argument};
            }
        }
    }
    return std::nullopt;
}

} // namespace

std::optional<CommandCall> findCommand(AdapterProfile const& profile, std::string const& text)
{
    auto call = findExact(profile, text);
    if (!call && profile.quirks.has(Quirk::FirstLettersOnly) && text.size() > 1) {
        return findCommand(profile, text.substr(0, text.size() - 1));
    }
    return call;
}

Settings factorySettings(AdapterProfile const& profile)
{
    constexpr int stnTicks = 0x19; // 102 ms; family reference manual of the STN11xx and STN21xx, page 17
    Settings settings;
    settings.linefeeds = profile.quirks.has(Quirk::LinefeedsOn);
    settings.defaultTicks = profile.family == AdapterFamily::Stn ? stnTicks : settings.defaultTicks;
    return settings;
}

CommandReply ok()
{
    return line("OK");
}

CommandReply stored()
{
    return {{"OK"}, After::Nothing, Ms(30)};
}

CommandReply refused()
{
    return line("?");
}

CommandReply line(std::string text)
{
    return {{std::move(text)}, After::Nothing, Time(0)};
}

} // namespace obdsim
