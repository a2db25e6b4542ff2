#pragma once

#include "simulator/peer.h"

#include <memory>
#include <string>
#include <vector>

namespace obdsim {

/// What to simulate. The names are those of vehicleNames() and profileKeys().
struct SimulationOptions
{
    std::string vehicle = "petrol-can11"; ///< or the path of a vehicle file
    std::string adapter = "elm327-v1.5";
    std::vector<std::string> faults = {}; ///< in the forms of parseFaults()
    std::string scenario = {};            ///< path of a scenario file; empty: none
    std::string drive = {};               ///< a name of simulatedDrives(), or a CSV file; empty: the vehicle's own
};

class SimulatedCar;

/// An adapter with a car. Throws SimulatorError for a wrong name, file or fault.
std::shared_ptr<SimulatedCar> simulateCar(SimulationOptions const& options);

/// The same for who only talks to it.
std::shared_ptr<IPeer> simulate(SimulationOptions const& options);

/// Many alike, whose files are read once.
std::vector<std::shared_ptr<SimulatedCar>> simulateFleet(SimulationOptions const& options, std::size_t count);

/// A recorded dialogue in the part of the adapter; whatever it lacks is answered
/// as an adapter of its kind would, requests to the bus with NO DATA.
std::shared_ptr<IPeer> replay(std::string const& path, std::vector<std::string> const& faults = {});

/// Names of the built-in vehicles and of the adapters, for help texts.
std::vector<std::string> simulatedVehicles();
std::vector<std::string> simulatedAdapters();
std::vector<std::string> simulatedDrives();

/// The forms of faults, and those of control lines with what they do.
std::vector<std::string> faultForms();
std::vector<std::string> controlForms();

} // namespace obdsim
