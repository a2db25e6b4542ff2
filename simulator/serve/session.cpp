#include "simulator/serve/session.h"

#include "simulator/serve/controlsocket.h"
#include "simulator/serve/tracepeer.h"
#include "simulator/serverloop.h"
#include "simulator/simulatedcar.h"
#include "simulator/textfile.h"

#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstring>
#include <memory>

namespace obdsim {

namespace {

constexpr std::size_t largestFleet = 2000;

struct TcpListen
{
    std::string host;
    std::uint16_t port = 0;
};

std::optional<TcpListen> parseListen(std::string const& text)
{
    std::string const scheme = "tcp://";
    auto const colon = text.rfind(':');
    if (!text.starts_with(scheme) || colon < scheme.size()) {
        return std::nullopt;
    }
    TcpListen listen{text.substr(scheme.size(), colon - scheme.size()), 0};
    char const* const end = text.data() + text.size();
    auto const result = std::from_chars(text.data() + colon + 1, end, listen.port);
    if (listen.host.size() > 2 && listen.host.front() == '[') {
        listen.host = listen.host.substr(1, listen.host.size() - 2);
    }
    bool const good = result.ec == std::errc() && result.ptr == end && !listen.host.empty();
    return good ? std::optional(listen) : std::nullopt;
}

std::unique_ptr<IServer> listenAt(std::string const& text, Peers const& peers)
{
    if (text == "pty") {
        return servePseudoTerminals(peers);
    }
    auto const listen = parseListen(text);
    if (!listen) {
        throw SimulatorError("--listen takes tcp://HOST:PORT or pty, not \"" + text + "\"");
    }
    return serveTcp(peers, listen->host, listen->port);
}

} // namespace

class Session::Impl
{
public:
    explicit Impl(SessionOptions const& options) : m_written(options.written)
    {
        m_server = listenAt(options.listen, peers(options));
        if (!m_written.empty() && !m_cars.empty()) {
            m_kept.reset(keepForWriting(m_written));
            if (m_kept == nullptr) {
                refuseScenario(); // now rather than at the end
            }
        }
        auto const handler = [this](std::string const& line) { return follow(line); };
        asio::io_context& context = static_cast<ServerLoop&>(*m_server).context();
        if (options.control) {
            m_socket = std::make_unique<ControlSocket>(context, static_cast<std::uint16_t>(*options.control), handler);
        }
        if (options.input) {
            m_input = std::make_unique<ControlInput>(context, handler);
        }
    }

    IServer& server() { return *m_server; }

    std::string controlAddress() const { return m_socket ? m_socket->address() : ""; }

    /// What was typed, as a scenario. Throws SimulatorError if it cannot be written.
    void writeScenario() const
    {
        if (m_kept == nullptr) {
            return;
        }
        std::FILE* const file = openForWriting(m_written);
        if (file == nullptr) {
            refuseScenario();
        }
        bool const written = std::fputs(formatScenario(m_cars.front()->typed()).c_str(), file) >= 0;
        if (std::fclose(file) != 0 || !written) {
            refuseScenario();
        }
    }

    bool traceFailed() const { return m_trace != nullptr && m_trace->failed(); }

private:
    [[noreturn]] void refuseScenario() const
    {
        throw SimulatorError(m_written + ": the scenario cannot be written: " + std::strerror(errno));
    }

    Peers peers(SessionOptions const& options)
    {
        if (options.fleet == 0 || options.fleet > largestFleet) {
            throw SimulatorError("a fleet has 1 to " + std::to_string(largestFleet) + " cars");
        }
        Peers all;
        if (options.replay.empty()) {
            m_cars = simulateFleet(options.simulation, options.fleet);
            all.assign(m_cars.begin(), m_cars.end());
        } else {
            all.push_back(replay(options.replay, options.simulation.faults));
        }
        if (!options.trace.empty()) {
            m_trace = std::make_shared<TraceFile>(options.trace);
            for (std::size_t i = 0; i < all.size(); ++i) {
                all[i] = std::make_shared<TracePeer>(std::move(all[i]), m_trace, i + 1);
            }
        }
        return all;
    }

    /// Control lines come on the server's thread, so the cars can be reached at once.
    std::string follow(std::string const& line)
    {
        if (m_cars.empty()) {
            throw ControlError("word 1: a recorded dialogue cannot be changed");
        }
        auto& loop = static_cast<ServerLoop&>(*m_server);
        std::string answer;
        loop.atOnce([&] {
            for (auto const& car : m_cars) {
                std::string const own = car->control(line);
                answer = car == m_cars.front() ? own : answer;
            }
        });
        return answer;
    }

    struct FileCloser
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    std::string m_written;
    std::unique_ptr<std::FILE, FileCloser> m_kept; ///< for the scenario; null without one
    std::shared_ptr<TraceFile> m_trace;            ///< null without one
    std::vector<std::shared_ptr<SimulatedCar>> m_cars;
    std::unique_ptr<IServer> m_server;
    std::unique_ptr<ControlSocket> m_socket;
    std::unique_ptr<ControlInput> m_input;
};

Session::Session(SessionOptions const& options) : m_impl(std::make_unique<Impl>(options)) {}

Session::~Session() = default;

std::vector<std::string> Session::addresses() const
{
    return m_impl->server().addresses();
}

std::string Session::controlAddress() const
{
    return m_impl->controlAddress();
}

void Session::run()
{
    m_impl->server().run();
    m_impl->writeScenario();
}

bool Session::traceFailed() const
{
    return m_impl->traceFailed();
}

void Session::stop()
{
    m_impl->server().stop();
}

} // namespace obdsim
