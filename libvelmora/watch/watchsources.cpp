#include "libvelmora/watch/watchsources.h"

#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/read/sensornames.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/iecumanager.h>
#include <obd/isensorservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorinfo.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

// As far as a car offers it.
std::vector<std::string> const& usualSensors()
{
    static std::vector<std::string> const words = {"RPM",
                                                   "SPEED",
                                                   "COOLANT_TEMP",
                                                   "ENGINE_LOAD",
                                                   "THROTTLE_POS",
                                                   "FUEL_LEVEL@0.1hz",
                                                   "MODULE_VOLTAGE@0.5hz",
                                                   "CLEAR_DISTANCE@0.1hz"};
    return words;
}

// Puts back the module that the library's services work with.
class CurrentModule
{
public:
    explicit CurrentModule(obd::IEcuManager& manager) : m_manager(manager), m_id(manager.getCurrentEcu()->id()) {}
    ~CurrentModule() { m_manager.setCurrentEcu(m_id); }
    CurrentModule(CurrentModule const&) = delete;
    CurrentModule& operator=(CurrentModule const&) = delete;

private:
    obd::IEcuManager& m_manager;
    unsigned int const m_id;
};

std::vector<PollSource> sourcesFor(Session& session, std::string const& text, bool required)
{
    SensorWish const wish = parseSensorWish(text);
    obd::IEcuManager& manager = *session.obd().getEcuManager();
    CurrentModule const back(manager);
    if (wish.module) {
        manager.setCurrentEcu(*wish.module);
    }
    std::shared_ptr<obd::IEcu> const ecu = manager.getCurrentEcu();
    std::vector<PollSource> sources;
    if (ecu == nullptr) {
        return sources;
    }
    SensorIds ids;
    try {
        ids = chooseSensors({wish.sensor}, offeredSensors(*obd::SensorServiceBuilder::createSensorService()));
    } catch (Error const&) {
        if (required) {
            throw;
        }
    }
    for (obd::ParameterIdentifier::Id const id : ids) {
        if (auto parameter = obd::ParameterFactory().createParameter(*ecu, *session.obd().getSettings(), id)) {
            sources.push_back({ecu, std::move(parameter), wish.hertz});
        }
    }
    return sources;
}

void addEntries(std::vector<SensorEntry>& entries, obd::IEcu& ecu, obd::PowertrainParameter& parameter,
                double hertz = 0.0)
{
    auto const infos = parameter.sensorInfo(ecu);
    int const pid = parameter.pid();
    std::string const title = parameter.description(ecu);
    for (auto const& info : infos) {
        bool const alone = infos.size() == 1;
        std::string const key = alone ? sensorKey(pid) : fmt::format("{}_{}", sensorKey(pid), info->uid() % 10 + 1);
        entries.push_back({ecu.id(), key, fmt::format("01{:02X}", pid),
                           alone ? title : title + ": " + info->description(),
                           unitLabel(info->unit(obd::UnitSystem::Metric)), hertz});
    }
}

// Signals of one's own first, by id or name; then standard sensors; then words of a signal's name.
std::vector<PollSource> sourcesOrSignals(Session& session, std::string const& text, SignalChoice& signals)
{
    SensorWish const wish = parseSensorWish(text);
    std::vector<unsigned int> const meant{session.obd().getEcuManager()->getCurrentEcu()->id()};
    if (signals.choose(wish, meant)) {
        return {};
    }
    try {
        return sourcesFor(session, text, true);
    } catch (Error const&) {
        if (!signals.chooseByName(wish, meant)) {
            throw;
        }
        return {};
    }
}

} // namespace

std::vector<PollSource> watchSources(Session& session, std::vector<std::string> const& wishes, SignalChoice& signals)
{
    std::vector<PollSource> sources;
    bool const usual = wishes.empty();
    for (std::string const& wish : usual ? usualSensors() : wishes) {
        std::ranges::move(usual ? sourcesFor(session, wish, false) : sourcesOrSignals(session, wish, signals),
                          std::back_inserter(sources));
    }
    for (char const* const needed : {"RPM", "SPEED"}) {
        for (PollSource& each : sourcesFor(session, needed, false)) {
            bool const there = std::ranges::any_of(
                sources, [&](PollSource const& one) { return one.parameter->pid() == each.parameter->pid(); });
            if (!there) {
                sources.push_back(std::move(each));
            }
        }
    }
    return sources;
}

void addSources(Session& session, std::vector<std::string> const& wishes, std::vector<PollSource>& sources)
{
    for (std::string const& wish : wishes) {
        for (PollSource& each : sourcesFor(session, wish, false)) {
            bool const there = std::ranges::any_of(sources, [&](PollSource const& one) {
                return one.parameter->pid() == each.parameter->pid() && one.ecu->id() == each.ecu->id();
            });
            if (!there) {
                sources.push_back(std::move(each));
            }
        }
    }
}

std::vector<SensorEntry> offeredEntries(Session& session)
{
    std::vector<SensorEntry> entries;
    CurrentModule const back(*session.obd().getEcuManager());
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        for (OfferedSensor const& each : offeredSensors(*obd::SensorServiceBuilder::createSensorService())) {
            if (auto const parameter =
                    obd::ParameterFactory().createParameter(*ecu, *session.obd().getSettings(), each.id)) {
                addEntries(entries, *ecu, *parameter);
            }
        }
    }
    return entries;
}

SensorList sensorList(std::string const& vehicle, std::vector<PollSource> const& sources)
{
    SensorList list{std::chrono::system_clock::now(), vehicle, {}};
    for (PollSource const& each : sources) {
        addEntries(list.sensors, *each.ecu, *each.parameter, each.hertz.value_or(0.0));
    }
    return list;
}

} // namespace velmora
