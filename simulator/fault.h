#pragma once

#include "simulator/adapter/quirk.h"
#include "simulator/error.h"
#include "simulator/peer.h"

namespace obdsim {

/// A fault text that means nothing. what() tells the forms that there are.
class FaultError : public SimulatorError
{
public:
    using SimulatorError::SimulatorError;
};

/// What goes wrong.
enum class FaultKind : int
{
    Garbage, ///< bytes between those of the adapter, each with a probability
    Nul,     ///< the same with NUL bytes only
    Prompt,  ///< a reply without its prompt
    Cut,     ///< the rest of a reply is lost from a byte on
    Stall,   ///< a pause in front of a byte
    Slow,    ///< everything comes later
    Loss,    ///< the link breaks in front of a byte
    Error,   ///< an error word in place of a reply
    Silent,  ///< the adapter hears and says nothing from a command on
    Reset    ///< the adapter starts anew in place of a reply
};

/// One fault. Positions count from 1 and from the beginning of a connection:
/// bytes of output, or commands.
struct Fault
{
    FaultKind kind = FaultKind::Garbage;
    double probability = 0;
    std::uint64_t position = 0; ///< 0: by probability
    Time duration{};
    std::string word; ///< of Error; of Reset what it says: nothing, "banner", or these words
};

/// All faults of a simulation.
struct FaultPlan
{
    std::vector<Fault> faults;
    Quirks quirks;
    std::optional<Time> command; ///< in place of the adapter's AdapterTiming; likewise the next two
    std::optional<Time> wait;
    std::optional<int> baud;
    std::uint32_t seed = 1;

    bool empty() const { return faults.empty(); }
};

/// Reads texts such as "garbage=0.01", "cut@120", "error:BUS BUSY@3", "stall@80:500",
/// "quirk:prompt-late", "seed=7". Throws FaultError for any other.
FaultPlan parseFaults(std::vector<std::string> const& texts);

/// Reads one text that is a fault: none of quirks, times and seed.
Fault parseFault(std::string const& text);

} // namespace obdsim
