#include "simulator/simulation.h"

#include "simulator/car/vehiclelibrary.h"
#include "simulator/faultypeer.h"
#include "simulator/replayscript.h"

namespace obdsim {

namespace {

AdapterProfile adapterProfile(std::string const& key)
{
    AdapterProfile const* profile = findProfile(key);
    if (profile == nullptr) {
        std::string keys;
        for (auto const& known : profileKeys()) {
            keys += keys.empty() ? known : ", " + known;
        }
        throw SimulatorError("no adapter \"" + key + "\"; the adapters are " + keys);
    }
    return *profile;
}

std::shared_ptr<IPeer> withFaults(std::shared_ptr<IPeer> peer, FaultPlan const& plan)
{
    return plan.empty() ? peer : std::make_shared<FaultyPeer>(std::move(peer), plan);
}

} // namespace

std::shared_ptr<IPeer> simulate(SimulationOptions const& options)
{
    const FaultPlan plan = parseFaults(options.faults);
    AdapterProfile profile = adapterProfile(options.adapter);
    profile.quirks.add(plan.quirks);
    auto vehicle = std::make_shared<Vehicle>(loadVehicle(options.vehicle));
    return withFaults(std::make_shared<Adapter>(std::move(profile), std::move(vehicle)), plan);
}

std::shared_ptr<IPeer> replay(std::string const& path, std::vector<std::string> const& faults)
{
    const FaultPlan plan = parseFaults(faults);
    auto script = std::make_shared<ReplayScript>(loadDialogue(path));
    AdapterProfile profile = profileForBanner(script->banner());
    profile.quirks.add(plan.quirks);
    return withFaults(std::make_shared<Adapter>(std::move(profile), nullptr, std::move(script)), plan);
}

std::vector<std::string> simulatedVehicles()
{
    return vehicleNames();
}

std::vector<std::string> simulatedAdapters()
{
    return profileKeys();
}

} // namespace obdsim
