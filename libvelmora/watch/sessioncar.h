#pragma once

#include "libvelmora/poll/poller.h"
#include "libvelmora/session/session.h"
#include "libvelmora/watch/adapternap.h"
#include "libvelmora/watch/iwatchedcar.h"
#include "libvelmora/watch/requestcount.h"

#include <condition_variable>
#include <mutex>

namespace velmora {

struct SessionCarOptions
{
    SessionOptions session;
    std::string vehicle;
    std::vector<std::string> sensors; // wishes; none: those that trips need, and load, throttle and fuel level
    bool fullVin = false;
    bool fast = false;
};

// The car behind a port: a session of the library while it is awake, the bare port while it sleeps.
class SessionCar : public IWatchedCar
{
public:
    explicit SessionCar(SessionCarOptions options) : m_options(std::move(options)) {}
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

    // Dispatches what the library asks for until the time has come or interrupt was called.
    void wait(std::chrono::milliseconds time);
    // Ends what it is at, for good. Any thread.
    void interrupt();

private:
    std::unique_ptr<IPort> openBarePort();

    SessionCarOptions const m_options;
    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::unique_ptr<Session> m_session;
    bool m_up = false;
    bool m_interrupted = false;      // protected by m_mutex, as is the pointer above
    std::vector<Reading> m_readings; // protected by m_mutex
    std::vector<PollSource> m_sources;
    std::unique_ptr<Poller> m_poller;
    std::unique_ptr<AdapterNap> m_nap;
    std::string m_vin;
    RequestCount m_count;
};

} // namespace velmora
