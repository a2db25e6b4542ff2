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
const Command commands[] = {
    {"@1", "", 10, notDiamex, description},
    {"@2", "", 10, notDiamex, identifier},
    {"@3", "*", 13, elm, accept},
    {"!00", "", 10, diamex, identifier},
    {"!01", "", 10, diamex, description},
    {"!10", "", 10, diamex, voltage},
    {"AL", "", 10, all, turn<&Settings::longMessages, true>},
    {"AMC", "", 21, elm, accept},
    {"AMT", "hh", 21, elm, accept},
    {"AR", "", 12, all, automaticReceive},
    {"AT", "t", 12, all, adaptiveTiming},
    {"BD", "", 10, all, bufferDump},
    {"BI", "", 10, all, accept},
    {"BRD", "hh", 12, hasBaudRate, baudRate},
    {"BRT", "hh", 12, hasBaudRate, baudWait},
    {"CAF", "f", 10, all, onOff<&Settings::formatting>},
    {"CEA", "|hh", 14, all, extendedAddress},
    {"CF", "hhh|hhhhhhhh", 10, all, canFilter},
    {"CFC", "f", 10, all, onOff<&Settings::flowControl>},
    {"CM", "hhh|hhhhhhhh", 10, all, canMask},
    {"CP", "hh", 10, all, priority},
    {"CRA", "|xxx|xxxxxxxx", 13, all, canAddress},
    {"CS", "", 10, all, canStatus},
    {"CSM", "f", 14, all, accept},
    {"CV", "hhhh", 10, all, accept},
    {"D", "", 10, all, defaults},
    {"D", "f", 13, all, onOff<&Settings::lengths>},
    {"DM1", "", 12, all, monitor},
    {"DP", "", 10, all, describeProtocol},
    {"DPN", "", 10, notDiamex, protocolNumber},
    {"E", "f", 10, all, onOff<&Settings::echo>},
    {"FCSD", "*", 11, all, flowData},
    {"FCSH", "hhh|hhhhhhhh", 11, all, flowHeader},
    {"FCSM", "t", 11, all, flowMode},
    {"FE", "", 13, all, accept},
    {"FI", "", 14, all, fastInit},
    {"H", "f", 10, all, onOff<&Settings::headers>},
    {"I", "", 10, all, identity},
    {"IB", "10|48|96|12|15", 10, all, accept},
    {"IFR", "t", 10, all, accept},
    {"IGN", "", 14, all, ignition},
    {"IIA", "hh", 12, all, accept},
    {"JE", "", 12, all, accept},
    {"JHF", "f", 14, all, accept},
    {"JS", "", 12, all, accept},
    {"KW", "", 13, all, keywords},
    {"KW", "f", 12, all, accept},
    {"L", "f", 10, all, onOff<&Settings::linefeeds>},
    {"LP", "", 14, all, handler::sleep},
    {"M", "f", 10, all, accept},
    {"MA", "", 10, all, monitor},
    {"MR", "hh", 10, all, monitor},
    {"MT", "hh", 10, all, monitor},
    {"N", "", 10, diamex, protocolNumber},
    {"NL", "", 10, all, turn<&Settings::longMessages, false>},
    {"P", "h", 10, diamex, diamexProtocol},
    {"PA", "h", 10, diamex, diamexTryProtocol},
    {"PB", "hhhh", 14, all, accept},
    {"PC", "", 10, all, closeProtocol},
    {"PP", "hhON|hhOFF|hhSVhh", 11, all, accept},
    {"PPS", "", 11, all, parameters},
    {"R", "f", 10, all, onOff<&Settings::responses>},
    {"RA", "hh", 13, all, receiveAddress},
    {"RTR", "", 13, all, accept},
    {"RV", "", 10, notDiamex, voltage},
    {"S", "f", 13, all, onOff<&Settings::spaces>},
    {"SCS", "h", 10, obdPros, obdProsBaudRate},
    {"SH", "hhh|hhhhhh|hhhhhhhh", 10, all, header},
    {"SI", "", 14, all, slowInit},
    {"SP", "h|Ah|00", 10, notDiamex, setProtocol},
    {"SR", "hh", 12, all, receiveAddress},
    {"SS", "", 14, all, accept},
    {"ST", "h|hh", 10, all, timeout},
    {"SW", "h|hh", 10, all, accept},
    {"TA", "hh", 14, all, testerAddress},
    {"TP", "h|Ah", 10, elm, tryProtocol},
    {"V", "f", 13, all, accept},
    {"WM", "*", 10, all, accept},
    {"WS", "", 10, all, reset},
    {"Z", "", 10, all, reset},
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
        const std::string_view name = command.name;
        if (text.compare(0, name.size(), name) == 0 && knows(profile, command)) {
            const std::string argument = text.substr(name.size());
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

CommandReply refused()
{
    return line("?");
}

CommandReply line(std::string text)
{
    return {{std::move(text)}, After::Nothing, Time(0)};
}

} // namespace obdsim
