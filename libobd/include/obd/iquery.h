#pragma once

#include <obd/outcome.h>

#include <memory>

namespace obd {

class IEcu;
class IObdProxy;

/// Anything that asks the vehicle something.
class IQuery
{
public:
    /// What an update brought, over all control modules.
    enum class UpdateStatus : int
    {
        UpdateOk = 0,     ///< at least one control module delivered usable data
        UpdateNoData = 1, ///< the adapter delivered nothing
        UpdateFailed = 2, ///< everything else
    };

    virtual ~IQuery() = default;

    /// Asks and stores what comes back. Blocks up to timeout() and more. Throws only what guards rethrow: errors of
    /// programming and memory, never an adapter's or a vehicle's behaviour.
    virtual UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) = 0;

    /// Longest time for the adapter's reply, in milliseconds.
    virtual unsigned int timeout() const = 0;

    /// Forgets what was stored.
    virtual void clear() = 0;

    /// Whether a reading builds on those before it. Whoever repeats such a query leaves out the clear() between its
    /// runs.
    virtual bool keepsHistory() const { return false; }

    /// How the last update went for one module. UpdateOk means that at least one delivered: this tells which. A query
    /// that keeps its modules apart overrides it. Not while an update runs.
    virtual Verdict verdict(IEcu const& /*ecu*/) const { return {}; }

    /// Whether the module delivered usable data in the last update.
    bool delivered(IEcu const& ecu) const { return verdict(ecu).kind == OutcomeKind::Answered; }
};

} // namespace obd
