#pragma once

#include "libvelmora/poll/poller.h"
#include "libvelmora/session/session.h"
#include "libvelmora/uds/signalchoice.h"
#include "libvelmora/watch/adapternap.h"
#include "libvelmora/watch/iwatchedcar.h"
#include "libvelmora/watch/requestcount.h"

#include <condition_variable>
#include <functional>
#include <mutex>
#include <string_view>

namespace velmora {

struct SessionCarOptions
{
    SessionOptions session;
    std::string vehicle;
    std::vector<std::string> sensors; // wishes; none: those that trips need, and load, throttle and fuel level
    bool fullVin = false;
    bool fast = false;
    // Every reading as soon as it is there, on the thread that reads it.
    std::function<void(Reading const&)> onReading;
    // What passes between library and adapter, on the thread that sends or receives it.
    std::function<void(bool sent, std::string_view text)> onTraffic;
};

// The car behind a port: a session of the library while it is awake, the bare port while it sleeps.
class SessionCar : public IWatchedCar
{
public:
    explicit SessionCar(SessionCarOptions options) : m_options(std::move(options)), m_count(m_options.onTraffic) {}
    ~SessionCar() override { disconnect(); }

    void connect() override;
    void disconnect() override;
    std::vector<ModuleInfo> modules() override;
    SensorList sensors() override;
    void startAsking() override;
    void stopAsking() override;
    std::vector<Reading> readings() override;
    std::vector<CodeLook> lookAtCodes() override;
    void check() override;
    std::optional<double> volts() override;
    bool probe() override;
    std::string vin() const override { return m_vin; }
    bool startNap() override;
    bool napIsOver() override;
    std::uint64_t requests() const override { return m_count.requests(); }
    std::uint64_t errors() const override { return m_count.errors(); }

    // Null while there is none that is brought up.
    Session* session() const { return m_up ? m_session.get() : nullptr; }
    // How often one was brought up.
    unsigned int visits() const { return m_visits; }
    // Reads these wishes beside the others from now on, as far as they are offered.
    void readAlso(std::vector<std::string> const& wishes);
    // Reads these in the place of all others from now on; none at all gives the others back.
    void readOnly(std::vector<std::string> const& wishes);

    // Dispatches what the library asks for until the time has come or interrupt was called.
    void wait(std::chrono::milliseconds time);
    // Ends what it is at, for good. Any thread.
    void interrupt();

private:
    std::unique_ptr<IPort> openBarePort();
    void changeSources();
    std::vector<PollSource> chooseSources();

    SessionCarOptions const m_options;
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::unique_ptr<Session> m_session;
    bool m_up = false;
    unsigned int m_visits = 0;
    std::vector<std::string> m_further; // wishes beside those of the options
    std::vector<std::string> m_only;    // wishes in the place of all others; empty: none are
    bool m_interrupted = false;         // protected by m_mutex, as is the pointer above
    std::vector<Reading> m_readings;    // protected by m_mutex
    std::vector<PollSource> m_sources;
    std::unique_ptr<SignalChoice> m_signals; // of the session
    std::unique_ptr<Poller> m_poller;
    std::unique_ptr<AdapterNap> m_nap;
    std::string m_vin;
    RequestCount m_count;
};

} // namespace velmora
