// What the page's server answers to what a browser asks for.
#include "libvelmora/dash/dashoutput.h"
#include "libvelmora/dash/dashplace.h"
#include "libvelmora/dash/playdesk.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr std::size_t longestCommand = 200;

HttpResponse jsonResponse(Json const& value)
{
    HttpResponse response;
    response.contentType = "application/json";
    response.body = dumpedJson(value);
    return response;
}

bool isCommand(std::string const& text)
{
    return !text.empty() && text.size() <= longestCommand &&
           std::ranges::all_of(text, [](unsigned char c) { return c >= ' ' && c < 0x7F; });
}

} // namespace

HttpResponse DashOutput::takeAsk(HttpRequest const& request)
{
    static std::set<std::string> const topics = {"codes", "readiness", "monitors",    "info",
                                                 "clear", "console",   "performance", "play"};
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
    if (topic == "performance") {
        return takeRuns(wish);
    }
    if (topic == "play") {
        return takePlay(wish);
    }
    bool const sure = wish.contains("sure") && wish["sure"] == true;
    if ((console && !isCommand(text)) || (clear && !sure)) {
        return plainResponse(400, console ? "This is no command" : "Clearing needs a yes");
    }
    HttpResponse accepted = plainResponse(202, "Asked");
    return m_context.desk->ask({topic, text}) ? accepted : plainResponse(503, "Too much is being asked; try again");
}

HttpResponse DashOutput::takePlay(Json const& wish)
{
    Json const play = m_context.playState ? PlayDesk::parse(wish) : Json();
    if (play.is_null()) {
        return plainResponse(400, "This can't be asked of what is shown");
    }
    HttpResponse const accepted = plainResponse(202, "Asked");
    return m_context.desk->ask({"play", dumpedJson(play)}) ? accepted
                                                           : plainResponse(503, "Too much is being asked; try again");
}

HttpResponse DashOutput::takeRuns(Json const& wish)
{
    bool const begins = wish.contains("text") && wish["text"] == "begin";
    bool const ends = wish.contains("text") && wish["text"] == "end";
    if (!begins && !ends) {
        return plainResponse(400, "Runs begin or end");
    }
    m_lastSeen = m_context.now();
    HttpResponse const accepted = plainResponse(202, "Asked");
    return m_context.desk->ask({"performance", begins ? "begin" : "end"})
               ? accepted
               : plainResponse(503, "Too much is being asked; try again");
}

// The run as a file. Null is told where there was none.
HttpResponse DashOutput::tellRuns() const
{
    HttpResponse response = jsonResponse(m_context.desk->runs().state(true));
    response.headers.emplace_back("Content-Disposition", "attachment; filename=\"performance.json\"");
    return response;
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

} // namespace velmora
