#include "libvelmora/dash/dashoutput.h"

#include "libvelmora/dash/dashlimits.h"
#include "libvelmora/dash/dashpage.h"
#include "libvelmora/dash/dashplace.h"

#include <velmora/error.h>
#include <velmora/version.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr char const* trafficPath = "/traffic";
constexpr std::chrono::milliseconds beat{1000};
constexpr std::chrono::seconds unseenLimit{30};
constexpr std::chrono::milliseconds runsStep{250};
constexpr std::size_t chartAtFirst = 6; // sensors whose history comes without being asked for

HttpLimits serverLimits()
{
    return {.connections = 64, .time = std::chrono::seconds(5)};
}

// Browsers tell it when they connect again by themselves; the page does it where it makes a stream anew.
std::string lastIdOf(HttpRequest const& request)
{
    std::string const told = request.header("last-event-id");
    return told.empty() && request.query.starts_with("last=") ? request.query.substr(5) : told;
}

std::string tokenOf(DashContext const& context)
{
    return context.token.empty() ? makeToken() : context.token;
}

} // namespace

DashOutput::DashOutput(OutputAddress const& address, DashContext context)
    : m_place(parseHttpPlace(address.target)), m_context(std::move(context)),
      m_allowClear(isAllowed(address, "allow_clear")), m_allowConsole(isAllowed(address, "allow_console")),
      m_access(isLoopback(m_place.host) && !m_allowClear && !m_allowConsole ? std::string() : tokenOf(m_context),
               hostNamesOf(address.option("name"))),
      m_layouts(m_context.layouts), m_server(serverLimits())
{
    addRoutes();
}

DashOutput::~DashOutput()
{
    m_listening.reset();
    m_server.stop();
}

// All replies carry the page's headers.
void DashOutput::addHandler(std::string const& method, std::string const& path, HttpHandler handler)
{
    m_server.addRoute(method, path, [handler = std::move(handler)](HttpRequest const& request) {
        HttpResponse response = handler(request);
        std::ranges::copy(dashHeaders(), std::back_inserter(response.headers));
        return response;
    });
}

void DashOutput::addRoutes()
{
    m_server.setGate([this](HttpRequest const& request) { return m_access.gate(request); });
    addDashPage(m_server);
    addHandler("POST", "/login", [this](HttpRequest const& request) { return m_access.login(request); });
    addHandler("POST", "/ask", [this](HttpRequest const& request) { return takeAsk(request); });
    addHandler("POST", "/layout", [this](HttpRequest const& request) { return takeLayout(request); });
    addHandler("GET", "/performance.json", [this](HttpRequest const& /*request*/) { return tellRuns(); });
    addHandler("GET", "/history", [this](HttpRequest const& request) { return tellHistory(request); });
    m_server.addStream(
        streamPath, [this](HttpRequest const& request) { return greeting(lastIdOf(request)); },
        [this](HttpRequest const& /*request*/) {
            return HttpServer::event("values", m_state.allValues()) +
                   HttpServer::event("performance", dumpedJson(m_context.desk->runs().state(false)));
        });
    auto const allLines = [this](HttpRequest const& /*request*/) {
        return HttpServer::event("lines", m_state.allLines());
    };
    m_server.addStream(trafficPath, allLines, allLines);
}

void DashOutput::listen()
{
    DashDesk::Listener listener;
    listener.reading = [this](Reading const& reading) { m_state.take(reading); };
    listener.line = [this](DashLine const& line) { m_state.take(line); };
    listener.vehicle = [this](DashVehicle const& vehicle) { takeVehicle(vehicle); };
    listener.answer = [this](DashAnswer const& answer) { takeAnswer(answer); };
    m_listening = m_context.desk->listen(std::move(listener));
}

void DashOutput::open()
{
    try {
        m_server.start(m_place);
    } catch (Error const& error) {
        throw Error(m_context.mustListen ? ErrorKind::WrongUse : error.kind(), error.what(), error.hints());
    }
    m_access.setPort(port());
    listen();
    std::string remark;
    if (!isLoopback(m_place.host)) {
        remark = "Whoever is in the same network can read along, and with the link take part.";
    }
    m_context.onLink(link(), remark);
}

std::string DashOutput::link() const
{
    return pageLink(m_place.host, port(), m_access.token());
}

