#pragma once

#include "libvelmora/vehicle/units.h"

#include <obd/vehicleprotocol.h>
#include <velmora/iport.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace obd {
class IDataConnection;
}

namespace velmora {

class IWire;

// What a session is to use; the settings file fills what stays empty.
struct SessionOptions
{
    std::string port;
    std::optional<unsigned int> baud;
    std::optional<obd::VehicleProtocol> protocol;
    std::optional<Units> units;
    std::optional<unsigned int> ecu; // control module id
    bool reset = false;              // restore and reset the adapter before use
    bool sleep = false;              // send the adapter to sleep at the end, which costs the next visit time
    bool forget = false;             // drop what earlier visits have learnt of adapters and vehicles
    std::string logFile;
    std::string traceFile;
    std::string settingsFile;
    std::vector<std::string> signalFiles; // of signals of one's own, beside those of the settings folder

    // Opens a transport in place of the port, whose text is then its name only.
    std::function<std::unique_ptr<IPort>()> openPort;

    // Makes what stands between the library and the open port in place of the fast and healing channel, to be compared
    // with it; null for that channel.
    std::function<std::shared_ptr<obd::IDataConnection>(std::shared_ptr<IWire> const& wire)> makeChannel;

    // Told what the session is at, each time as lines with their line feeds; null for nobody. On the thread that
    // calls the session.
    std::function<void(std::string const&)> onProgress;
    std::function<void(std::string const&)> onDetail; // what was found on the way
    // Told what the opening is at, some times a second: a short text for a line that is drawn anew; empty at its end.
    std::function<void(std::string const&)> onPhase;
};

} // namespace velmora
