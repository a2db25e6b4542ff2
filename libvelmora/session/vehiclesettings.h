#pragma once

#include <obd/isettings.h>

#include <span>
#include <string>
#include <string_view>

namespace velmora {

class SettingsStore;

// A setting of the vehicle as people set it.
struct VehicleSetting
{
    char const* name;  // "displacement"
    char const* title; // "Engine displacement"
    char const* unit;  // "l"; empty for none
    char const* key;   // in the store
    int fallback;      // as stored, as are the limits
    int lowest;        // that may be set
    int highest;
    bool strict;                        // what lies outside reads as the fallback
    int decimals;                       // digits behind the point of the number that people see
    std::span<char const* const> words; // in place of the numbers from 0 on, where there are any
    char const* explanation;            // a sentence or two
};

// All of them, in the order of their listing.
std::span<VehicleSetting const> vehicleSettings();

// The setting of that name. Throws Error with the names there are.
VehicleSetting const& findSetting(std::string const& name);

// "1.60", "metric". A stored value that is out of range shows as the default, as it reads.
std::string shownSetting(VehicleSetting const& setting, obd::ISettings& store);
std::string shownDefault(VehicleSetting const& setting);
// "0.05 to 30.00", "metric or imperial".
std::string shownRange(VehicleSetting const& setting);

// The same as a settings file has it: "5 to 3000 hundredths", "0 (metric) or 1 (imperial)".
std::string storedRange(VehicleSetting const& setting);

// Sets it from what a person typed, without bringing it to the disk. Throws Error that tells the range.
void setSetting(VehicleSetting const& setting, std::string const& text, obd::ISettings& store);

// Whether the library or the companion reads a key of the settings file. Others are mistyped, or an application's.
bool isKnownKey(std::string_view key);

// The hundredths that a number with a point stands for, where a key is stored in hundredths. False for any other key,
// and for a number that no int holds.
bool storedHundredths(std::string const& key, double number, int& value);

} // namespace velmora