void DashOutput::write(Records records)
{
    for (SharedRecord const& record : records) {
        m_state.take(*record);
    }
    if (std::string const values = m_state.takeValues(); !values.empty()) {
        m_server.publishLatest(streamPath, HttpServer::event("values", values, m_log.add(values)));
    }
    if (m_state.takeNews()) {
        m_server.publish(streamPath, HttpServer::event("news", dumpedJson(m_state.news())));
    }
    if (std::string const lines = m_state.takeLines(); !lines.empty()) {
        m_server.publishLatest(trafficPath, HttpServer::event("lines", lines));
    }
    publishRuns();
    auto const now = m_context.now();
    if (now - m_lastBeat >= beat) {
        m_lastBeat = now;
        m_server.publish(streamPath, HttpServer::event("beat", dumpedJson(beatNow())));
    }
}

// What nobody looks at any more is not worth reading two sensors only for.
void DashOutput::publishRuns()
{
    RunBoard& runs = m_context.desk->runs();
    auto const now = m_context.now();
    if (now - m_lastRuns >= runsStep && runs.takeChange()) {
        m_lastRuns = now;
        m_server.publishLatest(streamPath, HttpServer::event("performance", dumpedJson(runs.state(false))));
    }
    if (m_server.readers() > 0 || !runs.isActive()) {
        m_lastSeen = now;
    } else if (now - m_lastSeen.load() > unseenLimit) {
        m_lastSeen = now;
        m_context.desk->ask({"performance", "end"});
    }
}

void DashOutput::wishSensors(Json const& layout)
{
    std::string wishes;
    for (std::string const& id : DashLayouts::sensorsOf(layout)) {
        wishes += id + "\n";
    }
    m_context.desk->ask({"sensors", wishes});
}

void DashOutput::takeVehicle(DashVehicle const& vehicle)
{
    m_state.take(vehicle);
    Json const layout = m_layouts.load(vehicle.key);
    {
        std::lock_guard const lock(m_layoutMutex);
        m_layout = layout;
    }
    m_server.publish(streamPath, greeting({}));
    if (!layout.is_null()) {
        wishSensors(layout);
    }
}

void DashOutput::takeAnswer(DashAnswer const& answer)
{
    m_state.take(answer);
    Json const event = {{"topic", answer.topic},
                        {"time", std::chrono::duration_cast<std::chrono::milliseconds>(
                                     std::chrono::system_clock::now().time_since_epoch())
                                     .count()},
                        {"done", answer.done},
                        {"data", answer.data}};
    m_server.publish(streamPath, HttpServer::event("answer", dumpedJson(event)));
}

Json DashOutput::beatNow() const
{
    Json text = beatJson(m_context.health(), std::chrono::system_clock::now());
    text["play"] = m_context.playState ? m_context.playState() : Json();
    return text;
}

Json DashOutput::layout() const
{
    std::lock_guard const lock(m_layoutMutex);
    return m_layout;
}

// A browser whose stream broke gets what it missed in the place of the history, and first: values of now would make
// those look old.
std::string DashOutput::greeting(std::string const& lastId) const
{
    std::optional<std::string> const missed = m_log.since(lastId);
    Json const chosen = layout();
    Json histories = Json::array();
    std::vector<std::string> ids = DashLayouts::sensorsOf(chosen);
    if (ids.size() > chartAtFirst) {
        ids.resize(chartAtFirst);
    }
    if (chosen.is_object() && chosen.contains("chart")) {
        ids = chosen["chart"].get<std::vector<std::string>>();
    }
    for (std::string const& id : missed ? std::vector<std::string>() : ids) {
        histories.push_back(m_state.history(id, historyPoints));
    }
    Json const hello = {{"version", versionText},
                        {"allow", {{"clear", m_allowClear}, {"console", m_allowConsole}}},
                        {"vehicle", m_state.vehicle()},
                        {"resumed", missed.has_value()},
                        {"layout", chosen},
                        {"limits", dashLimits(m_context.settings)},
                        {"values", Json::parse(m_state.allValues())},
                        {"history", histories},
                        {"news", m_state.news()},
                        {"answers", m_state.answers()},
                        {"performance", m_context.desk->runs().state(false)},
                        {"beat", beatNow()}};
    return "retry: 1000\n" + missed.value_or("") + HttpServer::event("hello", dumpedJson(hello), m_log.last());
}

} // namespace velmora
