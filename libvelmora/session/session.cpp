#include "libvelmora/session/session.h"

#include "libvelmora/record/traffictrace.h"
#include "libvelmora/session/link.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/vehicle/units.h"

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionoptions.h>
#include <obd/iecu.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <atomic>
#include <thread>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds phaseStep{250};

} // namespace

Session::Session(SessionOptions options)
    : m_options(std::move(options)), m_deadline([this] { m_link->cut(); }),
      m_settings(std::make_shared<SettingsStore>(m_options.settingsFile.empty()
                                                     ? SettingsStore::defaultFile()
                                                     : std::filesystem::path(m_options.settingsFile))),
      m_library(m_options.logFile)
{
    m_obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, m_settings);
    if (m_options.units) {
        m_obd->getSettings()->setUnitSystem(librarySystem(*m_options.units));
    }
    if (!m_options.traceFile.empty()) {
        m_trace = std::make_unique<TrafficTrace>(m_options.traceFile);
        m_obd->getConnectionManager()->addLogger(m_trace.get());
    }
}

Session::~Session()
{
    close();
}

std::shared_ptr<obd::IObdProxy> Session::proxy() const
{
    return m_obd->getConnectionManager()->getProxy();
}

std::shared_ptr<obd::IAdapter> Session::adapter() const
{
    return m_obd->getConnectionManager()->getAdapter();
}

IChannelControl& Session::channel() const
{
    return m_link->control();
}

std::vector<std::shared_ptr<obd::IEcu>> Session::selectedModules() const
{
    if (m_options.module) {
        return {m_obd->getEcuManager()->getCurrentEcu()};
    }
    return m_obd->getEcuManager()->getEcus();
}

void Session::select(obd::IEcu const& ecu) const
{
    m_obd->getEcuManager()->setCurrentEcu(ecu.id());
}

std::filesystem::path const& Session::settingsFile() const
{
    return m_settings->file();
}

std::shared_ptr<SignalSet const> Session::signals()
{
    if (m_signals == nullptr) {
        m_signals = std::make_shared<SignalSet const>(
            m_options.signalFiles, SignalSet::folderBesides(m_settings->file()), m_options.onProgress);
    }
    return m_signals;
}

Units Session::units() const
{
    return m_obd->getSettings()->unitSystem() == obd::UnitSystem::Metric ? Units::Metric : imperialUnits();
}

Units Session::imperialUnits() const
{
    bool const chosen = m_options.units && *m_options.units != Units::Metric;
    return chosen ? *m_options.units : storedUnits(obd::UnitSystem::Imperial, *m_settings);
}

obd::VehicleProtocol Session::protocol() const
{
    return m_options.protocol ? static_cast<obd::VehicleProtocol>(*m_options.protocol)
                              : m_obd->getSettings()->connectionOptions()->protocol();
}

void Session::connect()
{
    openLink();
    tellProgress(fmt::format("Connecting to {} ...\n", port()));
    if (!openOnThread()) {
        failOpening();
    }
    channel().onConnected();
    if (m_options.onDetail) {
        tellConnected();
    }
    selectEcu();
}

std::shared_ptr<obd::IDataConnection> Session::connectToPort()
{
    openLink();
    tellProgress(fmt::format("Connecting to {} ...\n", port()));
    enter(Phase::Open);
    std::shared_ptr<obd::IDataConnection> const connection = m_link->plainConnection();
    if (m_trace != nullptr) {
        connection->addLogger(m_trace.get());
    }
    return connection;
}

// The opening may take minutes; meanwhile this thread dispatches.
bool Session::openOnThread()
{
    enter(Phase::Opening);
    m_link->connection()->addLogger(&m_opening);
    std::atomic<bool> done{false};
    bool opened = false;
    std::thread opener([&] {
        opened = m_obd->getConnectionManager()->openConnection(m_link->connection(), protocol(), m_options.reset);
        done = true;
        m_loop.wake();
    });
    auto const start = std::chrono::steady_clock::now();
    while (!m_loop.runUntil([&done] { return done.load(); }, std::chrono::steady_clock::now() + phaseStep)) {
        tellPhase(start);
    }
    opener.join();
    m_link->connection()->removeLogger(&m_opening);
    if (m_options.onPhase) {
        m_options.onPhase({});
    }
    enter(Phase::Open);
    return opened;
}

void Session::enter(Phase phase)
{
    {
        std::lock_guard const lock(m_phaseMutex);
        m_phase = phase;
    }
    if (m_interrupted) {
        interrupt();
    }
}

void Session::interrupt()
{
    std::lock_guard const lock(m_phaseMutex);
    m_interrupted = true;
    if (m_phase == Phase::Opening) {
        m_link->cut();
    } else if (m_phase == Phase::Open) {
        m_deadline.start();
    }
    m_loop.wake();
}

void Session::selectEcu()
{
    if (!m_options.module) {
        return;
    }
    m_obd->getEcuManager()->setCurrentEcu(*m_options.module);
    if (m_obd->getEcuManager()->getCurrentEcu() != nullptr) {
        return;
    }
    std::vector<unsigned int> ids;
    m_obd->getEcuManager()->getEcuIds(ids);
    std::string list;
    for (unsigned int const id : ids) {
        list += fmt::format("{}{:X}", list.empty() ? "" : ", ", id);
    }
    throw Error(ErrorKind::NotSupported, fmt::format("The vehicle has no control module {:X}", *m_options.module),
                {"these answer: " + list});
}

void Session::close()
{
    enter(Phase::Closed);
    if (m_link == nullptr) {
        return;
    }
    m_deadline.start();
    m_obd->getConnectionManager()->closeConnection();
    m_link->cut();
    m_deadline.stop();
    tellResets();
    if (m_options.onDetail) {
        tellHabits();
    }
    m_link.reset();
}

} // namespace velmora
