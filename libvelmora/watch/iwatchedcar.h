#pragma once

#include "libvelmora/output/record.h"
#include "libvelmora/watch/codewatch.h"

#include <optional>
#include <vector>

namespace velmora {

// The car as the watch sees it. One thread. What finds the link broken throws Error of kind LinkLost, PortFailed or
// AdapterSilent.
class IWatchedCar
{
public:
    IWatchedCar() = default;
    IWatchedCar(IWatchedCar const&) = delete;
    IWatchedCar& operator=(IWatchedCar const&) = delete;
    virtual ~IWatchedCar() = default;

    // Brings up adapter and vehicle. Throws Error; of kind VehicleSilent if the adapter works and no module answers.
    virtual void connect() = 0;
    // Lets go of all, whatever state it is in.
    virtual void disconnect() = 0;
    virtual std::vector<ModuleInfo> modules() = 0;
    virtual SensorList sensors() = 0;

    // Of the vehicle that was brought up last; empty if it tells none.
    virtual std::string vin() const = 0;

    // Begins and ends to read the sensors.
    virtual void startAsking() = 0;
    virtual void stopAsking() = 0;
    // What was read since the last call.
    virtual std::vector<Reading> readings() = 0;
    virtual std::vector<CodeLook> lookAtCodes() = 0;
    // Finds out whether the link stands.
    virtual void check() = 0;

    // By the adapter alone, also without a vehicle that was brought up. Nothing if it does not tell.
    virtual std::optional<double> volts() = 0;
    // One request to the vehicle.
    virtual bool probe() = 0;
    // Lets go of the vehicle and sends the adapter to sleep. False if that knows no sleep.
    virtual bool startNap() = 0;
    // Whether the adapter has woken up by itself.
    virtual bool napIsOver() = 0;
    // How many requests went to control modules, and how many brought no answer.
    virtual std::uint64_t requests() const = 0;
    virtual std::uint64_t errors() const = 0;
};

} // namespace velmora
