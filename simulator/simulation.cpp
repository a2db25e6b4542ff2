#include "simulator/simulation.h"

#include "simulator/car/vehiclelibrary.h"
#include "simulator/faultypeer.h"
#include "simulator/linerate.h"
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

void apply(FaultPlan const& plan, AdapterProfile& profile)
{
    profile.quirks.add(plan.quirks);
    profile.timing.command = plan.command.value_or(profile.timing.command);
    profile.timing.wait = plan.wait ? plan.wait : profile.timing.wait;
    profile.timing.baud = plan.baud.value_or(profile.timing.baud);
}

std::shared_ptr<IPeer> onTheWire(std::shared_ptr<Adapter> const& adapter, FaultPlan const& plan)
{
    std::shared_ptr<IPeer> peer = adapter;
    if (!plan.empty()) {
        peer = std::make_shared<FaultyPeer>(std::move(peer), plan);
    }
    int const baud = adapter->profile().timing.baud;
    return baud == 0 ? peer : std::make_shared<LineRate>(std::move(peer), baud);
}

} // namespace

std::shared_ptr<IPeer> simulate(SimulationOptions const& options)
{
    const FaultPlan plan = parseFaults(options.faults);
    AdapterProfile profile = adapterProfile(options.adapter);
    apply(plan, profile);
    auto vehicle = std::make_shared<Vehicle>(loadVehicle(options.vehicle));
    return onTheWire(std::make_shared<Adapter>(std::move(profile), std::move(vehicle)), plan);
}

std::shared_ptr<IPeer> replay(std::string const& path, std::vector<std::string> const& faults)
{
    const FaultPlan plan = parseFaults(faults);
    auto script = std::make_shared<ReplayScript>(loadDialogue(path));
    AdapterProfile profile = profileForBanner(script->banner());
    apply(plan, profile);
    return onTheWire(std::make_shared<Adapter>(std::move(profile), nullptr, std::move(script)), plan);
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
