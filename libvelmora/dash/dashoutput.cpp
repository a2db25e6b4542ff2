#include "libvelmora/dash/dashoutput.h"

#include "libvelmora/dash/dashpage.h"

#include <velmora/error.h>
#include <velmora/version.h>

#include <algorithm>
#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>

namespace velmora {

namespace {

constexpr char const* streamPath = "/events";
constexpr char const* trafficPath = "/traffic";
constexpr std::chrono::milliseconds beat{1000};
constexpr std::size_t historyPoints = 600;
constexpr std::size_t chartAtFirst = 6; // sensors whose history comes without being asked for
constexpr std::size_t longestCommand = 200;

HttpLimits dashLimits()
{
    HttpLimits limits;
    limits.connections = 64;
    limits.time = std::chrono::seconds(5);
    return limits;
}

bool isSet(OutputAddress const& address, std::string const& key)
{
    std::string const value = address.option(key, "no");
    if (value != "yes" && value != "no") {
        throw Error(ErrorKind::WrongUse, key + ": \"" + value + "\" is neither yes nor no");
    }
    return value == "yes";
}

std::set<std::string> namesOf(std::string_view list)
{
    std::set<std::string> names;
    while (!list.empty()) {
        std::string_view const part = list.substr(0, list.find(','));
        list.remove_prefix(std::min(part.size() + 1, list.size()));
        std::optional<std::string> const name = hostNameIn(part);
        if (!name || part.find(':') != std::string_view::npos) {
            throw Error(ErrorKind::WrongUse, "\"" + std::string(part) + "\" is no name of a host");
        }
        names.insert(*name);
    }
    return names;
}

// An address by which others reach this machine, for a server that listens on all of them.
std::string ownAddress()
{
    std::string result = "127.0.0.1";
    ifaddrs* all = nullptr;
    if (::getifaddrs(&all) != 0) {
        return result;
    }
    for (ifaddrs const* each = all; each != nullptr; each = each->ifa_next) {
        bool const usable = each->ifa_addr != nullptr && each->ifa_addr->sa_family == AF_INET &&
                            (each->ifa_flags & IFF_LOOPBACK) == 0 && (each->ifa_flags & IFF_UP) != 0;
        if (usable) {
            char text[INET_ADDRSTRLEN] = {};
            ::inet_ntop(AF_INET, &reinterpret_cast<sockaddr_in const*>(each->ifa_addr)->sin_addr, text, sizeof(text));
            result = text;
            break;
        }
    }
    ::freeifaddrs(all);
    return result;
}

std::string dumpedJson(Json const& value)
{
    return value.dump(-1, ' ', false, Json::error_handler_t::replace);
}

HttpResponse jsonResponse(Json const& value)
{
    HttpResponse response;
    response.contentType = "application/json";
    response.body = dumpedJson(value);
    return response;
}

std::string tokenOf(DashContext const& context)
{
    return context.token.empty() ? makeToken() : context.token;
}

bool isCommand(std::string const& text)
{
    return !text.empty() && text.size() <= longestCommand &&
           std::ranges::all_of(text, [](unsigned char c) { return c >= ' ' && c < 0x7F; });
}

} // namespace

DashOutput::DashOutput(OutputAddress const& address, DashContext context)
    : m_place(parseHttpPlace(address.target)), m_context(std::move(context)),
      m_allowClear(isSet(address, "allow_clear")), m_allowConsole(isSet(address, "allow_console")),
      m_access(isLoopback(m_place.host) && !m_allowClear && !m_allowConsole ? std::string() : tokenOf(m_context),
               namesOf(address.option("name"))),
      m_layouts(m_context.layouts), m_server(dashLimits())
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
    addHandler("GET", "/history", [this](HttpRequest const& request) { return tellHistory(request); });
    m_server.addStream(
        streamPath, [this](HttpRequest const& /*request*/) { return greeting(); },
        [this](HttpRequest const& /*request*/) { return HttpServer::event("values", m_state.allValues()); });
    m_server.addStream(
        trafficPath, [this](HttpRequest const& /*request*/) { return HttpServer::event("lines", m_state.allLines()); });
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
    bool const any = m_place.host == "0.0.0.0" || m_place.host == "::";
    std::string const host = any ? ownAddress() : m_place.host;
    bool const six = host.find(':') != std::string::npos;
    return "http://" + (six ? "[" + host + "]" : host) + ":" + std::to_string(port()) + "/" +
           (m_access.token().empty() ? "" : "#t=" + m_access.token());
}

