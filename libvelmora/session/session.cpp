#include "libvelmora/session/session.h"

#include "libvelmora/port/openport.h"
#include "libvelmora/port/recordedport.h"
#include "libvelmora/record/traffictrace.h"
#include "libvelmora/session/settingsstore.h"
#include "libvelmora/text/text.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"

#include <obd/databridge.h>
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

namespace velmora {

namespace {

std::string portKey()
{
    return "velmora/port";
}

[[noreturn]] void failInterrupted()
{
    throw Error(ErrorKind::Interrupted, "Interrupted");
}

} // namespace

Session::Session(GlobalOptions const& options)
    : m_options(options), m_deadline([this] { m_bridge->invalidate(); }),
      m_settings(std::make_shared<SettingsStore>(
          options.settingsFile.empty() ? SettingsStore::defaultFile() : std::filesystem::path(options.settingsFile))),
      m_library(options.logFile)
{
    m_obd = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, m_settings);
    if (m_options.units) {
        m_obd->getSettings()->setUnitSystem(*m_options.units);
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

PortAddress Session::portAddress() const
{
    std::string text = m_options.port;
    if (text.empty() && !m_settings->getString(portKey(), text)) {
        throw Error(
            ErrorKind::WrongUse, "No port is named",
            {"name it with --port, in VELMORA_PORT, or as port under [velmora] in " + m_settings->file().string(),
             "`velmora ports` lists serial ports; sim:petrol-can11 is a simulated car"});
    }
    return parsePortAddress(text, m_options.baud.value_or(defaultBaud));
}

obd::VehicleProtocol Session::protocol() const
{
    return m_options.protocol.value_or(m_obd->getSettings()->connectionOptions()->protocol());
}

void Session::connect()
{
    PortAddress const address = portAddress();
    m_bridge = std::make_shared<obd::DataBridge>();
    std::unique_ptr<IPort> port = openPort(address);
    if (m_recorder != nullptr) {
        port = std::make_unique<RecordedPort>(std::move(port), *m_recorder);
    }
    m_pump = std::make_unique<BridgePump>(std::move(port), m_bridge);
    if (!m_options.quiet) {
        tell(fmt::format("Connecting to {} ...\n", toString(address)));
    }
    if (!openOnThread()) {
        failOpening(address);
    }
    if (m_options.verbose) {
        tellConnected();
    }
    selectEcu();
}

void Session::tellConnected() const
{
    std::shared_ptr<obd::IAdapter> const found = adapter();
    tell(fmt::format("Connected: {} {}, {}\n", readable(found->device()), readable(found->description()),
                     readable(found->getProtocolDescription())));
    for (std::shared_ptr<obd::IEcu> const& ecu : m_obd->getEcuManager()->getEcus()) {
        tell(fmt::format("Control module {:X}: {} ({})\n", ecu->id(), readable(ecu->name()),
                         readable(ecu->description())));
    }
}

// The opening may take minutes; meanwhile this thread dispatches and listens for Ctrl-C.
bool Session::openOnThread()
{
    std::atomic<bool> done{false};
    bool opened = false;
    std::thread opener([&] {
        opened = m_obd->getConnectionManager()->openConnection(m_bridge, protocol(), m_options.reset);
        done = true;
        m_loop.wake();
    });
    Interrupt::instance().setHandler([this] {
        m_bridge->invalidate();
        m_loop.wake();
    });
    m_loop.runUntil([&done] { return done.load(); });
    opener.join();
    Interrupt::instance().setHandler([this] {
        m_loop.wake();
        m_deadline.start();
    });
    return opened;
}

void Session::failOpening(PortAddress const& address)
{
    std::string const port = toString(address);
    if (Interrupt::instance().raised()) {
        failInterrupted();
    }
    if (m_pump->lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter on " + port + " broke while connecting",
                    {"is the adapter still plugged in and in reach?"});
    }
    std::shared_ptr<obd::IAdapter> const found = adapter();
    if (found == nullptr) {
        throw Error(ErrorKind::AdapterSilent, "Nothing on " + port + " answers like an ELM327 adapter",
                    {"is it the right port?", "a serial adapter may use another line rate: try --baud 9600 or 115200",
                     "pull the adapter and plug it in again, or try --reset"});
    }
    throw Error(ErrorKind::VehicleSilent,
                "The adapter (" + readable(found->device()) + ") on " + port + " works, but no control module answers",
                {"is the ignition on?", "is the adapter firmly in the car's OBD socket?",
                 "a car that is not found automatically may answer on a protocol you choose: --protocol 1 to 9"});
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
    if (Interrupt::instance().raised()) {
        failInterrupted();
    }
    if (m_pump != nullptr && m_pump->lost()) {
        throw Error(ErrorKind::LinkLost, "The link to the adapter broke", {"is it still plugged in and in reach?"});
    }
}

void Session::close()
{
    Interrupt::instance().setHandler(nullptr);
    if (m_bridge == nullptr) {
        return;
    }
    m_deadline.start();
    m_obd->getConnectionManager()->closeConnection();
    m_bridge->invalidate();
    m_deadline.stop();
    m_pump.reset();
    m_bridge.reset();
}

} // namespace velmora
