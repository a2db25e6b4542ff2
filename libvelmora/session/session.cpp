#include "libvelmora/session/session.h"

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/port/opening/portsearch.h"
#include "libvelmora/port/recordedport.h"
#include "libvelmora/record/traffictrace.h"
#include "libvelmora/session/openingfailure.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/text/text.h"

#include <obd/iconnectionmanager.h>
#include <obd/iconnectionoptions.h>
#include <obd/idevice.h>
#include <obd/iecu.h>
#include <obd/ivelmorasettings.h>
#include <obd/obdvelmorabuilder.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <atomic>
#include <thread>
#include <utility>
#include <variant>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds phaseStep{250};
// A request and its reply take some of the radio's intervals, of up to 50 ms each.
constexpr WireTime lowEnergyLatency{200};

std::string portKey()
{
    return "velmora/port";
}

// Where an adapter was found last, by looking for it.
std::string foundPortKey()
{
    return "velmora/foundport";
}

// None where there is no Bluetooth, which is no reason not to look elsewhere.
std::vector<BluetoothEntry> pairedAdapters()
{
    try {
        return listBluetoothAdapters(std::chrono::seconds(0), {});
    } catch (Error const&) {
        return {};
    }
}

[[noreturn]] void failInterrupted()
{
    throw Error(ErrorKind::Interrupted, "Interrupted");
}

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
    if (m_trace != nullptr) {
        m_obd->getConnectionManager()->removeLogger(m_trace.get());
    }
    m_obd.reset();
}

std::shared_ptr<obd::IObdProxy> Session::proxy() const
{
    return m_obd->getConnectionManager()->getProxy();
}

std::shared_ptr<obd::IAdapter> Session::adapter() const
{
    return m_obd->getConnectionManager()->getAdapter();
}

