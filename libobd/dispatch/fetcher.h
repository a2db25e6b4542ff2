#pragma once

#include "libobd/dispatch/idispatchable.h"
#include "libobd/dispatch/pacedupdate.h"

#include <common/logrecord.h>
#include <obd/dispatcher.h>
#include <obd/iquery.h>

#include <atomic>
#include <chrono>
#include <future>
#include <memory>
#include <utility>

namespace obd {

// Runs a query for a caller that waits for the promise.
template <class T>
class FetchTask : public IDispatchable
{
public:
    FetchTask(std::shared_ptr<T> query, std::shared_ptr<std::promise<bool>> promise)
        : m_query(std::move(query)), m_promise(std::move(promise))
    {}

    // The caller has given up: don't ask the vehicle any more. Any thread.
    void cancel() { m_cancelled = true; }

    // Whatever the query throws passes on, once the caller has its answer.
    void execute(std::shared_ptr<IObdProxy> const& proxy) override
    {
        bool success = false;
        try {
            success = proxy != nullptr && !m_cancelled && pacedUpdate(*m_query, proxy);
        } catch (...) {
            m_promise->set_value(false);
            throw;
        }
        m_promise->set_value(success);
    }

    void finish() override {}

private:
    std::shared_ptr<T> m_query;
    std::shared_ptr<std::promise<bool>> m_promise;
    std::atomic<bool> m_cancelled{false};
};

// How the run of a query ended for the caller that waits for it.
enum class FetchEnd : int
{
    Succeeded,
    Failed,  // it ran, and nobody delivered
    Late,    // no end in time: the query may still be in the worker's hands
    Dropped, // without a connection it was not even queued
};

// What the end of a fetch means for one control module, with a log line if it delivered nothing to a fetch that
// succeeded.
Verdict judgeFetch(FetchEnd end, IQuery const& query, IEcu const& ecu);

// How long a fetch waits: the query's own time-out and a margin for the queue. A time-out beyond what a signed integer
// holds is a negative one and counts as none.
std::chrono::milliseconds fetchLimit(unsigned int timeoutMs);

// Runs a query on the worker and waits for it. Anything but a success, after which its values can be read, is told in
// the log: no connection, a query that failed, or that its time-out and 50 ms more have passed, in which the time in
// the queue counts. Any thread but the worker.
template <class T>
FetchEnd runFetch(std::shared_ptr<T> const& query)
{
    auto const promise = std::make_shared<std::promise<bool>>();
    std::future<bool> answer = promise->get_future();
    auto const task =
        std::make_shared<FetchTask<T>>(query, promise); // held here until the end: the queue keeps nothing
    std::chrono::milliseconds const limit = fetchLimit(query->timeout());
    if (!Dispatcher::getInstance().update(task)) {
        return FetchEnd::Dropped;
    }
    if (answer.wait_for(limit) != std::future_status::ready) {
        TERVEX_LOG(Error) << "Future not ready";
        task->cancel();
        return FetchEnd::Late;
    }
    if (!answer.get()) {
        TERVEX_LOG(Error) << "Fetch done with failure";
        return FetchEnd::Failed;
    }
    return FetchEnd::Succeeded;
}

// True after a success. After a false the query may still be in the worker's hands: drop it, don't use it again.
template <class T>
bool fetch(std::shared_ptr<T> const& query)
{
    return runFetch(query) == FetchEnd::Succeeded;
}

// The same, judged for one control module: Answered if that module delivered, whatever the others did. The query may be
// read in that case only.
template <class T>
Verdict fetchFrom(std::shared_ptr<T> const& query, IEcu const& ecu)
{
    return judgeFetch(runFetch(query), *query, ecu);
}

} // namespace obd
