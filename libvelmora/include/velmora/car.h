#pragma once

#include <velmora/actions.h>
#include <velmora/caroptions.h>
#include <velmora/error.h>
#include <velmora/export.h>
#include <velmora/live.h>
#include <velmora/modules.h>
#include <velmora/offers.h>
#include <velmora/probe.h>
#include <velmora/reading.h>
#include <velmora/report.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace obd {
class IObdVelmora;
} // namespace obd

namespace velmora {

class CarCore;
class WatchState;

/// A control module that answers.
struct Module
{
    unsigned int id;         ///< such as 0x7E8
    std::string name;        ///< such as "ECM"
    std::string description; ///< such as "Engine Control"
};

/// A sensor that a control module offers.
struct Sensor
{
    unsigned int module; ///< id of the control module
    std::string key;     ///< "RPM"
    std::string pid;     ///< "010C"; empty for a derived value
    std::string title;   ///< "Engine RPM"
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
    Watch(Watch&&) noexcept;            ///< leaves the other without a watch
    Watch& operator=(Watch&&) noexcept; ///< ends what it held before

    void end(); ///< as destroying does; once more does nothing

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
///
///     velmora::Car car("192.168.0.10:35000"); // or "auto", "/dev/ttyUSB0", "sim:petrol-can11", "replay:file"
///     for (auto const& reading : car.read({"RPM", "COOLANT_TEMP"})) std::cout << reading << '\n';
///     for (auto const& code : car.codes()) std::cout << code << '\n';
///     auto const watch = car.watch({"RPM"}, [](velmora::Reading const& reading) { std::cout << reading << '\n'; });
///     std::cout << car.report().toJson();
class VELMORA_EXPORT Car
{
public:
    using OnReading = std::function<void(Reading const&)>; ///< gets each reading of a watch
    using OnLink = std::function<void(LinkState)>;         ///< hears of losses and returns of the link

    /// CarOptions::port, and else the settings file and the defaults.
    explicit Car(std::string const& port);
    /// Connects; waits until the car answers or it is known that it does not.
    explicit Car(CarOptions options);
    /// Closes the connection. Not from a callback. An opening of a network port that is under way is waited for, ten
    /// seconds at most.
    ~Car();
    Car(Car const&) = delete;
    Car& operator=(Car const&) = delete;

    /// Each sensor once, in the order of the words, signals of one's own behind the standard ones. A sensor that told
    /// nothing has a reading without a value.
    std::vector<Reading> read(std::vector<std::string> const& sensors);
    /// Reads over and over, until the result is destroyed. onLink is told of each loss and each return of the link;
    /// after a loss the car tries to come back for as long as there is a watch. onReading must take less time than the
    /// readings come in.
    /// A sensor may have a rate: "RPM@10hz".
    [[nodiscard]] Watch watch(std::vector<std::string> const& sensors, OnReading onReading, OnLink onLink = {});
    /// Reads over and over for a view, which takes what has come, until the result is destroyed; see <velmora/live.h>.
    /// A loss of the link ends it. Throws Error for what is not known, not clear, or not offered.
    [[nodiscard]] std::unique_ptr<LiveReader> live(LiveWish const& wish);
    /// What this vehicle's own things are kept under, such as the layout of a view. Asks the vehicle for its number.
    std::string vehicleKey();