std::vector<std::shared_ptr<obd::IEcu>> Session::selectedModules() const
{
    if (m_options.ecu) {
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

PortAddress Session::findPort()
{
    if (!m_address) {
        std::string text = m_options.port;
        bool const named = !text.empty() || m_settings->getString(portKey(), text);
        m_address =
            named && text != "auto" ? parsePortAddress(text, m_options.baud.value_or(defaultBaud)) : searchPort();
    }
    return *m_address;
}

// The winner is remembered apart from a port that the user names.
PortAddress Session::searchPort()
{
    PortSearch search;
    search.ports = listSerialPorts();
    search.paired = pairedAdapters();
    search.baud = m_options.baud;
    search.tell = [this](std::string const& line) { tellProgress(line); };
    search.stop = [this] { return m_interrupted.load(); };
    if (std::string last; m_settings->getString(foundPortKey(), last)) {
        search.last = parsePortAddress(last);
    }
    PortAddress const found = findAdapter(search);
    if (found != search.last) {
        rememberPort(found);
    }
    return found;
}

// A help for the next time, which must not stand in the way of this one.
void Session::rememberPort(PortAddress const& address)
{
    try {
        // Alone: what was chosen for this run stays out of the file.
        SettingsStore kept(m_settings->file());
        kept.setString(foundPortKey(), toAddressText(address));
        kept.sync();
    } catch (Error const& error) {
        tellProgress(std::string("The port is not remembered: ") + error.what() + "\n");
    }
}

std::string Session::port() const
{
    if (m_options.openPort) {
        return m_options.port.empty() ? "the application's port" : m_options.port;
    }
    return m_address ? toString(*m_address) : std::string();
}

obd::VehicleProtocol Session::protocol() const
{
    return m_options.protocol.value_or(m_obd->getSettings()->connectionOptions()->protocol());
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

std::string Session::failedTrace() const
{
    return m_trace != nullptr && m_trace->failed() ? m_options.traceFile : std::string();
}

void Session::openLink()
{
    std::unique_ptr<IPort> port =
        m_options.openPort ? m_options.openPort() : openPort(findPort(), [this] { return m_interrupted.load(); });
    if (m_recorder != nullptr) {
        port = std::make_unique<RecordedPort>(std::move(port), *m_recorder);
    }
    auto learnt = std::make_shared<LearntStore>(LearntStore::besides(m_settings->file()));
    if (m_options.forget) {
        learnt->forget();
    }
    ChannelOptions options{.port = this->port(), .sleepAtEnd = m_options.sleep};
    options.returns = ReturnNotes::besides(m_settings->file());
    bool const replayed = m_address && std::holds_alternative<ReplayAddress>(*m_address);
    bool const inProcess = replayed || (m_address && std::holds_alternative<SimulatorAddress>(*m_address));
    // A recording holds what every reader of it would ask, which is no matter of haste.
    bool const recorded = m_recorder != nullptr || replayed;
    options.counting = !recorded;
    options.shortWait = !recorded;
    if (m_address && std::holds_alternative<BleAddress>(*m_address)) {
        options.latency = lowEnergyLatency;
    }
    // What is simulated in this process is no adapter that somebody comes back to.
    if (inProcess) {
        options.returns.clear();
    }
    m_link = std::make_unique<Link>(std::move(port), std::move(options), inProcess ? nullptr : std::move(learnt),
                                    m_options.makeChannel);
}

void Session::tellProgress(std::string const& lines) const
{
    if (m_options.onProgress) {
        m_options.onProgress(lines);
    }
}

void Session::tellConnected() const
{
    std::shared_ptr<obd::IAdapter> const found = adapter();
    m_options.onDetail(fmt::format("Connected: {} {}, {}\n", readable(found->device()), readable(found->description()),
                                   readable(found->getProtocolDescription())));
    for (std::shared_ptr<obd::IEcu> const& ecu : m_obd->getEcuManager()->getEcus()) {
        m_options.onDetail(fmt::format("Control module {:X}: {} ({})\n", ecu->id(), readable(ecu->name()),
                                       readable(ecu->description())));
    }
}

// Values went missing meanwhile, and the cause is one that grows worse.
void Session::tellResets() const
{
    unsigned int const resets = channel().statistics().habits[static_cast<std::size_t>(Habit::SettingsLost)];
    if (resets != 0) {
        tellProgress(
            fmt::format("The adapter reset itself {}x and was set up again; is it firmly in its socket, and the "
                        "battery well?\n",
                        resets));
    }
}

void Session::tellHabits() const
{
    ChannelStatistics const statistics = channel().statistics();
    for (std::size_t i = 0; i < habitCount; ++i) {
        if (statistics.habits[i] != 0) {
            m_options.onDetail(
                fmt::format("The adapter's habits: {}, {}x\n", habitName(static_cast<Habit>(i)), statistics.habits[i]));
        }
    }
    if (statistics.waitMs) {
        m_options.onDetail(fmt::format("The adapter's wait for replies was shortened to {} ms\n", *statistics.waitMs));
    }
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

void Session::tellPhase(std::chrono::steady_clock::time_point start) const
{
    std::string const phase = m_opening.phase();
    if (m_options.onPhase && !phase.empty()) {
        auto const elapsed = std::chrono::steady_clock::now() - start;
        m_options.onPhase(
            fmt::format("{} ... {} s", phase, std::chrono::duration_cast<std::chrono::seconds>(elapsed).count()));
    }
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

void Session::failOpening()
{
    std::string const port = this->port();
    if (m_interrupted) {
        failInterrupted();
    }
    if (m_link->adapterResets()) {
        throw openingfailure::resettingAdapter(port);
    }
    if (m_link->lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter on " + port + " broke while connecting",
                    {"is the adapter still plugged in and in reach?"});
    }
    std::shared_ptr<obd::IAdapter> const found = adapter();
    if (found == nullptr) {
        throw openingfailure::silentAdapter(port, m_address, m_opening);
    }
    checkAdapter();
    if (m_opening.headersMissing()) {
        throw openingfailure::headersMissing(readable(found->device()), port);
    }
    throw openingfailure::silentVehicle(readable(found->device()), port, trouble());
}

void Session::selectEcu()
{
    if (!m_options.ecu) {
        return;
    }
    m_obd->getEcuManager()->setCurrentEcu(*m_options.ecu);
    if (m_obd->getEcuManager()->getCurrentEcu() != nullptr) {
        return;
    }
    std::vector<unsigned int> ids;
    m_obd->getEcuManager()->getEcuIds(ids);
    std::string list;
    for (unsigned int const id : ids) {
        list += fmt::format("{}{:X}", list.empty() ? "" : ", ", id);
    }
    throw Error(ErrorKind::NotSupported, fmt::format("The vehicle has no control module {:X}", *m_options.ecu),
                {"these answer: " + list});
}

void Session::check() const
{
    if (m_interrupted) {
        failInterrupted();
    }
    if (m_link != nullptr && m_link->adapterResets()) {
        throw openingfailure::resettingAdapter(port());
    }
    // A channel that can't take an address back gives up, too; the cause is the silence.
    if (adapterSilent() && !m_link->portLost()) {
        throw Error(ErrorKind::AdapterSilent, "The adapter on " + port() + " no longer answers",
                    {"is it still in its socket, and in reach?", "pull the adapter and plug it in again"});
    }
    if (lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter broke", {"is it still plugged in and in reach?"});
    }
}

void Session::checkAdapter() const
{
    if (m_link != nullptr && channel().statistics().unanswered) {
        std::shared_ptr<obd::IObdProxy> const bus = proxy();
        std::shared_ptr<obd::IAdapter> const found = adapter();
        float ignored = 0.0F;
        if (bus != nullptr && bus->isConnected()) {
            bus->batteryVoltage(); // a poller may be at work beside
        } else if (found != nullptr) {
            found->batteryVoltage(ignored);
        }
    }
    check();
}

std::string Session::trouble() const
{
    return m_link != nullptr ? readable(channel().statistics().trouble) : std::string();
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
