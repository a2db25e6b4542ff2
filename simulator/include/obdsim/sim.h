#pragma once

#include <chrono>
#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// A simulated ELM327 adapter with a car behind it, for the tests of programs that talk to one.
namespace velmora::sim {

/// Time of the simulation, from its beginning.
using Time = std::chrono::microseconds;

/// What a user can get wrong: a name, a file, a fault, a control line, an address. what() is meant for that user.
class Error : public std::runtime_error
{
public:
    /// From what() is to say.
    using std::runtime_error::runtime_error;
};

/// What to simulate.
struct Options
{
    std::string vehicle = "petrol-can11"; ///< one of vehicles(), or the path of a vehicle file
    std::string adapter = "elm327-v1.5";  ///< one of adapters()
    std::vector<std::string> faults = {}; ///< such as "cut@120", "quirk:prompt-late", "baud=38400"
    std::string scenario = {};            ///< path of a scenario file; empty: none
    std::string drive = {};               ///< "town", "motorway", "cold-start", or a CSV file; empty: the vehicle's own
};

/// A line that the host has sent, in capitals and without blanks.
struct Request
{
    Time time{};      ///< when it was complete
    std::string text; ///< "010C"
};

/// One car with its adapter. Its clock stands still until somebody moves it: advance() and ask() by hand, a server by
/// the real time. Safe from any thread, but either by hand or served.
class Simulator
{
public:
    /// Throws Error.
    explicit Simulator(Options const& options = {});
    ~Simulator();
    Simulator(Simulator&&) noexcept;            ///< the other may only be destroyed or assigned to then
    Simulator& operator=(Simulator&&) noexcept; ///< ends what it held before

    /// Bytes from the host, which arrive at now().
    void send(std::string_view bytes);

    /// Lets time pass; all that the adapter has said meanwhile.
    std::string advance(Time by);

    /// When the adapter says the next byte; nothing if it is silent.
    std::optional<Time> nextOutput() const;

    /// Sends the line with a CR, and jumps through the time until the adapter has no more to say.
    std::string ask(std::string_view line);

    /// The time of the simulation.
    Time now() const;

    /// False once the simulated link has broken.
    bool linkIsUp() const;

    /// Changes the car: "ignition off", "set P0420 pending"; "help" tells the lines. Returns what the line asks for.
    /// Throws Error, which names the word.
    std::string control(std::string const& line);

    /// What control() has changed, as the text of a scenario file that does the same again.
    std::string scenario() const;

    /// What was asked so far; of many the last 1000.
    std::vector<Request> requests() const;

    /// How often that line was asked.
    std::uint64_t count(std::string_view text) const;

    /// Serves programs in real time, on a thread of its own, until stop(): on 127.0.0.1 (port 0: any free one), or as a
    /// pseudo-terminal. Returns what they connect to. Throws Error.
    std::string serveTcp(std::uint16_t port = 0);
    /// Returns the path of the device. Throws Error.
    std::string servePseudoTerminal();
    /// Ends the serving; waits for its thread.
    void stop();

private:
    class Impl;
    std::unique_ptr<Impl> m_impl;
};

/// Names of the built-in vehicles and adapters.
std::vector<std::string> vehicles();
/// Names of the built-in adapters.
std::vector<std::string> adapters();

} // namespace velmora::sim
