#pragma once

#include "libvelmora/dash/dashaccess.h"
#include "libvelmora/dash/dashlayouts.h"
#include "libvelmora/dash/dashstate.h"
#include "libvelmora/dash/eventlog.h"
#include "libvelmora/http/httpserver.h"
#include "libvelmora/output/health.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"

#include <atomic>
#include <chrono>

namespace velmora {

// What the page knows of the one that feeds it.
struct DashContext
{
    std::shared_ptr<DashDesk> desk;
    HealthSource health = [] { return Health(); };
    std::filesystem::path layouts;
    std::filesystem::path settings;  // with the sensors' limits; empty for none
    std::function<Json()> playState; // where a recording is played; empty for a vehicle
    std::string token;               // where one is needed; empty: made up
    bool mustListen = false;         // a port that can't be had ends all, rather than being tried again
    std::function<std::chrono::steady_clock::time_point()> now = std::chrono::steady_clock::now; // set by tests alone
    // Where the page is, and what to know about it. Called by open.
    std::function<void(std::string const& link, std::string const& remark)> onLink = [](auto const&, auto const&) {};
};

// Serves the page on HOST:PORT. Values reach it over the desk as soon as they are read; the other records as those of
// any output. Settings: allow_clear, allow_console (yes or no), name (further names of the host, with commas between).
class DashOutput : public IOutput
{
public:
    // Throws Error for settings that make no sense.
    DashOutput(OutputAddress const& address, DashContext context);
    ~DashOutput() override;

    void open() override;
    void write(Records records) override;
    void close() override { m_server.stop(); }

    // Once it is open.
    unsigned short port() const { return m_server.port(); }
    std::string link() const;

private:
    static constexpr std::size_t historyPoints = 600;
    static constexpr char const* streamPath = "/events";

    void addRoutes();
    void addHandler(std::string const& method, std::string const& path, HttpHandler handler);
    void listen();
    HttpResponse takeAsk(HttpRequest const& request);
    HttpResponse takePlay(Json const& wish);
    Json beatNow() const;
    HttpResponse takeRuns(Json const& wish);
    HttpResponse tellRuns() const;
    void publishRuns();
    HttpResponse takeLayout(HttpRequest const& request);
    HttpResponse tellHistory(HttpRequest const& request) const;
    void takeVehicle(DashVehicle const& vehicle);
    void takeAnswer(DashAnswer const& answer);
    void wishSensors(Json const& layout);
    Json layout() const;
    std::string greeting(std::string const& lastId) const;

    HttpPlace const m_place;
    DashContext const m_context;
    bool const m_allowClear;
    bool const m_allowConsole;
    DashAccess m_access;
    DashLayouts const m_layouts;
    DashState m_state;
    DashEventLog m_log;
    mutable std::mutex m_layoutMutex;
    Json m_layout; // protected by m_layoutMutex
    std::chrono::steady_clock::time_point m_lastBeat;
    std::chrono::steady_clock::time_point m_lastRuns;
    std::atomic<std::chrono::steady_clock::time_point> m_lastSeen{}; // a reader, or the wish to time runs
    HttpServer m_server;
    std::shared_ptr<void> m_listening;
};

} // namespace velmora
