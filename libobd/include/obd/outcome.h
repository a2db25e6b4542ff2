#pragma once

#include <utility>

namespace obd {

/// How an operation on a control module went. Silence, refusal, a reply that can't be read and "nothing stored" are
/// four things.
enum class OutcomeKind : int
{
    Answered = 0,
    NothingStored = 1, ///< answered, and there is nothing of what was asked for
    ModuleSilent = 2,  ///< no answer of this module in time, whatever the others said
    Refused = 3,       ///< by a negative reply
    Unreadable = 4,    ///< something came that can't be decoded, or that the adapter says was damaged or cut off
    NotConnected = 5,  ///< no connection or no control module, or the link was lost meanwhile
    NotOffered = 6,    ///< the module does not have it, by what it says it supports or by its refusal
};

/// How it went, without a value.
struct Verdict
{
    OutcomeKind kind{OutcomeKind::Answered}; ///< how it went
    /// The response code of a negative reply, see Nack; 0 where there was none. A legacy bus refuses some requests
    /// without a code.
    int code{0};

    /// Whether the module told what was asked, and be it that there is nothing.
    bool isTold() const { return kind == OutcomeKind::Answered || kind == OutcomeKind::NothingStored; }

    bool operator==(Verdict const&) const = default; ///< kind and code
};

/// How it went, with the value: that of the fetch operation beside it, so empty, null or false unless it was told.
template <typename T>
struct Outcome : Verdict
{
    Outcome() = default;
    /// From how it went, with what it brought.
    Outcome(Verdict const& verdict, T result = T()) : Verdict(verdict), value(std::move(result)) {}

    T value{}; ///< of use where isTold
    /// Of an operation that asks several times: how many of its requests brought nothing that could be read. What they
    /// would have told is missing in the value.
    unsigned int missing{0};
};

} // namespace obd
