// The bare dialogue with an adapter; see <velmora/console.h>.

#include "common/text/text.h"
#include "libvelmora/car/onecar.h"
#include "libvelmora/car/sessionend.h"

#include <obd/idataconnection.h>
#include <velmora/console.h>
#include <velmora/error.h>

#include <chrono>

namespace velmora {

namespace {

constexpr std::chrono::seconds adapterLimit{5};
constexpr std::chrono::seconds vehicleLimit{30}; // a search for the bus takes that long
constexpr int stepMs = 100;
constexpr int mostUnasked = 1000; // messages; a flood of them has no end

AdapterConsole::Answer answerOf(std::vector<unsigned char> const& message, std::string const& command)
{
    AdapterConsole::Answer answer{true, adapterLines({message.begin(), message.end()})};
    if (!answer.lines.empty() && answer.lines.front() == command) {
        answer.lines.erase(answer.lines.begin());
    }
    return answer;
}

} // namespace

class ConsoleParts
{
public:
    explicit ConsoleParts(CarOptions const& options)
        : session(SessionOptions(options)), end(session, options), connection(session.connectToPort())
    {
        connection->setDelimiter('>');
    }

    // What came unasked belongs to nothing.
    void dropUnasked()
    {
        std::vector<unsigned char> unasked;
        for (int i = 0; connection->receive(unasked, 0); ++i) {
            session.check();
            if (i == mostUnasked) {
                throw Error(ErrorKind::LinkLost, "What " + session.port() + " says has no end",
                            {"is it the right port, and the right --baud?", "pull the adapter and plug it in again"});
            }
        }
    }

    bool await(std::vector<unsigned char>& message, std::chrono::steady_clock::duration limit)
    {
        auto const until = std::chrono::steady_clock::now() + limit;
        while (std::chrono::steady_clock::now() < until) {
            session.check();
            if (connection->receive(message, stepMs)) {
                return true;
            }
        }
        return false;
    }

    OneCar const place;
    Session session;
    SessionEnd end;
    std::shared_ptr<obd::IDataConnection> connection;
};

AdapterConsole::AdapterConsole(CarOptions const& options) : m_parts(std::make_unique<ConsoleParts>(options)) {}

AdapterConsole::~AdapterConsole() = default;

AdapterConsole::Answer AdapterConsole::ask(std::string const& command)
{
    m_parts->dropUnasked();
    std::vector<unsigned char> message;
    std::string const sent = command + "\r";
    m_parts->connection->send({sent.begin(), sent.end()});
    bool const ofAdapter = toUpper(command).starts_with("AT") || toUpper(command).starts_with("ST");
    if (m_parts->await(message, ofAdapter ? adapterLimit : vehicleLimit)) {
        return answerOf(message, command);
    }
    // An adapter that shows traffic without end stops at any character. A CR would repeat a command that was done.
    m_parts->connection->send({' '});
    return m_parts->await(message, adapterLimit) ? answerOf(message, command) : Answer{};
}

void AdapterConsole::check() const
{
    m_parts->session.check();
}

std::string AdapterConsole::port() const
{
    return m_parts->session.port();
}

} // namespace velmora