void DashOutput::write(Records records)
{
    for (SharedRecord const& record : records) {
        m_state.take(*record);
    }
    if (std::string const values = m_state.takeValues(); !values.empty()) {
        m_server.publishLatest(streamPath, HttpServer::event("values", values));
    }
    if (m_state.takeNews()) {
        m_server.publish(streamPath, HttpServer::event("news", dumpedJson(m_state.news())));
    }
    if (std::string const lines = m_state.takeLines(); !lines.empty()) {
        m_server.publishLatest(trafficPath, HttpServer::event("lines", lines));
    }
    auto const now = std::chrono::steady_clock::now();
    if (now - m_lastBeat >= beat) {
        m_lastBeat = now;
        Json const text = beatJson(m_context.health(), std::chrono::system_clock::now());
        m_server.publish(streamPath, HttpServer::event("beat", dumpedJson(text)));
    }
}

HttpResponse DashOutput::takeAsk(HttpRequest const& request)
{
    static std::set<std::string> const topics = {"codes", "readiness", "monitors", "info", "clear", "console"};
    Json const wish = Json::parse(request.body, nullptr, false);
    bool const object = wish.is_object() && wish.contains("topic") && wish["topic"].is_string();
    std::string const topic = object ? wish["topic"].get<std::string>() : "";
    if (!topics.contains(topic)) {
        return plainResponse(400, "This can't be asked");
    }
    bool const clear = topic == "clear";
    bool const console = topic == "console";
    if ((clear && !m_allowClear) || (console && !m_allowConsole)) {
        return plainResponse(403, "The program was started without leave for this");
    }
    std::string const text =
        console && wish.contains("text") && wish["text"].is_string() ? wish["text"].get<std::string>() : "";
    bool const sure = wish.contains("sure") && wish["sure"] == true;
    if ((console && !isCommand(text)) || (clear && !sure)) {
        return plainResponse(400, console ? "This is no command" : "Clearing needs a yes");
    }
    HttpResponse accepted = plainResponse(202, "Asked");
    return m_context.desk->ask({topic, text}) ? accepted : plainResponse(503, "Too much is being asked; try again");
}

HttpResponse DashOutput::takeLayout(HttpRequest const& request)
{
    std::string const vehicle = m_state.vehicleKey();
    if (vehicle.empty()) {
        return plainResponse(409, "No vehicle is known yet");
    }
    Json layout;
    try {
        layout = DashLayouts::parse(request.body);
    } catch (Error const& error) {
        return plainResponse(400, error.what());
    }
    m_layouts.save(vehicle, layout);
    {
        std::lock_guard const lock(m_layoutMutex);
        m_layout = layout;
    }
    m_server.publish(streamPath, HttpServer::event("layout", dumpedJson(layout)));
    wishSensors(layout);
    HttpResponse done;
    done.status = 204;
    return done;
}

HttpResponse DashOutput::tellHistory(HttpRequest const& request) const
{
    return jsonResponse(m_state.history(request.query, historyPoints));
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
    m_server.publish(streamPath, greeting());
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

Json DashOutput::layout() const
{
    std::lock_guard const lock(m_layoutMutex);
    return m_layout;
}

std::string DashOutput::greeting() const
{
    Json const chosen = layout();
    Json histories = Json::array();
    std::vector<std::string> ids = DashLayouts::sensorsOf(chosen);
    if (ids.size() > chartAtFirst) {
        ids.resize(chartAtFirst);
    }
    if (chosen.is_object() && chosen.contains("chart")) {
        ids = chosen["chart"].get<std::vector<std::string>>();
    }
    for (std::string const& id : ids) {
        histories.push_back(m_state.history(id, historyPoints));
    }
    Json const hello = {{"version", versionText},
                        {"allow", {{"clear", m_allowClear}, {"console", m_allowConsole}}},
                        {"vehicle", m_state.vehicle()},
                        {"layout", chosen},
                        {"values", Json::parse(m_state.allValues())},
                        {"history", histories},
                        {"news", m_state.news()},
                        {"answers", m_state.answers()},
                        {"beat", beatJson(m_context.health(), std::chrono::system_clock::now())}};
    return "retry: 1000\n" + HttpServer::event("hello", dumpedJson(hello));
}

} // namespace velmora