    /// The trouble codes of all control modules. Throws Error if none told any of its lists; whether each module told
    /// all of its own is in codeReports.
    std::vector<StoredCode> codes();
    /// Lamp and each list of codes, with how asking for it went.
    std::vector<ModuleTopic<CodeReport>> codeReports();
    /// The same for some lists alone, with what that maker means by the codes; maker as findMaker of
    /// <velmora/catalogue.h> gives it, or empty for that of the vehicle identification number.
    std::vector<ModuleTopic<CodeReport>> codeReports(std::vector<CodeKind> const& kinds, std::string const& maker = {});
    /// Of all control modules, the newest frame as a rule being 0.
    std::vector<ModuleTopic<FreezeReport>> freezeFrame(unsigned char frame = 0);
    /// The same with what that maker means by the code, as for codeReports.
    std::vector<ModuleTopic<FreezeReport>> freezeFrame(unsigned char frame, std::string const& maker);
    /// The monitors that an emissions test asks for.
    std::vector<ModuleTopic<ReadinessReport>> readiness();
    /// The results of on-board tests. Asks once for each monitor, which takes seconds.
    std::vector<ModuleTopic<MonitorsReport>> monitors();
    /// The oxygen sensors, on legacy buses with their tests.
    std::vector<ModuleTopic<OxygenReport>> oxygen();
    /// How often the monitors could run and did.
    std::vector<ModuleTopic<CountersReport>> counters();
    /// Vehicle identification number, calibrations and more.
    std::vector<ModuleTopic<InfoReport>> info();
    /// The control modules that are asked: all that answered, or the one that CarOptions names.
    std::vector<Module> modules();
    /// The control modules beyond OBD: on CAN looked for once, which takes half a minute with the vehicle standing, and
    /// remembered by its VIN. Only reads, but asks identifiers that no driver asks. Throws Error if the vehicle moves.
    std::vector<FoundModule> findModules(ModuleSearch const& search = {});
    /// What the modules that are asked tell by the identifiers of ISO 14229 and ISO 14230; none of one that can't be
    /// asked alone.
    std::vector<ModuleTopic<ModuleIdentifiers>> identifiers();
    /// Trouble codes by service 19, or 18, also of the modules that findModules has found. maker as for codeReports.
    /// Throws Error on a bus that has neither.
    std::vector<UdsModuleReport> udsCodes(std::string const& maker = {});
    /// Asks a module for its identifiers one by one, five a second; it only reads, with the vehicle standing. A run
    /// that ended early is gone on with, of which onResumed is told on the car's thread, with the identifier. Throws
    /// Error on trouble; what was found is kept for the next run then.
    ProbeReport probe(ProbeRequest const& request, std::function<void(std::string const& at)> const& onResumed = {});
    /// What each module offers, by what it said when it was met. all: also what the library decodes and the module does
    /// not offer.
    std::vector<ModuleOffers> offers(bool all = false);
    /// What read and watch can read.
    std::vector<Sensor> sensors();
    /// Measures the supply voltage, too.
    AdapterReport adapter();
    /// The bus that the vehicle was found on.
    ProtocolReport protocol();
    /// All of the above but readings. Takes seconds.
    VehicleReport report();
    /// The same with what that maker means by the codes, as for codeReports.
    VehicleReport report(std::string const& maker);
    /// Asks for each sensor of each module once, so that a recording holds them all.
    void askSensors();
    /// Asks the current module for sensors over and over, as the core does it and until the link is closed, so that
    /// there is traffic to look at; nothing is told. Without any the connection is only kept up. Throws Error for what
    /// is not known, not clear, or not offered.
    void keepAsking(std::vector<std::string> const& sensors);

    /// Clears the confirmed and pending codes of all control modules, whichever CarOptions::module names, and turns the
    /// lamp off. Also erases freeze frames, readiness, test results, and the distance and time since the last clearing:
    /// the vehicle must be driven before it can pass an emissions test. Asks nothing back. Gives what each module said;
    /// throws Error if none cleared its codes: Refused if one refused, else VehicleSilent.
    std::vector<ModuleTopic<ClearReport>> clearCodes();
    /// The same, but throws only if the link is lost or the car was stopped: what each module said is in the reports.
    std::vector<ModuleTopic<ClearReport>> tryClearCodes();

    /// The on-board test routines that can be run.
    std::vector<ModuleTopic<RoutinesReport>> routines();
    /// Runs a routine on the first control module that offers it. It acts on the vehicle, which should be parked with
    /// nobody near moving or hot parts. Asks nothing back. Throws Error if no module offers it, or if the module
    /// refuses or does not say that it runs it.
    ModuleTopic<RoutineRun> runRoutine(int id);
    /// The same, but what the module said is in the report, a refusal too.
    ModuleTopic<RoutineRun> tryRoutine(int id);
    /// What runRoutine would run, and on which module. Asks the vehicle nothing. Throws Error if no module offers it.
    ModuleTopic<Routine> findRoutine(int id);

    /// Connects anew after a loss.
    void reconnect();
    /// Throws Error if the link is lost, the adapter has fallen silent, or the car was stopped. Asks nothing.
    void check();
    /// The adapter's word for it that the last request brought nothing, such as "CAN ERROR"; empty for none.
    std::string trouble();
    /// The port's address as it was found, for messages and reports.
    std::string port();

    /// The rest of the core: runs a function on the car's thread, the one that dispatches, with the top-level object
    /// of <obd/obd.h>. What it makes there must be gone when it returns. An exception comes back to the caller.
    void library(std::function<void(obd::IObdVelmora&)> const& function);

private:
    std::shared_ptr<CarCore> m_core;
};

/// "7E8 ECM"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Module const& module);
/// "7E8 RPM: Engine RPM"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, Sensor const& sensor);
/// "lost" or "returned".
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, LinkState state);

} // namespace velmora
