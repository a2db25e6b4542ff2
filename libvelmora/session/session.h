#pragma once

#include "libvelmora/channel/ichannelcontrol.h"
#include "libvelmora/port/portaddress.h"
#include "libvelmora/session/deadline.h"
#include "libvelmora/session/dispatchloop.h"
#include "libvelmora/session/libraryuse.h"
#include "libvelmora/session/openingwatch.h"
#include "libvelmora/session/sessionoptions.h"
#include "libvelmora/signal/signalset.h"

#include <obd/iadapter.h>
#include <obd/idataconnection.h>
#include <obd/iecumanager.h>
#include <obd/iobdproxy.h>
#include <obd/iobdvelmora.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

class DialogueRecorder;
class Link;
class SettingsStore;
class TrafficTrace;

// The library in use: settings, log and top-level object from the start, a connection after connect. For one thread,
// the one that dispatches.
class Session
{
public:
    explicit Session(SessionOptions options);
    // Closes what is open. Services must be gone.
    ~Session();
    Session(Session const&) = delete;
    Session& operator=(Session const&) = delete;

    // Takes down all that passes the port from connect on. The recorder must outlive the session.
    void record(DialogueRecorder& recorder) { m_recorder = &recorder; }

    // The port that connect is going to open; an adapter is looked for where none is named or remembered. Throws Error
    // if none is found.
    PortAddress findPort();

    // Opens the port and brings up adapter and vehicle, and selects the control module that the options name. Throws
    // Error that tells how far it came.
    void connect();

    // Closes what is open, to connect again. Services must be gone.
    void disconnect() { close(); }
    // Opens the port alone, for a dialogue with whatever is there. Throws Error.
    std::shared_ptr<obd::IDataConnection> connectToPort();

    obd::IObdVelmora& obd() const { return *m_obd; }
    // The control modules that the options select: one, or all.
    std::vector<std::shared_ptr<obd::IEcu>> selectedModules() const;
    // Makes a module the one that the library's services work with.
    void select(obd::IEcu const& ecu) const;
    std::shared_ptr<obd::IObdProxy> proxy() const;
    std::shared_ptr<obd::IAdapter> adapter() const;
    // The port's address, for messages and reports.
    std::string port() const;
    std::filesystem::path const& settingsFile() const;
    // The units that values are to be shown in.
    Units units() const;
    // Those that are not metric, of the two kinds.
    Units imperialUnits() const;
    // What the channel to the adapter is told, and tells. After connect only.
    IChannelControl& channel() const;
    // Signals of one's own and built-in ones. Reads their files the first time: throws Error for one that was named and
    // holds mistakes.
    std::shared_ptr<SignalSet const> signals();
    DispatchLoop& loop() { return m_loop; }
    SessionOptions const& options() const { return m_options; }
    // Tells whoever wants to know what the session is at: lines with their line feeds.
    void tellProgress(std::string const& lines) const;

    // The trace file's name if it could not be written to the end, else empty.
    std::string failedTrace() const;

    // Throws Error if the link has broken, the adapter has fallen silent or the session was interrupted meanwhile.
    void check() const;
    // The same, and asks the adapter itself first where the last request brought nothing at all. That takes some
    // seconds if it is silent.
    void checkAdapter() const;
    // The adapter's word for it that the last request brought nothing, such as "CAN ERROR"; empty for none.
    std::string trouble() const;

    // Ends what the session is at, for good: the opening at once, else what is asked soon. Any thread.
    void interrupt();
    bool interrupted() const { return m_interrupted; }
    // Whether the link has broken.
    bool lost() const;
    // Whether the adapter has said nothing for seconds, though it was woken.
    bool adapterSilent() const;

private:
    enum class Phase
    {
        Closed,
        Opening,
        Open,
    };

    PortAddress searchPort();
    void openLink();
    void enter(Phase phase);
    obd::VehicleProtocol protocol() const;
    bool openOnThread();
    void tellPhase(std::chrono::steady_clock::time_point start) const;
    [[noreturn]] void failOpening();
    void tellConnected() const;
    void tellHabits() const;
    void tellResets() const;
    void selectEcu();
    void close();

    SessionOptions const m_options;
    // Ends the waiting for a silent adapter soon after a close or an interruption began.
    Deadline m_deadline;
    std::shared_ptr<SettingsStore> m_settings;
    LibraryUse const m_library;
    DispatchLoop m_loop;
    std::unique_ptr<TrafficTrace> m_trace; // told by the library up to its end
    std::shared_ptr<obd::IObdVelmora> m_obd;
    std::optional<PortAddress> m_address; // once it is known
    std::unique_ptr<Link> m_link;
    std::atomic<bool> m_interrupted{false};
    std::mutex m_phaseMutex;
    Phase m_phase = Phase::Closed; // protected by m_phaseMutex
    DialogueRecorder* m_recorder = nullptr;
    OpeningWatch m_opening;
    std::shared_ptr<SignalSet const> m_signals; // null until they are wanted
};

} // namespace velmora
