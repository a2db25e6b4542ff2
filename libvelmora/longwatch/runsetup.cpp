#include "libvelmora/longwatch/runsetup.h"

#include "libvelmora/session/settingsstore.h"
#include "libvelmora/watch/statefolder.h"

#include <velmora/error.h>

#include <charconv>
#include <random>

namespace velmora {

SessionCarOptions watchedCar(CarOptions const& options, WatchSettings const& settings, std::string const& vehicle)
{
    SessionCarOptions result;
    result.session = SessionOptions(options);
    result.session.port = options.port.empty() ? settings.port : options.port;
    result.session.units = Units::Metric;
    result.session.sleep = false;
    result.session.forget = false;
    result.session.onProgress = nullptr;
    result.session.openPort = nullptr;
    result.session.signalFiles.insert(result.session.signalFiles.end(), settings.signals.begin(),
                                      settings.signals.end());
    if (result.session.settingsFile.empty() && runsAsService()) {
        result.session.settingsFile = stateFolder() / "settings.toml";
    }
    result.vehicle = vehicle;
    result.sensors = settings.sensors;
    result.fullVin = settings.fullVin;
    result.fast = settings.fast;
    return result;
}

std::string vehicleName(WatchSettings const& settings)
{
    return settings.vehicle.empty() ? VehicleNames(stateFolder()).last() : settings.vehicle;
}

OutputLimits limitsOf(OutputAddress const& address)
{
    OutputLimits limits;
    std::string const queue = address.option("queue", std::to_string(limits.queue));
    auto const [end, error] = std::from_chars(queue.data(), queue.data() + queue.size(), limits.queue);
    if (error != std::errc() || end != queue.data() + queue.size() || limits.queue == 0) {
        throw Error(ErrorKind::WrongUse, "\"" + queue + "\" is no length of a queue", {"give a number of records"});
    }
    return limits;
}

std::filesystem::path settingsPath(CarOptions const& options)
{
    std::string const named = watchedCar(options, {}, {}).session.settingsFile;
    return named.empty() ? SettingsStore::defaultFile() : std::filesystem::path(named);
}

WatchRules rulesOf(WatchSettings const& settings, std::string const& vehicle)
{
    WatchRules rules;
    rules.vehicle = vehicle;
    rules.battery = settings.battery;
    rules.codesEvery = settings.codesEvery;
    rules.seed = std::random_device()();
    if (settings.vehicle.empty()) {
        rules.isStranger = [vehicle](std::string const& vin) {
            return !vin.empty() && VehicleNames(stateFolder()).of(vin) != vehicle;
        };
    }
    return rules;
}

} // namespace velmora
