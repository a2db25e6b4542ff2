#include "libvelmora/watch/sessioncar.h"

#include "libvelmora/poll/sensorwish.h"
#include "libvelmora/port/opening/openport.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/sensorchoice.h"
#include "libvelmora/read/sensornames.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/watch/voltageprobe.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
#include <obd/isensorservice.h>
#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorinfo.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <string_view>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds voltageLimit{3000};
constexpr unsigned int probeLimitMs = 2000;

struct KindWord
{
    CodeKind kind;
    char const* word;
};
constexpr KindWord kindWords[] = {
    {CodeKind::Confirmed, "confirmed"}, {CodeKind::Pending, "pending"}, {CodeKind::Permanent, "permanent"}};

// What trips and the judgement of sleep need, and what most people look at, as far as a car offers it.
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

CodeLook toLook(unsigned int module, CodeReport const& report)
{
    CodeLook look;
    look.module = module;
    look.lamp = report.lamp;
    for (CodeList const& list : report.lists) {
        auto const* const word = std::ranges::find(kindWords, list.kind, &KindWord::kind);
        auto& codes = look.lists[word->word];
        if (list.answer != CodeList::Answer::Read) {
            continue;
        }
        codes.emplace();
        for (TroubleCode const& each : list.codes) {
            codes->push_back({each.code, meaningText(each)});
        }
    }
    return look;
}

} // namespace

void SessionCar::connect()
{
    if (m_up) {
        return;
    }
    disconnect();
    auto session = std::make_unique<Session>(m_options.session);
    session->obd().getConnectionManager()->addLogger(this);
    {
        std::lock_guard const lock(m_mutex);
        m_session = std::move(session);
        if (m_interrupted) {
            m_session->interrupt();
        }
    }
    m_session->connect();
    chooseSources();
    m_up = true;
}

void SessionCar::disconnect()
{
    m_up = false;
    m_poller.reset();
    m_sources.clear();
    std::unique_ptr<Session> gone;
    {
        std::lock_guard const lock(m_mutex);
        gone = std::move(m_session);
    }
    if (gone != nullptr) {
        gone->obd().getConnectionManager()->removeLogger(this);
    }
}

void SessionCar::chooseSources()
{
    m_sources.clear();
    bool const usual = m_options.sensors.empty();
    for (std::string const& wish : usual ? usualSensors() : m_options.sensors) {
        for (PollSource& each : sourcesFor(wish, !usual)) {
            m_sources.push_back(std::move(each));
        }
    }
    // Without them nobody knows whether the car runs.
    for (char const* const needed : {"RPM", "SPEED"}) {
        for (PollSource& each : sourcesFor(needed, false)) {
            bool const there = std::ranges::any_of(
                m_sources, [&](PollSource const& one) { return one.parameter->pid() == each.parameter->pid(); });
            if (!there) {
                m_sources.push_back(std::move(each));
            }
        }
    }
}

std::vector<PollSource> SessionCar::sourcesFor(std::string const& text, bool required)
{
    SensorWish const wish = parseSensorWish(text);
    obd::IEcuManager& manager = *m_session->obd().getEcuManager();
    unsigned int const current = manager.getCurrentEcu()->id();
    if (wish.module) {
        manager.setCurrentEcu(*wish.module);
    }
    std::shared_ptr<obd::IEcu> const ecu = manager.getCurrentEcu();
    std::vector<PollSource> sources;
    if (ecu != nullptr) {
        auto const service = obd::SensorServiceBuilder::createSensorService();
        SensorIds ids;
        try {
            ids = chooseSensors({wish.sensor}, offeredSensors(*service));
        } catch (Error const&) {
            manager.setCurrentEcu(current);
            if (required) {
                throw;
            }
        }
        for (obd::ParameterIdentifier::Id const id : ids) {
            if (auto parameter = obd::ParameterFactory().createParameter(*ecu, *m_session->obd().getSettings(), id)) {
                sources.push_back({ecu, std::move(parameter), wish.hertz});
            }
        }
    }
    manager.setCurrentEcu(current);
    return sources;
}

std::vector<ModuleInfo> SessionCar::modules()
{
    std::vector<ModuleInfo> result;
    for (std::shared_ptr<obd::IEcu> const& ecu : m_session->selectedModules()) {
        ModuleInfo info{
            std::chrono::system_clock::now(), m_options.vehicle, ecu->id(), ecu->name(), ecu->description(), {}};
        if (m_options.fullVin) {
            info.vin = readInfo(*m_session, *ecu).vin;
        }
        result.push_back(std::move(info));
    }
    return result;
}

