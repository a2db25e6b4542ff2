#pragma once

#include <velmora/error.h>
#include <velmora/export.h>
#include <velmora/iport.h>
#include <velmora/reading.h>
#include <velmora/report.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace obd {
class IObdVelmora;
}

namespace velmora {

class CarCore;
class WatchState;

/// How a car is to be reached. What stays empty comes from the settings file, or is the default.
struct CarOptions
{
    std::string port;                 ///< as the program's --port takes it: "192.168.0.10:35000", "sim:petrol-can11"
    std::optional<unsigned int> baud; ///< line rate of a serial port
    std::optional<int> protocol;      ///< the adapter's number of the bus, 1 to 9; searched for if empty
    bool reset = false;               ///< restore and reset the adapter before use
    std::string logFile;
    std::string traceFile;    ///< gets the traffic with the adapter
    std::string settingsFile; ///< velmora/settings.toml in the user's configuration folder if empty

    /// What the car is at while it connects and reads, as lines with their line feeds. On the car's thread.
    std::function<void(std::string const&)> onProgress;
    /// Opens a transport of the application's own in place of `port`; throws Error if it can't. Called for each
    /// connection, on the car's thread.
    std::function<std::unique_ptr<IPort>()> openPort;
};

/// A control module that answers.
struct Module
{
    unsigned int id;
    std::string name;
    std::string description;
};

/// A sensor that a control module offers.
struct Sensor
{
    unsigned int module;
    std::string key;   ///< "RPM"
    std::string pid;   ///< "010C"; empty for a derived value
    std::string title; ///< "Engine RPM"
};

/// What became of the link while a watch goes on.
enum class LinkState : int
{
    Lost,     ///< no readings come; the car tries to come back
    Returned, ///< readings come again
};

/// A watch under way; ends it when it is destroyed. Any thread; once the end has returned, its callbacks aren't running
/// any more, unless the end was called from one of them.
class VELMORA_EXPORT Watch
{
public:
    Watch();
    ~Watch();
    Watch(Watch&&) noexcept;
    Watch& operator=(Watch&&) noexcept;

    void end();

private:
    friend class Car;
    explicit Watch(std::shared_ptr<WatchState> state);

    std::shared_ptr<WatchState> m_state;
};

/// A vehicle behind an adapter. Connects when it is made; throws Error, whose kind tells how far it came: port, adapter
/// or vehicle. A process has one car at a time; making a second one throws Error.
///
/// Works on a thread of its own, on which all callbacks are called, one at a time. The functions wait for it and may be
/// called from any thread but that one: from a callback they throw Error. They all throw Error if the link is lost.
/// Sensors are named as the program takes them: "RPM", "0C", "coolant", "7E9:RPM", all of a module by "all".
class VELMORA_EXPORT Car
{
public:
    using OnReading = std::function<void(Reading const&)>;
    using OnLink = std::function<void(LinkState)>;

    explicit Car(std::string const& port);
    explicit Car(CarOptions options);
    /// Closes the connection. Not from a callback. An opening of a network port that is under way is waited for, ten
    /// seconds at most.
    ~Car();
    Car(Car const&) = delete;
    Car& operator=(Car const&) = delete;

    /// Each sensor once, in the order of the words. A sensor that told nothing has a reading without a value.
    std::vector<Reading> read(std::vector<std::string> const& sensors);
    /// Reads over and over, until the result is destroyed. onLink is told of each loss and each return of the link;
    /// after a loss the car tries to come back for as long as there is a watch. onReading must take less time than the
    /// readings come in.
    /// A sensor may have a rate: "RPM@10hz".
    [[nodiscard]] Watch watch(std::vector<std::string> const& sensors, OnReading onReading, OnLink onLink = {});

    /// The trouble codes of all control modules. Throws Error if none told any of its lists; whether each module told
    /// all of its own is in codeReports.
    std::vector<StoredCode> codes();
    std::vector<ModuleTopic<CodeReport>> codeReports();
    /// Of all control modules, the newest frame as a rule being 0.
    std::vector<ModuleTopic<FreezeReport>> freezeFrame(unsigned char frame = 0);
    std::vector<ModuleTopic<ReadinessReport>> readiness();
    std::vector<ModuleTopic<MonitorsReport>> monitors();
    std::vector<ModuleTopic<InfoReport>> info();
    std::vector<Module> modules();
    std::vector<Sensor> sensors();
    /// All of the above but readings. Takes seconds.
    VehicleReport report();

    /// Connects anew after a loss.
    void reconnect();

    /// The rest of the core: runs a function on the car's thread, the one that dispatches, with the top-level object
    /// of <obd/obd.h>. What it makes there must be gone when it returns. An exception comes back to the caller.
    void library(std::function<void(obd::IObdVelmora&)> const& function);

private:
    std::shared_ptr<CarCore> m_core;
};

VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Module const& module);
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Sensor const& sensor);
/// "lost" or "returned".
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, LinkState state);

} // namespace velmora
