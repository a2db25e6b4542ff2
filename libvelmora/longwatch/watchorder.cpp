#include "libvelmora/longwatch/watchorder.h"

#include "libvelmora/poll/sensorwish.h"

#include <velmora/error.h>
#include <velmora/signals.h>

#include <fmt/format.h>

namespace velmora {

namespace {

[[noreturn]] void rejectOption(std::string const& option, std::string const& text, std::string const& expected)
{
    throw Error(ErrorKind::WrongUse, option + ": \"" + text + "\" is not " + expected);
}

// A watch that runs for months had better not begin, nor go on, with files that it can't read.
void checkSignalFiles(std::vector<std::string> const& files)
{
    std::vector<std::string> mistakes;
    for (std::string const& file : files) {
        for (SignalMistake const& each : checkSignals(file).mistakes) {
            mistakes.push_back(toText(each, file));
        }
    }
    if (!mistakes.empty()) {
        throw Error(ErrorKind::WrongUse, fmt::format("{}", fmt::join(mistakes, "\n")));
    }
}

void takeVehicle(WatchSettings& settings, std::string const& name)
{
    if (name.empty()) {
        return;
    }
    if (!isVehicleName(name)) {
        rejectOption("--vehicle", name, "a name of letters, digits, - and _");
    }
    settings.vehicle = name;
}

void takeBattery(BatterySettings& battery, LongWatchOptions const& options)
{
    if (!options.stopAfter.empty()) {
        auto const time = parseDuration(options.stopAfter);
        if (!time || *time < std::chrono::seconds(1)) {
            rejectOption("--stop-after", options.stopAfter, "a time such as 120s or 5min");
        }
        battery.stopAfter = std::chrono::floor<std::chrono::seconds>(*time);
    }
    if (!options.wake.empty() && !parseWake(options.wake, battery)) {
        rejectOption("--wake", options.wake, "\"voltage\" or such as \"every 30min\"");
    }
    battery.electric = battery.electric || options.electric;
}

} // namespace

WatchSettings settingsOf(LongWatchOptions const& options)
{
    WatchSettings settings = options.configFile.empty() ? WatchSettings() : readWatchSettings(options.configFile);
    checkSignalFiles(settings.signals);
    checkSignalFiles(options.car.signalFiles);
    if (!options.sensors.empty()) {
        settings.sensors = options.sensors;
        for (std::string const& each : options.sensors) {
            parseSensorWish(each);
        }
    }
    for (std::string const& each : options.outputs) {
        settings.outputs.push_back(parseOutputAddress(each));
    }
    takeVehicle(settings, options.vehicle);
    settings.fullVin = options.fullVin.value_or(settings.fullVin);
    takeBattery(settings.battery, options);
    settings.fast = settings.fast || options.fast;
    return settings;
}

} // namespace velmora
