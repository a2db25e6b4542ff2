// Which port a session opens, and how.

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/port/recordedport.h"
#include "libvelmora/session/foundport.h"
#include "libvelmora/session/link.h"
#include "libvelmora/session/session.h"
#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

#include <utility>
#include <variant>

namespace velmora {

namespace {

// A request and its reply take some of the radio's intervals, of up to 50 ms each.
constexpr WireTime lowEnergyLatency{200};

std::string portKey()
{
    return "velmora/port";
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

} // namespace

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

PortAddress Session::searchPort()
{
    PortSearch search;
    search.ports = listSerialPorts();
    search.paired = pairedAdapters();
    search.baud = m_options.baud;
    search.tell = [this](std::string const& line) { tellProgress(line); };
    search.stop = [this] { return m_interrupted.load(); };
    return findAdapterAgain(std::move(search), m_settings->file());
}

std::string Session::port() const
{
    if (m_options.openPort) {
        return m_options.port.empty() ? "the application's port" : m_options.port;
    }
    return m_address ? toString(*m_address) : std::string();
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

} // namespace velmora
