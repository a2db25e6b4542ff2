#include "libvelmora/watch/sessioncar.h"

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/watch/codelooker.h"
#include "libvelmora/watch/voltageprobe.h"
#include "libvelmora/watch/watchsources.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
#include <obd/vehiclemodelyear.h>
#include <velmora/error.h>

#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds voltageLimit{3000};
constexpr std::chrono::milliseconds napLimit{1000};
constexpr unsigned int probeLimitMs = 2000;

} // namespace

void SessionCar::connect()
{
    if (m_up) {
        return;
    }
    m_nap.reset();
    disconnect();
    auto session = std::make_unique<Session>(m_options.session);
    session->obd().getConnectionManager()->addLogger(&m_count);
    {
        std::lock_guard const lock(m_mutex);
        m_session = std::move(session);
        if (m_interrupted) {
            m_session->interrupt();
        }
    }
    m_session->connect();
    m_vin = readVin(*m_session, *m_session->obd().getEcuManager()->getCurrentEcu());
    m_sources = chooseSources();
    m_up = true;
    ++m_visits;
}

std::vector<PollSource> SessionCar::chooseSources()
{
    m_signals = std::make_unique<SignalChoice>(*m_session);
    std::vector<PollSource> sources;
    addSources(*m_session, m_only, sources);
    if (sources.empty()) {
        sources = watchSources(*m_session, m_options.sensors, *m_signals);
        addSources(*m_session, m_further, sources);
    }
    return sources;
}

void SessionCar::readAlso(std::vector<std::string> const& wishes)
{
    m_further = wishes;
    changeSources();
}

void SessionCar::readOnly(std::vector<std::string> const& wishes)
{
    m_only = wishes;
    changeSources();
}

void SessionCar::changeSources()
{
    if (!m_up) {
        return;
    }
    std::vector<PollSource> sources = chooseSources();
    bool const asking = m_poller != nullptr;
    stopAsking();
    m_sources = std::move(sources);
    if (asking) {
        startAsking();
    }
}

void SessionCar::disconnect()
{
    m_up = false;
    m_poller.reset();
    m_sources.clear();
    m_signals.reset();
    std::unique_ptr<Session> gone;
    {
        std::lock_guard const lock(m_mutex);
        gone = std::move(m_session);
    }
    if (gone != nullptr) {
        gone->obd().getConnectionManager()->removeLogger(&m_count);
    }
}

std::vector<ModuleInfo> SessionCar::modules()
{
    std::vector<ModuleInfo> result;
    for (std::shared_ptr<obd::IEcu> const& ecu : m_session->selectedModules()) {
        ModuleInfo info{
            std::chrono::system_clock::now(), m_options.vehicle, ecu->id(), ecu->name(), ecu->description(), {}};
        if (m_options.fullVin) {
            info.vin = readVin(*m_session, *ecu);
        }
        result.push_back(std::move(info));
    }
    return result;
}

SensorList SessionCar::sensors()
{
    SensorList list = sensorList(m_options.vehicle, m_sources);
    for (SignalRow const& row : m_signals->rows()) {
        list.sensors.push_back({row.module, row.sensor, row.request, row.name, row.unit, row.hertz.value_or(0.0)});
    }
    return list;
}

void SessionCar::startAsking()
{
    std::shared_ptr<obd::IObdProxy> const proxy = m_session->proxy();
    PollPace const pace = choosePace({m_options.fast, 6}, proxy->protocol(), obd::GetVehicleModelYear(m_vin));
    std::vector<PollSource> sources = m_sources;
    for (PollSource& each : m_signals->sources(false)) {
        sources.push_back(std::move(each));
    }
    m_poller = std::make_unique<Poller>(
        proxy, sources, pace, Units::Metric,
        [this](PollResult const& result) {
            if (m_options.onReading) {
                for (Reading const& each : result.readings) {
                    m_options.onReading(each);
                }
            }
            std::lock_guard const lock(m_mutex);
            for (Reading const& each : result.readings) {
                m_readings.push_back(each);
                m_readings.back().vehicle = m_options.vehicle;
            }
        },
        &m_session->channel());
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
    return velmora::lookAtCodes(*m_session);
}

void SessionCar::check()
{
    m_session->check();
    if (!m_session->proxy()->isConnected()) {
        throw Error(ErrorKind::LinkLost, "The adapter no longer answers");
    }
}

std::unique_ptr<IPort> SessionCar::openBarePort()
{
    if (m_options.session.openPort) {
        return m_options.session.openPort();
    }
    PortAddress const address = parsePortAddress(m_options.session.port, m_options.session.baud.value_or(defaultBaud));
    return openPort(address, [this] {
        std::lock_guard const lock(m_mutex);
        return m_interrupted;
    });
}

bool SessionCar::startNap()
{
    disconnect();
    m_nap = std::make_unique<AdapterNap>([this] { return openBarePort(); }, napLimit);
    if (!m_nap->sleeps()) {
        m_nap.reset();
    }
    return m_nap != nullptr;
}

bool SessionCar::napIsOver()
{
    return m_nap == nullptr || m_nap->isOver();
}

std::optional<double> SessionCar::volts()
{
    if (!m_up) {
        return probeVoltage(openBarePort(), voltageLimit);
    }
    float const volts = m_session->proxy()->batteryVoltage(); // between two requests, while values are read
    m_session->check();
    return volts > 0.0F ? std::optional<double>(volts) : std::nullopt;
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
    // The library keeps an idle connection alive by a request, and makes it where it is dispatched: a parked car gets
    // none.
    if (m_poller != nullptr) {
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

} // namespace velmora