SensorList SessionCar::sensors()
{
    SensorList list{std::chrono::system_clock::now(), m_options.vehicle, {}};
    for (PollSource const& each : m_sources) {
        auto const infos = each.parameter->sensorInfo(*each.ecu);
        int const pid = each.parameter->pid();
        std::string const title = each.parameter->description(*each.ecu);
        for (auto const& info : infos) {
            bool const alone = infos.size() == 1;
            std::string const key = alone ? sensorKey(pid) : fmt::format("{}_{}", sensorKey(pid), info->uid() % 10 + 1);
            list.sensors.push_back({each.ecu->id(), key, fmt::format("01{:02X}", pid),
                                    alone ? title : title + ": " + info->description(),
                                    unitLabel(info->unit(obd::UnitSystem::Metric))});
        }
    }
    return list;
}

void SessionCar::startAsking()
{
    std::shared_ptr<obd::IObdProxy> const proxy = m_session->proxy();
    PollPace const pace = choosePace({m_options.fast, 6}, proxy->protocol(), 0);
    m_poller =
        std::make_unique<Poller>(proxy, m_sources, pace, obd::UnitSystem::Metric, [this](PollResult const& result) {
            std::lock_guard const lock(m_mutex);
            for (Reading const& each : result.readings) {
                m_readings.push_back(each);
                m_readings.back().vehicle = m_options.vehicle;
            }
        });
}

void SessionCar::stopAsking()
{
    m_poller.reset();
}

std::vector<Reading> SessionCar::readings()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_readings, {});
}

std::vector<CodeLook> SessionCar::lookAtCodes()
{
    CodeReader reader(*m_session);
    std::vector<CodeLook> looks;
    unsigned int const current = m_session->obd().getEcuManager()->getCurrentEcu()->id();
    for (std::shared_ptr<obd::IEcu> const& ecu : m_session->selectedModules()) {
        CodeLook look =
            toLook(ecu->id(), reader.read(*ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent}));
        ReadinessReport const readiness = readReadiness(*m_session, *ecu);
        if (hasAnswer(readiness)) {
            look.notReady = static_cast<int>(countNotComplete(readiness));
        }
        looks.push_back(std::move(look));
    }
    m_session->obd().getEcuManager()->setCurrentEcu(current);
    return looks;
}

void SessionCar::check()
{
    m_session->check();
    if (!m_session->proxy()->isConnected()) {
        throw Error(ErrorKind::LinkLost, "The adapter no longer answers");
    }
}

std::optional<double> SessionCar::volts()
{
    if (!m_up) {
        PortAddress const address =
            parsePortAddress(m_options.session.port, m_options.session.baud.value_or(defaultBaud));
        return probeVoltage(openPort(address), voltageLimit);
    }
    float volts = 0.0F;
    bool const told = m_session->adapter()->batteryVoltage(volts);
    m_session->check();
    return told && volts > 0.0F ? std::optional<double>(volts) : std::nullopt;
}

bool SessionCar::probe()
{
    if (!m_up) {
        try {
            connect();
        } catch (Error const& error) {
            disconnect();
            if (error.kind() != ErrorKind::VehicleSilent) {
                throw;
            }
            return false;
        }
        return true;
    }
    obd::ResponseMap replies;
    m_session->proxy()->execute(std::vector<unsigned char>{0x01, 0x00}, replies, probeLimitMs);
    m_session->check();
    return !replies.empty();
}

void SessionCar::wait(std::chrono::milliseconds time)
{
    auto const limit = std::chrono::steady_clock::now() + time;
    if (m_session != nullptr) {
        m_session->loop().runUntil(
            [this, limit] { return m_session->interrupted() || std::chrono::steady_clock::now() >= limit; }, limit);
        return;
    }
    std::unique_lock lock(m_mutex);
    m_wake.wait_until(lock, limit, [this] { return m_interrupted; });
}

void SessionCar::interrupt()
{
    std::lock_guard const lock(m_mutex);
    m_interrupted = true;
    if (m_session != nullptr) {
        m_session->interrupt();
    }
    m_wake.notify_all();
}

// Requests to the vehicle are hexadecimal digits; all else is for the adapter.
void SessionCar::onDataSent(std::vector<unsigned char> const& data)
{
    std::string_view const text(reinterpret_cast<char const*>(data.data()), data.size());
    bool const request =
        text.size() > 1 && text.find_first_not_of("0123456789ABCDEFabcdef \r") == std::string_view::npos;
    m_requests += request ? 1 : 0;
}

void SessionCar::onDataReceived(std::vector<unsigned char> const& data)
{
    std::string_view const text(reinterpret_cast<char const*>(data.data()), data.size());
    for (std::string_view const word : {"NO DATA", "ERROR", "UNABLE"}) {
        if (text.find(word) != std::string_view::npos) {
            ++m_errors;
            return;
        }
    }
}

} // namespace velmora
