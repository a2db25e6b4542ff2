#pragma once

#include <velmora/recording.h>
#include <velmora/trips.h>

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <variant>
#include <vector>

namespace velmora {

using WallTime = std::chrono::system_clock::time_point;

// Something that happened, of a kind that eventkinds.h names.
struct Event
{
    WallTime time;
    std::string vehicle;
    std::string kind;                   // lower case and '_'
    std::optional<unsigned int> module; // id, if it concerns one
    std::string text;                   // for people
};

// A control module of the vehicle.
struct ModuleInfo
{
    WallTime time;
    std::string vehicle;
    unsigned int id = 0;
    std::string name;
    std::string description;
    std::string vin; // only if the user wants it kept
};

// All sensors that will be read from now on; replaces the list before.
struct SensorList
{
    WallTime time;
    std::string vehicle;
    std::vector<SensorEntry> sensors;
};

// A trouble code that came or went.
struct CodeChange
{
    WallTime time;
    std::string vehicle;
    unsigned int module = 0;
    std::string code;
    std::string kind; // "confirmed", "pending", "permanent"
    std::string text;
    bool present = true; // false: it has gone
};

// How the malfunction lamp of a module was at a look; told at each of them, also if it is as before.
struct LampState
{
    WallTime time;
    std::string vehicle;
    unsigned int module = 0;
    bool on = false;
};

using Record = std::variant<Reading, Event, Trip, ModuleInfo, SensorList, CodeChange, LampState>;
// Outputs share what they are given, so that one that stands still costs no copies.
using SharedRecord = std::shared_ptr<Record const>;
using Records = std::span<SharedRecord const>;

} // namespace velmora
