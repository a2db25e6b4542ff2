#pragma once

#include <velmora/iport.h>
#include <velmora/units.h>

#include <functional>
#include <memory>
#include <optional>
#include <stop_token>
#include <string>
#include <vector>

namespace obd {
struct MessageDataModel;
}

namespace velmora {

class Recorder;

/// How a car is to be reached. What stays empty comes from the settings file, or is the default.
///
///     velmora::Car car(velmora::CarOptions{.port = "/dev/ttyUSB0", .protocol = 6});
struct CarOptions
{
    std::string port = {}; ///< as the program's --port takes it: "192.168.0.10:35000", "sim:petrol-can11"
    std::optional<unsigned int> baud = {}; ///< line rate of a serial port
    /// The adapter's number of the bus, 1 to 9, or 0 to search for it whatever the settings say.
    std::optional<int> protocol = {};
    std::optional<Units> units = {};         ///< that values are told in
    std::optional<unsigned int> module = {}; ///< id of the one control module to ask; all of them if empty
    bool reset = false;                      ///< restore and reset the adapter before use
    bool sleep = false;                      ///< send the adapter to sleep at the end, which costs the next visit time
    bool forget = false;                     ///< drop what earlier visits have learnt of adapters and vehicles
    std::string logFile = {};                ///< gets what the library says of its work; none if empty
    std::string traceFile = {};              ///< gets the traffic with the adapter
    std::string settingsFile = {};           ///< velmora/settings.toml in the user's configuration folder if empty
    /// Files of signals of one's own (docs/signals.md), beside those in the folder `signals` of the settings' folder.
    std::vector<std::string> signalFiles = {};

    /// What the car is at while it connects and reads, as lines with their line feeds. On the car's thread.
    std::function<void(std::string const&)> onProgress = {};
    /// Opens a transport of the application's own in place of `port`; throws Error if it can't. Called for each
    /// connection, on the car's thread.
    std::function<std::unique_ptr<IPort>()> openPort = {};

    /// Ends what the car is at, connecting too, for good: that, and whatever is asked later, throws Error of the kind
    /// Interrupted. Any thread may ask for it.
    std::stop_token stop = {};
    /// What was found on the way, as lines with their line feeds. On the car's thread.
    std::function<void(std::string const&)> onDetail = {};
    /// What the opening is at, some times a second: a short text for a line that is drawn anew; empty at its end. On
    /// the car's thread.
    std::function<void(std::string const&)> onPhase = {};
    /// Gets the name of logFile or traceFile if it could not be written to its end, as the connection closes. On the
    /// car's thread.
    std::function<void(std::string const&)> onUnwritten = {};
    /// Gets each entry of the core's log of the traffic, from the connecting up to the closing. On the thread that
    /// sends or receives, in the middle of an exchange, which it holds up.
    std::function<void(obd::MessageDataModel const&)> onTraffic = {};
    /// Takes down all that passes the port, from the connection on; see <velmora/recorder.h>.
    std::shared_ptr<Recorder> recorder = {};
};

} // namespace velmora
