#pragma once

#include "libobd/dispatch/fetcher.h"
#include "libobd/service/baseservice.h"

#include <obd/diagnosticdatamodels.h>
#include <obd/iecu.h>
#include <obd/outcome.h>
#include <obd/sensordatamodels.h>

#include <memory>
#include <optional>
#include <string>
#include <vector>

// The one place that judges how an operation of a service went.
namespace obd {

// What a module has to offer for an operation, by its supported sets.
struct Needed
{
    ObdMode mode;
    unsigned char id;
    unsigned char frame{0};
};

// Whether the module says that it lacks it. Of a set that could not be read, or not wholly, nothing is known.
bool lacks(IEcu const& module, std::optional<Needed> const& needed);

// Whether what was read is that there is nothing.
bool holdsNothing(std::string const& text);
bool holdsNothing(bool flag);
bool holdsNothing(std::shared_ptr<ParameterDataModel> const& parameter);
bool holdsNothing(std::vector<std::shared_ptr<SensorDataModel>> const& sensors);
bool holdsNothing(std::vector<std::shared_ptr<ReadinessMonitorDataModel>> const& monitors);
template <typename T>
bool holdsNothing(std::shared_ptr<T> const& value)
{
    return value == nullptr;
}
template <typename T>
bool holdsNothing(std::vector<T> const& list)
{
    return list.empty();
}

// Of a value that was read.
template <typename T>
Outcome<T> told(T value)
{
    OutcomeKind const kind = holdsNothing(value) ? OutcomeKind::NothingStored : OutcomeKind::Answered;
    return {Verdict{kind}, std::move(value)};
}

// A verdict on a fetch as a service gives it: a refusal of what the module does not have is no refusal, and a service
// that has lost its connection was not left waiting by the module.
Verdict judged(BaseService const& service, Verdict const& verdict);

// Asks a module, which may be null, one thing; read takes the value from the query. needed: what the module has to
// offer for it to be asked.
template <typename Query, typename Read>
auto ask(BaseService const& service, std::shared_ptr<IEcu> const& module, std::optional<Needed> const& needed,
         std::shared_ptr<Query> const& query, Read const& read) -> Outcome<decltype(read())>
{
    if (module == nullptr) {
        return Verdict{OutcomeKind::NotConnected};
    }
    if (lacks(*module, needed)) {
        return Verdict{OutcomeKind::NotOffered};
    }
    Verdict const verdict = judged(service, fetchFrom(query, *module));
    if (verdict.kind != OutcomeKind::Answered) {
        return verdict;
    }
    return told(read());
}

// Adds up the requests of an operation that asks several times.
class AskedTimes
{
public:
    void add(Verdict const& verdict);

    // NotOffered without a request. What was told counts, and where nothing is, what was not told comes first.
    template <typename T>
    Outcome<T> outcome(T value) const
    {
        Outcome<T> result = m_told ? told(std::move(value)) : Outcome<T>(m_first);
        if (result.kind == OutcomeKind::NothingStored && m_missing > 0) {
            result = m_first;
        }
        result.missing = m_missing;
        return result;
    }

private:
    bool m_told{false};
    Verdict m_first{OutcomeKind::NotOffered}; // that brought nothing
    unsigned int m_missing{0};
};

} // namespace obd
