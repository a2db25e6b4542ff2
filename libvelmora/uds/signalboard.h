#pragma once

#include "libvelmora/poll/pollresult.h"
#include "libvelmora/signal/signalset.h"

#include <chrono>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A signal that is to be polled.
struct ChosenSignal
{
    std::size_t index = 0;              // in the set
    std::optional<unsigned int> module; // of a broadcast: whose reply counts; nothing: the first that answers
    std::optional<double> hertz;
    bool told = true; // false: read only for others that are worked out from it
};

// What went wrong with a signal since its poller began.
struct SignalTrouble
{
    std::string id;
    unsigned int withoutValue = 0; // replies that gave none: a division by zero, another length, another identifier
    std::string reason;            // why it is not asked, or not answered of late
};

// The values of the signals of one poller: decodes replies, keeps the last values for those that are worked out of
// others, statistics and troubles. For the poller's thread, but for troubles.
class SignalBoard
{
public:
    using Time = std::chrono::steady_clock::time_point;

    explicit SignalBoard(std::shared_ptr<SignalSet const> set) : m_set(std::move(set)) {}

    SignalSet const& set() const { return *m_set; }

    // Takes a positive reply, from the service on. module is the signal's own as wishes name it, answered who spoke.
    PollResult take(ChosenSignal const& signal, unsigned int module, unsigned int answered,
                    std::vector<unsigned char> const& payload, Time now);
    // A reply that is none to its request, or can't be read: no value, which is counted.
    PollResult takeNothing(ChosenSignal const& signal, unsigned int module);
    // A signal that is worked out of others; nothing as long as they are not known.
    std::optional<PollResult> workOut(ChosenSignal const& signal, Time now);

    // A request of these signals is not asked, or was not answered; empty if it was.
    void setReason(std::vector<ChosenSignal> const& signals, std::string const& reason);

    // Those with any; any thread.
    std::vector<SignalTrouble> troubles() const;

private:
    struct Last
    {
        double number = 0.0;
        Time time;
    };
    struct Statistics
    {
        double minimum = 0.0;
        double maximum = 0.0;
        double sum = 0.0;
        unsigned int count = 0;
    };

    // What was worked out for one result already, so that no signal is worked out twice for it.
    using WorkedOut = std::map<std::size_t, std::optional<double>>;

    std::optional<double> evaluateEntry(std::size_t index, std::vector<unsigned char> const& data, Time now) const;
    std::optional<double> valueOf(std::size_t index, std::string const& id, Time now, WorkedOut& known,
                                  int depth) const;
    std::optional<double> lastOf(std::size_t index, Time now) const;
    Reading reading(std::size_t index, unsigned int module) const;
    PollResult result(ChosenSignal const& signal, unsigned int module, Reading reading);
    void countMissing(std::size_t index);

    std::shared_ptr<SignalSet const> const m_set;
    std::map<std::size_t, Last> m_last;
    std::map<std::size_t, Statistics> m_statistics;

    mutable std::mutex m_mutex;
    std::map<std::size_t, SignalTrouble> m_troubles; // protected by m_mutex
};

// The bytes of a reply as the text that a signal tells; nothing if it is shorter. Bytes that are no characters of a
// text are left away at its ends.
std::optional<std::string> textOf(SignalText const& text, std::vector<unsigned char> const& data);

} // namespace velmora
