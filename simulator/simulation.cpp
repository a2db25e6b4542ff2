#include "simulator/simulation.h"

#include "simulator/car/course.h"
#include "simulator/car/vehiclelibrary.h"
#include "simulator/faultypeer.h"
#include "simulator/linerate.h"
#include "simulator/replayscript.h"
#include "simulator/simulatedcar.h"

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

void follow(DrivePlan const& plan, EngineData& engine)
{
    engine.course = std::make_shared<Course const>(plan.course);
    engine.ambientCelsius = plan.ambientCelsius.value_or(engine.ambientCelsius);
    engine.startCoolantCelsius = plan.startCoolantCelsius.value_or(engine.startCoolantCelsius);
}

/// What only a car can judge of a scenario is judged before it begins.
void rehearse(SimulatedCar& car, std::vector<ScenarioLine> const& scenario)
{
    for (auto const& line : scenario) {
        try {
            car.advanceTo(line.time);
            car.control(line.command);
        } catch (ControlError const& error) {
            throw ControlError(line.place + ": " + error.what());
        }
    }
}

} // namespace

std::vector<std::shared_ptr<SimulatedCar>> simulateFleet(SimulationOptions const& options, std::size_t count)
{
    FaultPlan const plan = parseFaults(options.faults);
    AdapterProfile profile = adapterProfile(options.adapter);
    apply(plan, profile);
    VehicleData vehicle = loadVehicle(options.vehicle);
    if (!options.drive.empty()) {
        follow(loadDrive(options.drive), vehicle.engine);
    }
    auto const scenario = options.scenario.empty() ? std::vector<ScenarioLine>() : loadScenario(options.scenario);
    SimulatedCar trial(vehicle, profile, plan);
    rehearse(trial, scenario);
    std::vector<std::shared_ptr<SimulatedCar>> cars;
    for (std::size_t i = 0; i < count; ++i) {
        cars.push_back(std::make_shared<SimulatedCar>(vehicle, profile, plan, scenario));
    }
    return cars;
}

std::shared_ptr<SimulatedCar> simulateCar(SimulationOptions const& options)
{
    return simulateFleet(options, 1).front();
}

std::shared_ptr<IPeer> simulate(SimulationOptions const& options)
{
    return simulateCar(options);
}

std::shared_ptr<IPeer> replay(std::string const& path, std::vector<std::string> const& faults)
{
    FaultPlan const plan = parseFaults(faults);
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

std::vector<std::string> simulatedDrives()
{
    return driveNames();
}

std::vector<std::string> faultForms()
{
    std::vector<std::string> forms = {"garbage=P",
                                      "nul=P",
                                      "prompt=P",
                                      "prompt@COMMAND",
                                      "cut@BYTE",
                                      "stall@BYTE:MS",
                                      "slow=MS",
                                      "loss@BYTE",
                                      "error:WORDS=P",
                                      "error:WORDS@COMMAND",
                                      "silent@COMMAND",
                                      "reset@COMMAND",
                                      "reset:banner@COMMAND",
                                      "reset:WORDS@COMMAND",
                                      "echo",
                                      "command=MS",
                                      "wait=MS",
                                      "baud=RATE",
                                      "seed=N"};
    for (auto const& quirk : quirkNames()) {
        forms.push_back("quirk:" + quirk);
    }
    return forms;
}

std::vector<std::string> controlForms()
{
    std::vector<std::string> forms;
    for (auto const& each : Control::forms()) {
        forms.push_back(std::string(each.form) + ": " + each.help);
    }
    return forms;
}

} // namespace obdsim
