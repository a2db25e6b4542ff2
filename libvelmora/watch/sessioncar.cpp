#include "libvelmora/watch/sessioncar.h"

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/watch/codelooker.h"
#include "libvelmora/watch/voltageprobe.h"

#include <obd/iconnectionmanager.h>
#include <obd/iecumanager.h>
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
