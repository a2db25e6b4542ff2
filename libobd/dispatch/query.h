#pragma once

#include "libobd/dispatch/idispatchable.h"
#include "libobd/dispatch/pacedupdate.h"

#include <obd/dispatcher.h>

#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <utility>

namespace obd {

// Runs a parameter on the worker without a waiting caller; the outcome comes back as a call on the application's
// thread. One run at a time, to be started again for the next. Any thread may cancel, also while the run finishes.
//
// The parameter is one object for all runs, and a run that was cancelled may still be on the worker: start a cancelled
// query again only when the worker is known to be out of it, or build a new one.
template <class T>
class Query
{
public:
    using Function = std::function<void(bool success, std::shared_ptr<T> const& parameter)>;

    explicit Query(std::shared_ptr<T> const& parameter) : m_parameter(parameter) {}
    ~Query() { cancel(); }

    Query(Query const&) = delete;
    Query& operator=(Query const&) = delete;

    // Empties the parameter, unless it keeps a history, and queues a run; callback hears its end, inside
    // Dispatcher::dispatch, and may start the next. False while a run is on, which is left as it is, and without a
    // connection; the callback is dropped then. A callback that holds this query keeps it alive until the run has ended
    // or is cancelled.
    bool start(Function callback)
    {
        auto const run = std::make_shared<DispatchableQuery>(m_parameter, std::move(callback));
        {
            std::lock_guard const lock(m_mutex);
            if (m_dispatchable != nullptr && m_dispatchable->isRunning()) {
                return false;
            }
            m_dispatchable = run;
        }
        if (!m_parameter->keepsHistory()) {
            m_parameter->clear();
        }
        if (!Dispatcher::getInstance().update(run)) {
            cancel();
            return false;
        }
        return true;
    }

    // Ends the run: its callback will not be called, unless it is being called already. A request that is on its way is
    // not held up.
    void cancel()
    {
        std::shared_ptr<DispatchableQuery> run;
        {
            std::lock_guard const lock(m_mutex);
            run.swap(m_dispatchable);
        }
        if (run != nullptr) {
            run->cancel();
        }
    }

private:
    class DispatchableQuery;

    std::shared_ptr<T> const m_parameter;
    std::mutex m_mutex;                                // a leaf
    std::shared_ptr<DispatchableQuery> m_dispatchable; // of the latest run; protected by m_mutex
};

// One run. Whoever ends it, finish or cancel, has the callback for itself.
template <class T>
class Query<T>::DispatchableQuery : public IDispatchable
{
public:
    DispatchableQuery(std::shared_ptr<T> parameter, Function callback)
        : m_parameter(std::move(parameter)), m_callback(std::move(callback))
    {}

    bool isRunning() const { return m_running; }

    void cancel()
    {
        if (m_running.exchange(false)) {
            m_callback = nullptr; // it may hold the last reference to its query
        }
    }

    void execute(std::shared_ptr<IObdProxy> const& proxy) override
    {
        if (proxy != nullptr && m_running) {
            m_success = pacedUpdate(*m_parameter, proxy);
        }
    }

    // Gives the callback away: the call may start the next run, or end the query.
    void finish() override
    {
        if (!m_running.exchange(false)) {
            return;
        }
        Function const callback = std::exchange(m_callback, nullptr);
        if (callback) {
            callback(m_success, m_parameter);
        }
    }

private:
    std::shared_ptr<T> const m_parameter;
    std::atomic<bool> m_running{true};
    Function m_callback; // of the one that took m_running down
    std::atomic<bool> m_success{false};
};

} // namespace obd
