#pragma once

#include <velmora/car.h>
#include <velmora/export.h>
#include <velmora/health.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// A watch that runs for months: any number of outputs, trips, codes that come and go, and a battery that is spared.

namespace velmora {

/// Where a page for browsers is.
struct PageLink
{
    std::string link;         ///< with the token, if one is needed
    std::string remark;       ///< what to know about it; empty for nothing
    bool outputIsFree = true; ///< whether no output of the watch writes to standard output
};

/// What a long watch is to do. What it is not told here stands in its settings file, or is the default.
struct LongWatchOptions
{
    /// How the car is reached. Units are metric, whatever it says; openPort, onProgress, sleep and forget don't count.
    CarOptions car = {};
    std::string configFile = {};           ///< settings of the watch (docs/watch.md); none if empty
    std::vector<std::string> sensors = {}; ///< in the place of those of the file: "RPM@10hz"
    /// Beside those of the file: "csv:FILE", "sqlite:FILE", "mqtt://HOST:PORT/TOPIC", "dash:HOST:PORT" and others.
    std::vector<std::string> outputs = {};
    std::string vehicle = {};         ///< its name in all outputs; made up if empty
    std::optional<bool> fullVin = {}; ///< whether outputs may hold the vehicle identification number
    std::string stopAfter = {};       ///< ask on that long after the engine has stopped: "120s"
    std::string wake = {};            ///< "voltage", or "every 30min" for one request to the parked car
    bool electric = false;            ///< hybrid or electric: an engine that stands says nothing
    bool fast = false;                ///< ask as fast as the bus allows
    bool forPage = false;             ///< a page that can't be served ends the watch, rather than being tried again

    /// What happens, without a line feed: states, losses, outputs that fail. On the watch's thread and those of
    /// outputs; an output that hangs may call it after the watch has gone.
    std::function<void(std::string const&)> onEvent = {};
    /// Where the page of an output dash is, once it is served. On that output's thread.
    std::function<void(PageLink const&)> onPage = {};
    /// What came of reload, without a line feed.
    std::function<void(std::string const&)> onReload = {};
};

/// Reads a vehicle over months: comes back after each loss, and lets a parked car sleep. Tells the service manager that
/// started the process, if one did. A process has one car at a time, be it a Car or a LongWatch.
///
///     velmora::LongWatch watch({.car = {.port = "/dev/ttyUSB0"}, .outputs = {"sqlite:car.db"}});
///     watch.run();
class VELMORA_EXPORT LongWatch
{
public:
    /// Reads the settings. Throws Error for those that make no sense.
    explicit LongWatch(LongWatchOptions options);
    ~LongWatch();
    LongWatch(LongWatch const&) = delete;
    LongWatch& operator=(LongWatch const&) = delete;

    /// On the caller's thread until end is called. Throws Error for what trying again can't mend: settings that an
    /// output refuses, no port.
    void run();
    /// Ends run soon: the trip under way and the outputs are brought to an end. Any thread.
    void end();
    /// Reads the settings again, and goes on with them unless they make no sense. Any thread.
    void reload();
    /// Where an end takes too long, since something hangs in the operating system: flushes the outputs without waiting
    /// for run. False if run does so already. What is left is to end the process. Any thread.
    bool abandon();
    /// Any thread; the beginning's before run, and the last one's after it.
    Health health() const;

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

/// Throws Error unless the place is one of a page: "127.0.0.1:8722", "[::1]:8722".
VELMORA_EXPORT void checkPagePlace(std::string const& place);
/// The kinds of outputs that this build has, as they are written in an address; without dash, which is no file.
VELMORA_EXPORT std::vector<std::string> builtInOutputs();

} // namespace velmora
