#include "libvelmora/car/carcore.h"
#include "libvelmora/car/carsensors.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/read/vehiclereader.h"
#include "libvelmora/text/text.h"

#include <obd/iecu.h>
#include <velmora/car.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

CarOptions portOnly(std::string const& port)
{
    CarOptions options;
    options.port = port;
    return options;
}

// Asks one control module after the other.
template <typename Read>
auto readModules(Session& session, Read const& read)
{
    using Report = std::invoke_result_t<Read const&, obd::IEcu const&>;
    std::vector<ModuleTopic<Report>> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        modules.push_back({ecu->id(), readable(ecu->name()), read(*ecu)});
        session.check();
    }
    return modules;
}

std::vector<ModuleTopic<CodeReport>> readCodes(Session& session)
{
    CodeReader reader(session);
    auto modules = readModules(session, [&reader](obd::IEcu const& ecu) {
        return reader.read(ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
    });
    if (std::any_of(modules.begin(), modules.end(), [](auto const& module) { return hasMakersCodes(module.report); })) {
        MakerChoice const maker = readMaker(session, {});
        for (ModuleTopic<CodeReport>& module : modules) {
            applyMaker(module.report, maker);
        }
    }
    return modules;
}

bool anyRefused(std::vector<ModuleTopic<CodeReport>> const& modules)
{
    return std::any_of(modules.begin(), modules.end(), [](ModuleTopic<CodeReport> const& module) {
        return std::any_of(module.report.lists.begin(), module.report.lists.end(),
                           [](CodeList const& list) { return list.answer == CodeList::Answer::Refused; });
    });
}

void requireCodes(std::vector<ModuleTopic<CodeReport>> const& modules)
{
    if (std::any_of(modules.begin(), modules.end(), [](auto const& module) { return hasAnswer(module.report); })) {
        return;
    }
    if (anyRefused(modules)) {
        throw Error(ErrorKind::Refused, "The vehicle refused to tell its trouble codes",
                    {"try again with the ignition on and the engine off"});
    }
    throw Error(ErrorKind::NotSupported, "No control module told its trouble codes", {"is the ignition on?"});
}

} // namespace

Watch::Watch() = default;

Watch::Watch(std::shared_ptr<WatchState> state) : m_state(std::move(state)) {}

Watch::~Watch()
{
    end();
}

Watch::Watch(Watch&& other) noexcept = default;

Watch& Watch::operator=(Watch&& other) noexcept
{
    if (this != &other) {
        end();
        m_state = std::move(other.m_state);
    }
    return *this;
}

void Watch::end()
{
    if (m_state != nullptr) {
        std::exchange(m_state, nullptr)->end();
    }
}

Car::Car(std::string const& port) : Car(portOnly(port)) {}

Car::Car(CarOptions options) : m_core(std::make_shared<CarCore>(std::move(options))) {}

Car::~Car() = default;

std::vector<Reading> Car::read(std::vector<std::string> const& sensors)
{
    return m_core->call([&](Session& session) { return readOnce(session, pollSources(session, sensors)); });
}

Watch Car::watch(std::vector<std::string> const& sensors, OnReading onReading, OnLink onLink)
{
    return Watch(m_core->watch(sensors, std::move(onReading), std::move(onLink)));
}

std::vector<StoredCode> Car::codes()
{
    auto const modules = codeReports();
    requireCodes(modules);
    std::vector<StoredCode> codes;
    for (ModuleTopic<CodeReport> const& module : modules) {
        for (CodeList const& list : module.report.lists) {
            for (TroubleCode const& code : list.codes) {
                codes.push_back({module.id, list.kind, code});
            }
        }
    }
    return codes;
}

std::vector<ModuleTopic<CodeReport>> Car::codeReports()
{
    return m_core->call(readCodes);
}

std::vector<ModuleTopic<FreezeReport>> Car::freezeFrame(unsigned char frame)
{
    return m_core->call([frame](Session& session) {
        return readModules(session, [&](obd::IEcu const& ecu) { return readFreeze(session, ecu, frame); });
    });
}

std::vector<ModuleTopic<ReadinessReport>> Car::readiness()
{
    return m_core->call([](Session& session) {
        return readModules(session, [&](obd::IEcu const& ecu) { return readReadiness(session, ecu); });
    });
}

std::vector<ModuleTopic<MonitorsReport>> Car::monitors()
{
    return m_core->call([](Session& session) {
        return readModules(session, [&](obd::IEcu const& ecu) { return readMonitors(session, ecu); });
    });
}

std::vector<ModuleTopic<InfoReport>> Car::info()
{
    return m_core->call([](Session& session) {
        return readModules(session, [&](obd::IEcu const& ecu) { return readInfo(session, ecu); });
    });
}

std::vector<Module> Car::modules()
{
    return m_core->call([](Session& session) {
        std::vector<Module> modules;
        for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
            modules.push_back({ecu->id(), readable(ecu->name()), readable(ecu->description())});
        }
        return modules;
    });
}

std::vector<Sensor> Car::sensors()
{
    return m_core->call(sensorsOf);
}

VehicleReport Car::report()
{
    return m_core->call([](Session& session) { return readVehicle(session); });
}

void Car::reconnect()
{
    m_core->reconnect();
}

void Car::library(std::function<void(obd::IObdVelmora&)> const& function)
{
    m_core->call([&function](Session& session) { function(session.obd()); });
}

} // namespace velmora
