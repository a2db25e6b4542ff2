#include "libvelmora/dash/dashclerk.h"

#include "common/text/text.h"
#include "libvelmora/dash/dashstate.h"
#include "libvelmora/output/valuetext.h"
#include "libvelmora/read/codeclearing.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/makerreader.h"
#include "libvelmora/report/clearreport.h"
#include "libvelmora/vehicle/vehiclekey.h"
#include "libvelmora/vehicle/vin.h"
#include "libvelmora/watch/watchsources.h"

#include <velmora/error.h>

#include <algorithm>
#include <sstream>
#include <utility>

namespace velmora {

namespace {

constexpr unsigned int consoleLimitMs = 5000;

Json moduleHead(obd::IEcu& ecu)
{
    return {{"id", moduleText(ecu.id())}, {"name", textOrNull(readable(ecu.name()))}};
}

template <typename Read>
Json ofModules(Session& session, Read const& read)
{
    Json list = Json::array();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        Json entry = moduleHead(*ecu);
        entry.update(toJsonValue(read(session, *ecu)));
        list.push_back(std::move(entry));
        session.check();
    }
    return list;
}

// Asking changes which module is the library's current one; the next question finds it as it was.
class ModuleKeeper
{
public:
    explicit ModuleKeeper(Session& session) : m_modules(*session.obd().getEcuManager())
    {
        std::shared_ptr<obd::IEcu> const current = m_modules.getCurrentEcu();
        m_id = current != nullptr ? current->id() : 0;
    }
    ~ModuleKeeper() { m_modules.setCurrentEcu(m_id); }
    ModuleKeeper(ModuleKeeper const&) = delete;
    ModuleKeeper& operator=(ModuleKeeper const&) = delete;

private:
    obd::IEcuManager& m_modules;
    unsigned int m_id = 0;
};

} // namespace

DashClerk::Outcome DashClerk::serve()
{
    Outcome outcome;
    if (m_car.session() == nullptr) {
        while (auto const ask = m_desk.next()) {
            if (ask->topic == "performance" && ask->text == "end") {
                timeRuns(ask->text);
            }
            m_desk.tell(DashAnswer{ask->topic, false, "There is no link to the car now"});
        }
        return outcome;
    }
    if (std::exchange(m_visit, m_car.visits()) != m_car.visits()) {
        attempt({"vehicle", {}}, outcome);
    }
    while (auto const ask = m_desk.next()) {
        attempt(*ask, outcome);
    }
    return outcome;
}

void DashClerk::attempt(DashAsk const& ask, Outcome& outcome)
{
    try {
        ModuleKeeper const current(*m_car.session());
        serveOne(ask, outcome);
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        m_desk.tell(DashAnswer{ask.topic, false, error.what()});
    }
}

void DashClerk::introduce()
{
    Session& session = *m_car.session();
    DashVehicle vehicle{m_name, {}};
    if (isVin(m_car.vin())) {
        vehicle.key = vehicleKey(m_car.vin());
    }
    vehicle.offered = m_offered = offeredEntries(session);
    m_desk.tell(vehicle);
}

void DashClerk::serveOne(DashAsk const& ask, Outcome& outcome)
{
    if (ask.topic == "vehicle") {
        introduce();
        return;
    }
    if (ask.topic == "sensors") {
        chooseSensors(ask.text);
        outcome.sensors = true;
        return;
    }
    if (ask.topic == "performance") {
        m_desk.tell(DashAnswer{"performance", true, timeRuns(ask.text)});
        outcome.sensors = true;
        return;
    }
    if (ask.topic == "clear") {
        m_desk.tell(DashAnswer{"clear", true, clear()});
        outcome.cleared = true;
        return;
    }
    m_desk.tell(DashAnswer{ask.topic, true, ask.topic == "console" ? talk(ask.text) : read(ask.topic)});
}

Json DashClerk::read(std::string const& topic)
{
    Session& session = *m_car.session();
    if (topic == "readiness") {
        return ofModules(session, readReadiness);
    }
    if (topic == "monitors") {
        return ofModules(session, readMonitors);
    }
    if (topic == "info") {
        return ofModules(session, readInfo);
    }
    return readCodes();
}

Json DashClerk::readCodes()
{
    Session& session = *m_car.session();
    MakerChoice const maker = readMaker(session, {});
    CodeReader reader(session);
    Json list = Json::array();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        CodeReport codes = reader.read(*ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
        FreezeReport freeze = readFreeze(session, *ecu, 0);
        applyMaker(codes, maker);
        applyMaker(freeze, maker);
        Json entry = moduleHead(*ecu);
        entry["codes"] = toJsonValue(codes);
        entry["freeze"] = toJsonValue(freeze);
        list.push_back(std::move(entry));
        session.check();
    }
    return list;
}

Json DashClerk::clear()
{
    Json list = Json::array();
    for (ModuleTopic<ClearReport> const& each : clearCodes(*m_car.session())) {
        list.push_back({{"id", moduleText(each.id)},
                        {"name", textOrNull(readable(each.name))},
                        {"cleared", each.report.result == ClearReport::Result::Cleared},
                        {"result", resultWord(each.report.result)},
                        {"reason", textOrNull(each.report.reason)}});
    }
    return list;
}

Json DashClerk::talk(std::string const& command)
{
    std::string reply;
    obd::IDevice::Status const status = m_car.session()->proxy()->execute(command, reply, consoleLimitMs);
    bool const answered = status == obd::IDevice::Status::Ok || !reply.empty();
    return {{"command", command}, {"answered", answered}, {"reply", readable(reply)}};
}

// Speed and engine speed alone are read for as long, so that they come as often as they can.
Json DashClerk::timeRuns(std::string const& wish)
{
    if (wish != "begin") {
        m_desk.runs().end();
        m_car.readOnly({});
        return "ended";
    }
    Session& session = *m_car.session();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        auto const offers = [&](char const* sensor) {
            return std::ranges::any_of(
                m_offered, [&](SensorEntry const& each) { return each.module == ecu->id() && each.sensor == sensor; });
        };
        if (offers("SPEED") && offers("RPM")) {
            m_desk.runs().begin(ecu, *session.obd().getSettings());
            std::string const module = moduleText(ecu->id());
            m_car.readOnly({module + ":SPEED", module + ":RPM"});
            return "begun";
        }
    }
    throw Error(ErrorKind::NotSupported, "No module tells both speed and engine speed");
}

void DashClerk::chooseSensors(std::string const& ids)
{
    std::vector<std::string> wishes;
    std::istringstream lines(ids);
    for (std::string id; std::getline(lines, id);) {
        auto const found = std::ranges::find_if(
            m_offered, [&id](SensorEntry const& each) { return dashId(each.module, each.sensor) == id; });
        if (found != m_offered.end()) {
            wishes.push_back(moduleText(found->module) + ":" + found->pid.substr(2));
        }
    }
    m_car.readAlso(wishes);
}

} // namespace velmora
