#pragma once

#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/outputworker.h"
#include "libvelmora/watch/sessioncar.h"
#include "libvelmora/watch/watchengine.h"
#include "libvelmora/watch/watchsettings.h"

#include <filesystem>
#include <string>

// What a run of the watch makes of its options and settings.
namespace velmora {

// The options of the car stand above the settings. What only a person beside it could want is left out.
SessionCarOptions watchedCar(CarOptions const& options, WatchSettings const& settings, std::string const& vehicle);

// The name of the vehicle in all outputs: that of the settings, or of the last vehicle without one.
std::string vehicleName(WatchSettings const& settings);

// With the length of its queue. Throws Error for one that is no number.
OutputLimits limitsOf(OutputAddress const& address);

// The settings file of the car that the options mean.
std::filesystem::path settingsPath(CarOptions const& options);

// A vehicle that the settings name may be any; else one that is known by another name is a stranger.
WatchRules rulesOf(WatchSettings const& settings, std::string const& vehicle);

} // namespace velmora
