#pragma once

#include <obd/isettings.h>

#include <limits>

namespace obd::settings {

// An integer key: what it reads as without a value, and the range outside of which a value reads as if it weren't
// there.
struct IntKey
{
    char const* key;
    int fallback;
    int lowest = std::numeric_limits<int>::min();
    int highest = std::numeric_limits<int>::max();
};

constexpr IntKey unitSystem{"common/unitsystem", 0, 0, 1};
constexpr IntKey language{"common/language", 0, 0, 19};
constexpr IntKey fuelCorrectionFactor{"common/fuelcorrectionfactor", 100}; // hundredths
constexpr IntKey volumetricEfficiency{"common/volumetricefficiency", 85, 0, 100};
constexpr IntKey engineDisplacement{"common/enginedisplacement", 200}; // hundredths of a litre
constexpr IntKey vehicleWeight{"common/vehicleweight", 1500, 0};
constexpr IntKey fuelTypeOverride{"common/fueltypeoverride", 0};
constexpr IntKey ignitionType{"common/ignitiontype", 0, 0, 1};

constexpr IntKey bus{"connection/bus", 0, 0, 2};
constexpr IntKey protocol{"connection/protocol", 0, 0, 9};

constexpr char const* bluetoothName = "connection/bt/name";
constexpr char const* bluetoothAddress = "connection/bt/address";
constexpr char const* bluetoothPort = "connection/bt/port";

constexpr char const* serialDevice = "connection/serial/device";
constexpr char const* serialAutoBaudrate = "connection/serial/autobaudrate";
constexpr IntKey serialBaudrate{"connection/serial/baudrate", 9600};
constexpr IntKey serialInitialBaudrate{"connection/serial/initialbaudrate", 0};
constexpr char const* serialDescription = "connection/serial/description";

constexpr char const* tcpAddress = "connection/tcp/address";
constexpr char const* tcpPort = "connection/tcp/port";

constexpr IntKey rememberedSize{"bluetooth/size", 0};

// Reads a key by its rule.
int readInt(ISettings& store, IntKey const& key);

} // namespace obd::settings
